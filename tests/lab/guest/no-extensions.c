// SPDX-License-Identifier: MIT
// Preloaded into every program of a machine, it answers as a kernel that was built without wireless
// extensions (CONFIG_CFG80211_WEXT): their requests are unknown, and so is their list of
// interfaces.
#define _GNU_SOURCE
#include <dlfcn.h>
#include <errno.h>
#include <fcntl.h>
#include <stdarg.h>
#include <stdio.h>
#include <string.h>

// The requests of linux/wireless.h, SIOCIWFIRST to SIOCIWLAST.
enum { FIRST_REQUEST = 0x8B00, LAST_REQUEST = 0x8BFF };

int ioctl(int descriptor, unsigned long request, ...)
{
    static int (*next)(int, unsigned long, ...);
    va_list arguments;

    va_start(arguments, request);
    void *argument = va_arg(arguments, void *);
    va_end(arguments);
    if ((unsigned int)request >= FIRST_REQUEST && (unsigned int)request <= LAST_REQUEST) {
        errno = ENOTTY;
        return -1;
    }
    if (next == NULL)
        next = (int (*)(int, unsigned long, ...))dlsym(RTLD_NEXT, "ioctl");
    return next(descriptor, request, argument);
}

static int absent(const char *path)
{
    if (strcmp(path, "/proc/net/wireless") != 0)
        return 0;
    errno = ENOENT;
    return 1;
}

// The mode of an open that may create the file.
#define OPEN_MODE(flags, mode)                                                                     \
    if (((flags)&O_CREAT) != 0 || ((flags)&O_TMPFILE) == O_TMPFILE) {                              \
        va_list arguments;                                                                         \
        va_start(arguments, flags);                                                                \
        (mode) = va_arg(arguments, unsigned int);                                                  \
        va_end(arguments);                                                                         \
    }

#define OPEN(name)                                                                                 \
    int name(const char *path, int flags, ...)                                                     \
    {                                                                                              \
        static int (*next)(const char *, int, ...);                                                \
        unsigned int mode = 0;                                                                     \
        OPEN_MODE(flags, mode)                                                                     \
        if (absent(path))                                                                          \
            return -1;                                                                             \
        if (next == NULL)                                                                          \
            next = (int (*)(const char *, int, ...))dlsym(RTLD_NEXT, #name);                       \
        return next(path, flags, mode);                                                            \
    }

#define OPENAT(name)                                                                               \
    int name(int directory, const char *path, int flags, ...)                                      \
    {                                                                                              \
        static int (*next)(int, const char *, int, ...);                                           \
        unsigned int mode = 0;                                                                     \
        OPEN_MODE(flags, mode)                                                                     \
        if (absent(path))                                                                          \
            return -1;                                                                             \
        if (next == NULL)                                                                          \
            next = (int (*)(int, const char *, int, ...))dlsym(RTLD_NEXT, #name);                  \
        return next(directory, path, flags, mode);                                                 \
    }

#define FOPEN(name)                                                                                \
    FILE *name(const char *path, const char *mode)                                                 \
    {                                                                                              \
        static FILE *(*next)(const char *, const char *);                                          \
        if (absent(path))                                                                          \
            return NULL;                                                                           \
        if (next == NULL)                                                                          \
            next = (FILE * (*)(const char *, const char *)) dlsym(RTLD_NEXT, #name);               \
        return next(path, mode);                                                                   \
    }

OPEN(open)
OPEN(open64)
OPENAT(openat)
OPENAT(openat64)
FOPEN(fopen)
FOPEN(fopen64)
