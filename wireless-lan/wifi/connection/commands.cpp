#include "connection/commands.h"

#include <cerrno>
#include <cstdio>

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "base/state.h"
#include "connection/interface_state.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/encryption.h"
#include "wifi_info/shell.h"

constexpr char ESSID_FILE[] = "/tmp/essid_tmp";
constexpr char KEY_FILE[] = "/tmp/key_tmp";

const char *client_mode(const char *mode)
{
    return g_ascii_strcasecmp(mode, "Master") == 0 ? "Managed" : mode;
}

const char *key_word(const WIFI_CELL *cell)
{
    return cell->userkey[0] == '\0' ? "off" : cell->userkey;
}

gchar *iwset_command(const char *name, const WIFI_CELL *cell)
{
    g_autofree gchar *essid = shell_escape(cell->essid);
    g_autofree gchar *mode = shell_escape(client_mode(cell->mode));
    g_autofree gchar *key = shell_escape(key_word(cell));
    const char *enc = encryption_word(cell->encmode, FILE_WORDS);

    if (cell->key_mgmt == 0)
        return g_strdup_printf("/sbin/iwset \"%s\" essid \"%s\" mode \"%s\" key \"%s\" enc \"%s\""
                               " \"[%d]\"",
                               name, essid, mode, key, enc, static_cast<int>(cell->key_index + 1));
    // The two blanks are part of the line that the device's log watchers know.
    return g_strdup_printf("/sbin/iwset  wpa \"%s\" essid \"%s\" mode \"%s\" key \"%s\" enc \"%s\"",
                           name, essid, mode, key, enc);
}

void leave_text_for_scripts(const char *text, const char *path, guint mode)
{
    unlink(path);

    const int fd = open(path, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode);

    if (fd < 0) {
        debug_line("%s is not written: %s", path, g_strerror(errno));
        return;
    }
    close(fd);

    g_autofree gchar *command = echo_command(text, path);

    run_command(command);
}

void apply_configuration()
{
    const WIFI_INTERFACE *iface = first_interface();
    const WIFI_CELL *cell = scanned_cell(connect_index);

    if (my_wifi->interface_count <= 0 || iface == nullptr || cell == nullptr)
        return;
    if (!interface_usable(iface->name, "joining the network"))
        return;

    bring_interface_up(iface->name);
    clear_address(iface->name);
    debug_line("essid to set:%s", cell->essid);
    debug_line("interface:%s", iface->name);

    g_autofree gchar *command = iwset_command(iface->name, cell);

    if (cell->key_mgmt == 0)
        printf("iwset cmd=%s\r\n", command);
    else
        printf("wpa_supplicant cmd=%s\r\n", command);
    leave_text_for_scripts(cell->essid, ESSID_FILE, 0666);
    leave_text_for_scripts(key_word(cell), KEY_FILE, 0600);
    run_command(command);
}

void host_network(const WIFI_INTERFACE *iface)
{
    const WIFI_CELL *group = &iface->wifi_group;

    if (!interface_usable(iface->name, "hosting the Ad-Hoc network"))
        return;

    g_autofree gchar *up = g_strdup_printf("ifconfig %s up", iface->name);
    g_autofree gchar *essid = shell_escape(group->essid);
    // The device hosts without a key; the group's key is only stored.
    g_autofree gchar *iwset = g_strdup_printf(
        "/sbin/iwset \"%s\" essid \"%s\" mode \"%s\" key \"%s\" enc \"%s\"", iface->name, essid,
        "Ad-Hoc", "off", encryption_word(group->encmode, FILE_WORDS));
    g_autofree gchar *echo = echo_command(group->essid, ESSID_FILE);

    run_command(up);
    printf("essid_buf = %s \n", echo);
    leave_text_for_scripts(group->essid, ESSID_FILE, 0666);
    printf("cmd=%s\r\n", iwset);
    run_command(iwset);
}

gboolean require_ip_address()
{
    const WIFI_INTERFACE *iface = first_interface();

    if (iface == nullptr || !interface_usable(iface->name, "requiring an address"))
        return FALSE;

    const pid_t child = fork();

    if (child == 0) {
        // The script goes to init when its parent, this child, leaves: no zombie stays behind it.
        if (fork() == 0)
            execl("/sbin/lnk-ifup", "lnk-ifup", iface->name, nullptr);
        // Not exit(): the text that waits in stdio's buffers is the parent's to print.
        _exit(0);
    }
    if (child < 0)
        debug_line("fork PID %d error %d", child, errno);

    const pid_t reaped = child > 0 ? waitpid(child, nullptr, 0) : -1;

    debug_line("wait fPID=%d,exPID=%d", child, reaped);
    return FALSE;
}

void leave_network()
{
    const WIFI_INTERFACE *iface = first_interface();

    if (iface == nullptr || !interface_usable(iface->name, "leaving the network"))
        return;

    g_autofree gchar *command = g_strdup_printf("/sbin/lnk-ifdown %s", iface->name);

    run_command(command);
}
