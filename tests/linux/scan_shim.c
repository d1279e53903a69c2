// SPDX-License-Identifier: MIT
/* Preloaded into the real iwlist: answers its scan with the networks of the file $SCAN_NETWORKS, as
 * a driver built on cfg80211 would. Each line is a name in hexadecimal digits. */
#define _GNU_SOURCE
#include <dlfcn.h>
#include <errno.h>
#include <stdarg.h>
#include <stddef.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include <sys/socket.h>

#include <linux/wireless.h>

static char stream[65536];
static size_t filled;

/* Where the value of an event begins, and the data of one with a length: the pointer is left out.
 */
static const size_t value_at = offsetof(struct iw_event, u);
static const size_t data_at =
    offsetof(struct iw_event, u) + sizeof(struct iw_point) - IW_EV_POINT_OFF;

static void add(__u16 command, const void *value, size_t size)
{
    struct iw_event event;
    memset(&event, 0, sizeof event);
    event.cmd = command;
    event.len = (__u16)(value_at + size);
    memcpy(&event.u, value, size);
    memcpy(stream + filled, &event, event.len);
    filled += event.len;
}

static void add_data(__u16 command, __u16 flags, const void *data, size_t size)
{
    struct iw_event event;
    memset(&event, 0, sizeof event);
    event.cmd = command;
    event.len = (__u16)(data_at + size);
    memcpy(stream + filled, &event, value_at);
    __u16 point[2] = {(__u16)size, flags};
    memcpy(stream + filled + value_at, point, sizeof point);
    memcpy(stream + filled + data_at, data, size);
    filled += event.len;
}

static void add_network(int number, const unsigned char *name, size_t size)
{
    struct sockaddr address = {.sa_family = 1};
    address.sa_data[0] = 2;
    address.sa_data[4] = (char)(number >> 8);
    address.sa_data[5] = (char)number;
    add(SIOCGIWAP, &address, sizeof address);
    struct iw_freq frequency = {.m = 2412, .e = 6};
    add(SIOCGIWFREQ, &frequency, sizeof frequency);
    struct iw_quality quality = {.qual = 70, .level = 226, .updated = 75};
    add(IWEVQUAL, &quality, sizeof quality);
    add_data(SIOCGIWENCODE, IW_ENCODE_DISABLED, "", 0);
    add_data(SIOCGIWESSID, 1, name, size);
    struct iw_param rate = {.value = 1000000};
    add(SIOCGIWRATE, &rate, sizeof rate);
    __u32 mode = IW_MODE_MASTER;
    add(SIOCGIWMODE, &mode, sizeof mode);
    if (getenv("SCAN_ELEMENTS")) {
        unsigned char element[2 + 32] = {0, (unsigned char)size};
        memcpy(element + 2, name, size);
        add_data(IWEVGENIE, 0, element, 2 + size);
    }
}

static void fill(void)
{
    char line[128];
    FILE *file = fopen(getenv("SCAN_NETWORKS"), "r");
    for (int number = 0; file && fgets(line, sizeof line, file); number++) {
        unsigned char name[32];
        unsigned byte;
        size_t size = 0;
        while (size < sizeof name && sscanf(line + 2 * size, "%2x", &byte) == 1)
            name[size++] = (unsigned char)byte;
        add_network(number, name, size);
    }
    if (file)
        fclose(file);
}

int ioctl(int descriptor, unsigned long request, ...)
{
    va_list arguments;
    va_start(arguments, request);
    void *argument = va_arg(arguments, void *);
    va_end(arguments);
    struct iwreq *answer = argument;
    struct iw_range range;
    switch (request) {
    case SIOCGIWRANGE:
        memset(&range, 0, sizeof range);
        range.we_version_compiled = 22;
        range.we_version_source = 22;
        range.max_qual.qual = 70;
        memcpy(answer->u.data.pointer, &range, sizeof range);
        answer->u.data.length = sizeof range;
        return 0;
    case SIOCSIWSCAN:
        return 0;
    case SIOCGIWSCAN:
        if (filled == 0)
            fill();
        if (answer->u.data.length < filled) {
            answer->u.data.length = 0;
            errno = E2BIG;
            return -1;
        }
        memcpy(answer->u.data.pointer, stream, filled);
        answer->u.data.length = (__u16)filled;
        return 0;
    default:
        break;
    }
    int (*real)(int, unsigned long, ...) =
        (int (*)(int, unsigned long, ...))dlsym(RTLD_NEXT, "ioctl");
    return real(descriptor, request, argument);
}
