// SPDX-License-Identifier: MIT
#include "connection/interface_state.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <initializer_list>

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <unistd.h>
// This includes linux/if.h, which conflicts with net/if.h.
#include <linux/wireless.h>

#include "base/state.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/device.h"
#include "wifi_info/text.h"

// Sends a request about the interface that it names. FALSE: errno has the reason.
static gboolean ask_kernel(unsigned long code, struct ifreq *request)
{
    const int fd = socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);

    if (fd < 0)
        return FALSE;

    const gboolean answered = ioctl(fd, code, request) == 0;
    const int reason = errno;

    close(fd);
    errno = reason;
    return answered;
}

static gboolean request_address(const char *name, struct ifreq *request)
{
    memset(request, 0, sizeof *request);
    copy_field(request->ifr_name, sizeof request->ifr_name, name);
    return ask_kernel(SIOCGIFADDR, request);
}

// Whether the kernel has no wireless extensions for the card, as for multi-link ones since 6.3.
static gboolean unsupported(int error)
{
    return error == EOPNOTSUPP || error == ENOTTY || error == EINVAL;
}

static gboolean interface_exists(const char *name)
{
    struct ifreq request = {};

    copy_field(request.ifr_name, sizeof request.ifr_name, name);
    return ask_kernel(SIOCGIFINDEX, &request);
}

void get_ap_mac()
{
    // Kept open, because a connect polls every two seconds.
    static int fd = -1;
    const WIFI_INTERFACE *iface = first_interface();
    struct iwreq request = {};

    memset(Link_AP_MAC, 0, sizeof Link_AP_MAC);
    if (iface == nullptr)
        return;
    if (fd < 0)
        fd = socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    copy_field(request.ifr_name, sizeof request.ifr_name, iface->name);
    if (ioctl(fd, SIOCGIWAP, &request) == 0) {
        unsigned char mac[6];

        memcpy(mac, request.u.ap_addr.sa_data, sizeof mac);
        g_snprintf(Link_AP_MAC, sizeof Link_AP_MAC, "%02X:%02X:%02X:%02X:%02X:%02X", mac[0], mac[1],
                   mac[2], mac[3], mac[4], mac[5]);
    } else if (!unsupported(errno) || !interface_exists(iface->name) ||
               !ask_ap_address(iface->name, Link_AP_MAC, sizeof Link_AP_MAC)) {
        return;
    }
    debug_line("Detect Linked Acess Pointer:%s", Link_AP_MAC);
}

gboolean is_associated(const char *ap_address)
{
    return ap_address[0] != '\0' && strcmp(ap_address, "00:00:00:00:00:00") != 0;
}

gboolean address_valid(WIFI_INTERFACE *iface)
{
    struct ifreq request;

    return iface != nullptr && request_address(iface->name, &request);
}

void get_interface_statistics_data(WIFI_INTERFACE *iface)
{
    struct ifreq request;

    if (iface == nullptr)
        return;
    if (!request_address(iface->name, &request)) {
        perror("ioctl");
        iface->address[0] = '\0';
        return;
    }

    struct sockaddr_in address;

    memcpy(&address, &request.ifr_addr, sizeof address);
    copy_field(iface->address, sizeof iface->address, inet_ntoa(address.sin_addr));
    debug_line("address:%s", iface->address);
}

void clear_address(const char *name)
{
    struct ifreq request;

    if (!request_address(name, &request)) {
        perror("ioctl");
        return;
    }

    struct sockaddr_in address;

    memcpy(&address, &request.ifr_addr, sizeof address);
    address.sin_addr.s_addr = htonl(INADDR_ANY);
    memcpy(&request.ifr_addr, &address, sizeof address);
    ask_kernel(SIOCSIFADDR, &request);
}

static void print_statics(char *values)
{
    char *rest = nullptr;
    const char *field = strtok_r(values, " \n", &rest);

    if (field == nullptr)
        return;
    debug_line("bp--->%s", field);
    debug_line("status=%x", static_cast<unsigned>(strtoul(field, nullptr, 16)));
    for (const char *label : {"link quality--->", "level=", "noise="}) {
        field = strtok_r(nullptr, " \n", &rest);
        if (field == nullptr)
            return;
        debug_line("%s%d", label, decimal(field));
    }
}

void get_network_statics(WIFI_INTERFACE *iface)
{
    FILE *list = fopen("/proc/net/wireless", "re");
    const gsize length = strlen(iface->name);
    char line[256];

    if (list == nullptr)
        return;
    while (fgets(line, sizeof line, list) != nullptr) {
        char *start = g_strchug(line);

        if (strncmp(start, iface->name, length) == 0 && start[length] == ':') {
            print_statics(start + length + 1);
            break;
        }
    }
    fclose(list);
}
