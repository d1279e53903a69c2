// SPDX-License-Identifier: MIT
// Times get_cell against a plain pipe that reads the same lines and drops them, in turns.
//
//   scan_cost ROUNDS
//
// "iwlist" comes from PATH. Answers "pipe US" and "get_cell US" lines, one pair a round.

#include <cstdio>
#include <cstdlib>
#include <ctime>

#include "wifi.h"
#include "wifi_info/scan.h"
#include "wifi_info/text.h"

// get_cell brings the interface up first, with a shell and a command that are no part of the
// comparison. Nothing else in this program uses this function.
extern "C" int system(const char *)
{
    return 0;
}

static double now_us()
{
    struct timespec now;

    clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<double>(now.tv_sec) * 1e6 + static_cast<double>(now.tv_nsec) / 1e3;
}

static double time_pipe()
{
    const double start = now_us();
    FILE *pipe = popen("iwlist wlan0 scan", "re");
    char line[512];

    if (pipe == nullptr)
        return 0;
    while (fgets(line, sizeof line, pipe) != nullptr)
        ;
    pclose(pipe);
    return now_us() - start;
}

static double time_get_cell(WIFI_INTERFACE *iface)
{
    const double start = now_us();

    get_cell(iface);
    return now_us() - start;
}

int main(int argc, char **argv)
{
    const int rounds = argc > 1 ? atoi(argv[1]) : 15;

    my_wifi = g_new0(MY_WIFI, 1);

    WIFI_INTERFACE *iface = my_wifi->wifi_interface[0] = g_new0(WIFI_INTERFACE, 1);

    copy_field(iface->name, sizeof iface->name, "wlan0");
    time_pipe();
    time_get_cell(iface);
    for (int i = 0; i < rounds; i++) {
        printf("pipe %.1f\n", time_pipe());
        printf("get_cell %.1f\n", time_get_cell(iface));
    }
    return my_wifi->cell_count > 0 ? 0 : 1;
}
