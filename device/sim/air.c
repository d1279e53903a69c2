// SPDX-License-Identifier: MIT
// Preloaded into the program: answers SIOCGIWAP for interfaces that exist, as a wireless driver
// does, and passes every other request on untouched.
//
// The file /device/state/ap holds "MAC [AFTER [COUNT]]": the access point, how many requests still
// find nobody, and for how many requests it then stays. No file: not associated, which drivers
// report as success with an address of zeros. The count starts anew when the file is replaced.
//
// The file /device/state/ap-error holds the number of an error with which the request fails, as on
// a kernel without wireless extensions for the card.
#define _GNU_SOURCE
#include <dlfcn.h>
#include <errno.h>
#include <linux/if_arp.h>
#include <linux/wireless.h>
#include <stdarg.h>
#include <stdio.h>
#include <string.h>
#include <sys/ioctl.h>
#include <sys/stat.h>

static void read_access_point(unsigned char mac[6])
{
    static struct stat seen;
    static long requests;
    struct stat now;
    unsigned char read[6];
    long after = 0, count = -1;
    FILE *file = fopen("/device/state/ap", "re");

    if (file == NULL)
        return;
    if (fstat(fileno(file), &now) == 0 &&
        (now.st_ino != seen.st_ino || now.st_mtim.tv_sec != seen.st_mtim.tv_sec ||
         now.st_mtim.tv_nsec != seen.st_mtim.tv_nsec)) {
        seen = now;
        requests = 0;
    }
    int fields = fscanf(file, "%hhx:%hhx:%hhx:%hhx:%hhx:%hhx %ld %ld", &read[0], &read[1], &read[2],
                        &read[3], &read[4], &read[5], &after, &count);
    fclose(file);
    if (fields < 6)
        return;
    requests++;
    if (requests > after && (count < 0 || requests <= after + count))
        memcpy(mac, read, sizeof read);
}

// Whether the request is to fail; errno says with what.
static int refused(void)
{
    int error = 0;
    FILE *file = fopen("/device/state/ap-error", "re");

    if (file == NULL)
        return 0;
    if (fscanf(file, "%d", &error) != 1)
        error = 0;
    fclose(file);
    errno = error;
    return error != 0;
}

int ioctl(int fd, unsigned long request, ...)
{
    static int (*next)(int, unsigned long, ...);
    va_list arguments;
    va_start(arguments, request);
    void *argument = va_arg(arguments, void *);
    va_end(arguments);

    if (next == NULL)
        next = (int (*)(int, unsigned long, ...))dlsym(RTLD_NEXT, "ioctl");
    if (request != SIOCGIWAP)
        return next(fd, request, argument);

    struct iwreq *wireless = argument;
    struct ifreq known;
    memset(&known, 0, sizeof known);
    memcpy(known.ifr_name, wireless->ifr_ifrn.ifrn_name, IFNAMSIZ);
    if (next(fd, SIOCGIFINDEX, &known) != 0)
        return -1;
    if (refused())
        return -1;
    unsigned char mac[6] = {0};
    read_access_point(mac);
    memset(&wireless->u.ap_addr, 0, sizeof wireless->u.ap_addr);
    wireless->u.ap_addr.sa_family = ARPHRD_ETHER;
    memcpy(wireless->u.ap_addr.sa_data, mac, sizeof mac);
    return 0;
}
