// SPDX-License-Identifier: MIT
// Every command of the simulated device: iwset, lnk-ifup, lnk-ifdown, ifconfig, iwlist, cat.
//
// One program has all the names. It logs how it was called, waits, runs the hook, prints what the
// state directory holds for it, and exits with the status from there. Each of these files of the
// state directory is optional and read at every call:
//
//   NAME.delay   seconds to wait first       hooks/NAME   program to run next, same arguments
//   NAME.stdout  text for standard output    NAME.stderr  text for standard error
//   NAME.exit    exit status                 scan         what "iwlist IF scan" prints
//   wireless     what "cat /proc/net/wireless" prints
//
// The log has one JSON object a line, each written by one call: "start" with the arguments, "end"
// with the status and the parent at that time. A byte is written as a character, U+0000 to U+00FF.
#define _GNU_SOURCE
#include <errno.h>
#include <fcntl.h>
#include <net/if.h>
#include <stdbool.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/auxv.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <time.h>
#include <unistd.h>

#define STATE "/device/state/"

static const char *name;

static void write_all(int fd, const char *text, size_t length)
{
    while (length > 0) {
        ssize_t written = write(fd, text, length);
        if (written < 0 && errno == EINTR)
            continue;
        if (written <= 0)
            return;
        text += written;
        length -= (size_t)written;
    }
}

static void put_bytes(FILE *out, const char *text)
{
    fputc('"', out);
    for (const unsigned char *at = (const unsigned char *)text; *at != '\0'; at++) {
        if (*at < ' ' || *at == '"' || *at == '\\' || *at > '~')
            fprintf(out, "\\u%04x", *at);
        else
            fputc(*at, out);
    }
    fputc('"', out);
}

static void append_to_log(const char *line, size_t length)
{
    int log = open(STATE "log", O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0644);
    if (log < 0)
        return;
    write_all(log, line, length);
    close(log);
}

static void log_start(const char *path, int argc, char **argv)
{
    char *line = NULL;
    size_t length = 0;
    FILE *out = open_memstream(&line, &length);
    fprintf(out, "{\"event\": \"start\", \"pid\": %d, \"ppid\": %d, \"path\": ", getpid(),
            getppid());
    put_bytes(out, path);
    fputs(", \"argv\": [", out);
    for (int i = 0; i < argc; i++) {
        fputs(i > 0 ? ", " : "", out);
        put_bytes(out, argv[i]);
    }
    fputs("]}\n", out);
    fclose(out);
    append_to_log(line, length);
    free(line);
}

static void log_end(int status)
{
    char line[128];
    int length = snprintf(line, sizeof line,
                          "{\"event\": \"end\", \"pid\": %d, \"ppid\": %d, \"status\": %d}\n",
                          getpid(), getppid(), status);
    append_to_log(line, (size_t)length);
}

static const char *state_file(const char *suffix)
{
    static char path[256];
    snprintf(path, sizeof path, STATE "%s%s", name, suffix);
    return path;
}

static double number_in(const char *path, double otherwise)
{
    double value = otherwise;
    FILE *file = fopen(path, "re");
    if (file != NULL) {
        if (fscanf(file, "%lf", &value) != 1)
            value = otherwise;
        fclose(file);
    }
    return value;
}

static bool print_file(const char *path, int to)
{
    char block[65536];
    ssize_t got;
    int from = open(path, O_RDONLY | O_CLOEXEC);
    if (from < 0)
        return false;
    while ((got = read(from, block, sizeof block)) > 0)
        write_all(to, block, (size_t)got);
    close(from);
    return true;
}

static void pause_for(double seconds)
{
    struct timespec rest = {.tv_sec = (time_t)seconds,
                            .tv_nsec = (long)((seconds - (double)(time_t)seconds) * 1e9)};
    while (nanosleep(&rest, &rest) != 0 && errno == EINTR)
        continue;
}

// The scenario's own hook, else the default one, else none.
static void run_hook(char **argv)
{
    char path[256];
    snprintf(path, sizeof path, STATE "hooks/%s", name);
    if (access(path, X_OK) != 0)
        snprintf(path, sizeof path, "/device/hooks/%s", name);
    if (access(path, X_OK) != 0)
        return;
    pid_t child = fork();
    if (child == 0) {
        execv(path, argv);
        _exit(127);
    }
    if (child > 0)
        waitpid(child, NULL, 0);
}

static int bring_up(const char *interface)
{
    struct ifreq request;
    memset(&request, 0, sizeof request);
    snprintf(request.ifr_name, sizeof request.ifr_name, "%s", interface);
    int fd = socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    int result = ioctl(fd, SIOCGIFFLAGS, &request);
    if (result == 0) {
        request.ifr_flags |= IFF_UP;
        result = ioctl(fd, SIOCSIFFLAGS, &request);
    }
    if (result != 0)
        fprintf(stderr, "%s: ERROR while getting interface flags: %s\n", interface,
                strerror(errno));
    close(fd);
    return result == 0 ? 0 : 255;
}

static int answer(int argc, char **argv)
{
    if (print_file(state_file(".stdout"), STDOUT_FILENO))
        return 0;
    if (strcmp(name, "cat") == 0 && !print_file(STATE "wireless", STDOUT_FILENO)) {
        fputs("cat: /proc/net/wireless: No such file or directory\n", stderr);
        return 1;
    }
    if (strcmp(name, "ifconfig") == 0 && argc == 3 && strcmp(argv[2], "up") == 0)
        return bring_up(argv[1]);
    if (strcmp(name, "iwlist") == 0 && argc == 3 && strcmp(argv[2], "scan") == 0 &&
        (if_nametoindex(argv[1]) == 0 || !print_file(STATE "scan", STDOUT_FILENO)))
        fprintf(stderr, "%-8.16s  Interface doesn't support scanning.\n\n", argv[1]);
    return 0;
}

int main(int argc, char **argv)
{
    const char *path = (const char *)getauxval(AT_EXECFN);
    const char *slash = strrchr(path, '/');
    name = slash != NULL ? slash + 1 : path;

    if (strcmp(name, "cat") == 0 && (argc != 2 || strcmp(argv[1], "/proc/net/wireless") != 0)) {
        execv("/device/cat", argv);
        return 127;
    }

    log_start(path, argc, argv);
    pause_for(number_in(state_file(".delay"), 0));
    run_hook(argv);
    int status = answer(argc, argv);
    print_file(state_file(".stderr"), STDERR_FILENO);
    status = (int)number_in(state_file(".exit"), status);
    log_end(status);
    return status;
}
