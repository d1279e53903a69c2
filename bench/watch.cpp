// SPDX-License-Identifier: MIT
// Starts a program and watches from outside what it draws.
//
//   watch LOG PROGRAM [ARGUMENT...]
//
// LOG is the simulated device's log of commands. Commands come on standard input, one a line, each
// answered by lines on standard output of which the last begins with "ok" or "failed":
//
//   settle QUIET SCANS   waits until SCANS scans have ended since the start and then nothing has
//                        been drawn for QUIET ms; answers "damage MS X Y WIDTH HEIGHT" lines (of
//                        what was drawn since the last answer, MS after the start)
//   window               answers the window's X, Y, WIDTH and HEIGHT
//   picture [FILE]       answers a checksum of the pixels of the list's side (the buttons may
//   differ
//                        in their sensitivity), and writes the whole window as a PPM file
//   refresh COUNT        presses the Refresh button so many times, each time waiting for the list
//   close                asks the windows to close; answers the program's exit status and the CPU
//                        time, in ms, of it and of the commands that it waited for
//
// The first line of all is the process id of the program.

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/time.h>
#include <sys/wait.h>
#include <unistd.h>

#include <X11/Xlib.h>
#include <X11/Xutil.h>
#include <X11/extensions/XTest.h>
#include <X11/extensions/Xdamage.h>

// Longer than anything that is measured here, even under an instruction counter.
static const double LIMIT_MS = 120000;
// The pause of the program between a press and the scan.
static const double PAUSE_MS = 100;
static const char TITLE[] = "Wireless LAN";

static Display *display;
static int damage_event;
static pid_t child;
static double start_ms;
static double last_drawn_ms; // since the start; negative: nothing has been drawn

struct scan_log {
    int fd;
    char rest[4096]; // the start of an incomplete line
    size_t length;
    long scanning_pid;
    int ended;
    double end_seen_ms;
};

static scan_log device_log;

static double now_ms()
{
    struct timespec now;

    clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<double>(now.tv_sec) * 1e3 + static_cast<double>(now.tv_nsec) / 1e6;
}

static void read_log_line(const char *line)
{
    const char *pid = strstr(line, "\"pid\": ");

    if (pid == nullptr)
        return;

    const long number = strtol(pid + strlen("\"pid\": "), nullptr, 10);

    if (strstr(line, "\"event\": \"start\"") != nullptr) {
        if (strstr(line, "iwlist\", \"argv\"") != nullptr)
            device_log.scanning_pid = number;
    } else if (number == device_log.scanning_pid) {
        device_log.scanning_pid = 0;
        device_log.ended++;
        device_log.end_seen_ms = now_ms() - start_ms;
    }
}

static void read_log()
{
    ssize_t got;

    while ((got = read(device_log.fd, device_log.rest + device_log.length,
                       sizeof device_log.rest - 1 - device_log.length)) > 0) {
        char *line = device_log.rest;

        device_log.length += static_cast<size_t>(got);
        device_log.rest[device_log.length] = '\0';
        for (char *end; (end = strchr(line, '\n')) != nullptr; line = end + 1) {
            *end = '\0';
            read_log_line(line);
        }
        device_log.length = strlen(line);
        memmove(device_log.rest, line, device_log.length);
    }
}

static bool child_lives()
{
    siginfo_t info = {};

    return waitid(P_PID, static_cast<id_t>(child), &info, WEXITED | WNOHANG | WNOWAIT) == 0 &&
           info.si_pid == 0;
}

// Reads what has been drawn, waiting up to `wait_ms` for it, and reports each area if `tell` is
// set.
static void take_damage(int wait_ms, bool tell)
{
    struct pollfd server = {ConnectionNumber(display), POLLIN, 0};

    if (XPending(display) == 0)
        poll(&server, 1, wait_ms);
    while (XPending(display) > 0) {
        XEvent event;

        XNextEvent(display, &event);
        if (event.type != damage_event)
            continue;

        const XRectangle &area = reinterpret_cast<XDamageNotifyEvent *>(&event)->area;

        last_drawn_ms = now_ms() - start_ms;
        if (tell)
            printf("damage %.3f %d %d %d %d\n", last_drawn_ms, area.x, area.y, area.width,
                   area.height);
    }
    read_log();
}

static bool settle(double quiet_ms, int scans, bool tell)
{
    const double deadline = now_ms() + LIMIT_MS;

    while (now_ms() < deadline && child_lives()) {
        take_damage(5, tell);

        const double now = now_ms() - start_ms;

        if (last_drawn_ms >= 0 && now - last_drawn_ms >= quiet_ms && device_log.ended >= scans &&
            (scans == 0 || now - device_log.end_seen_ms >= quiet_ms))
            return true;
    }
    return false;
}

static Window find_window()
{
    Window root, parent, *windows = nullptr, found = None;
    unsigned count = 0;

    if (XQueryTree(display, DefaultRootWindow(display), &root, &parent, &windows, &count) == 0)
        return None;
    for (unsigned i = 0; i < count && found == None; i++) {
        XWindowAttributes attributes;
        char *name = nullptr;

        if (XGetWindowAttributes(display, windows[i], &attributes) != 0 &&
            attributes.map_state == IsViewable && XFetchName(display, windows[i], &name) != 0 &&
            name != nullptr && strcmp(name, TITLE) == 0)
            found = windows[i];
        XFree(name);
    }
    XFree(windows);
    return found;
}

static bool tell_window()
{
    XWindowAttributes attributes;
    const Window window = find_window();

    if (window == None || XGetWindowAttributes(display, window, &attributes) == 0)
        return false;
    printf("%d %d %d %d\n", attributes.x, attributes.y, attributes.width, attributes.height);
    return true;
}

// A position past the left column and the handle of the pane.
static const int LIST_SIDE_X = 260;

static bool tell_picture(const char *file)
{
    XWindowAttributes attributes;
    const Window window = find_window();

    if (window == None || XGetWindowAttributes(display, window, &attributes) == 0)
        return false;

    XImage *image = XGetImage(display, window, 0, 0, static_cast<unsigned>(attributes.width),
                              static_cast<unsigned>(attributes.height), AllPlanes, ZPixmap);
    FILE *out = file != nullptr ? fopen(file, "we") : nullptr;
    uint64_t sum = 14695981039346656037U; // FNV-1a

    if (image == nullptr)
        return false;
    if (out != nullptr)
        fprintf(out, "P6 %d %d 255\n", image->width, image->height);
    for (int y = 0; y < image->height; y++)
        for (int x = 0; x < image->width; x++) {
            const unsigned long pixel = XGetPixel(image, x, y) & 0xffffff;

            if (x >= LIST_SIDE_X)
                sum = (sum ^ pixel) * 1099511628211U;
            if (out != nullptr)
                for (int shift = 16; shift >= 0; shift -= 8)
                    fputc(static_cast<int>(pixel >> shift & 0xff), out);
        }
    if (out != nullptr)
        fclose(out);
    XDestroyImage(image);
    printf("%016llx\n", static_cast<unsigned long long>(sum));
    return true;
}

static void point_at(int x, int y)
{
    XTestFakeMotionEvent(display, DefaultScreen(display), x, y, CurrentTime);
    XFlush(display);
}

static void point_away()
{
    point_at(0, DisplayHeight(display, DefaultScreen(display)) - 1);
}

static void press(int x, int y)
{
    point_at(x, y);
    XTestFakeButtonEvent(display, 1, True, CurrentTime);
    XTestFakeButtonEvent(display, 1, False, CurrentTime);
    point_away();
}

struct place {
    int x, y;
};

// Finds the Refresh button, the first one in the left column: the first place from the top where a
// press begins a scan. Leaves the list filled.
static bool find_refresh_button(place *button)
{
    XWindowAttributes attributes;
    const Window window = find_window();
    const int ended = device_log.ended;

    if (window == None || XGetWindowAttributes(display, window, &attributes) == 0)
        return false;
    for (int y = 60; y < 200; y += 12) {
        *button = {attributes.x + 100, attributes.y + y};
        press(button->x, button->y);
        for (int waited = 0; waited < 100; waited++) {
            take_damage(5, false);
            if (device_log.ended > ended)
                return settle(500, 0, false);
        }
    }
    return false;
}

static bool refresh_once(const place &button)
{
    const int ended = device_log.ended;
    const double deadline = now_ms() + LIMIT_MS;
    double pressed = -1e9;

    // The press changes something at once, and the list after the pause before the scan. A press on
    // a button that was not sensitive yet is repeated.
    while (device_log.ended == ended || start_ms + last_drawn_ms < pressed + PAUSE_MS) {
        if (now_ms() > deadline || !child_lives())
            return false;
        if (device_log.ended == ended && now_ms() - pressed > 2000) {
            pressed = now_ms();
            press(button.x, button.y);
        }
        take_damage(5, false);
    }
    return settle(20, 0, false);
}

// Finding the button has done the first of them.
static bool refresh(int times)
{
    static place button;
    static bool found;

    if (!found) {
        found = find_refresh_button(&button);
        if (!found)
            return false;
        times--;
    }
    for (int i = 0; i < times; i++)
        if (!refresh_once(button))
            return false;
    return true;
}

static double milliseconds(const struct timeval &time)
{
    return static_cast<double>(time.tv_sec) * 1e3 + static_cast<double>(time.tv_usec) / 1e3;
}

// Sent to every window that supports the message, like the close button of a window manager.
static void ask_to_close()
{
    Window root, parent, *windows = nullptr;
    unsigned count = 0;

    if (XQueryTree(display, DefaultRootWindow(display), &root, &parent, &windows, &count) == 0)
        return;
    for (unsigned i = 0; i < count; i++) {
        XWindowAttributes attributes;
        Atom *protocols = nullptr;
        int number = 0;

        if (XGetWindowAttributes(display, windows[i], &attributes) == 0 ||
            attributes.map_state != IsViewable ||
            XGetWMProtocols(display, windows[i], &protocols, &number) == 0)
            continue;
        XFree(protocols);

        XEvent event = {};

        event.xclient.type = ClientMessage;
        event.xclient.window = windows[i];
        event.xclient.message_type = XInternAtom(display, "WM_PROTOCOLS", False);
        event.xclient.format = 32;
        event.xclient.data.l[0] =
            static_cast<long>(XInternAtom(display, "WM_DELETE_WINDOW", False));
        XSendEvent(display, windows[i], False, NoEventMask, &event);
    }
    XFree(windows);
    XFlush(display);
}

static bool close_windows()
{
    const double deadline = now_ms() + LIMIT_MS;
    double asked = -1e9;
    struct rusage used = {};
    int status = 0;

    // A window below a modal dialog handles the message only when the dialog has gone.
    while (child_lives() && now_ms() < deadline) {
        if (now_ms() - asked > 200) {
            ask_to_close();
            asked = now_ms();
        }
        take_damage(5, false);
    }
    if (child_lives())
        kill(child, SIGKILL);
    wait4(child, &status, 0, &used);
    child = 0;
    printf("%d %.3f\n", WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status),
           milliseconds(used.ru_utime) + milliseconds(used.ru_stime));
    return true;
}

static bool obey(char *line)
{
    double quiet_ms;
    int number;

    line[strcspn(line, "\n")] = '\0';
    if (sscanf(line, "settle %lf %d", &quiet_ms, &number) == 2)
        return settle(quiet_ms, number, true);
    if (strcmp(line, "window") == 0)
        return tell_window();
    if (strncmp(line, "picture", 7) == 0)
        return tell_picture(line[7] == ' ' ? line + 8 : nullptr);
    if (sscanf(line, "refresh %d", &number) == 1)
        return refresh(number);
    if (strcmp(line, "close") == 0)
        return close_windows();
    return false;
}

static bool watch_display()
{
    int first_error;

    display = XOpenDisplay(nullptr);
    if (display == nullptr || !XDamageQueryExtension(display, &damage_event, &first_error)) {
        fputs("watch: no display, or one without the DAMAGE extension\n", stderr);
        return false;
    }
    // A window may disappear while its position is read.
    XSetErrorHandler([](Display *, XErrorEvent *) { return 0; });
    damage_event += XDamageNotify;
    XDamageCreate(display, DefaultRootWindow(display), XDamageReportRawRectangles);
    point_away();
    XSync(display, False);
    take_damage(0, false); // what was there before
    last_drawn_ms = -1;
    return true;
}

static void start(char **argv)
{
    start_ms = now_ms();
    child = fork();
    if (child != 0)
        return;
    prctl(PR_SET_PDEATHSIG, SIGKILL);

    const int null = open("/dev/null", O_RDWR | O_CLOEXEC);

    dup2(null, STDIN_FILENO);
    dup2(null, STDOUT_FILENO);
    if (getenv("WATCH_ERRORS") == nullptr)
        dup2(null, STDERR_FILENO);
    execvp(argv[0], argv);
    perror(argv[0]);
    _exit(127);
}

int main(int argc, char **argv)
{
    char line[512];

    if (argc < 3) {
        fputs("usage: watch LOG PROGRAM [ARGUMENT...]\n", stderr);
        return 2;
    }
    device_log.fd = open(argv[1], O_RDONLY | O_CREAT | O_CLOEXEC, 0644);
    lseek(device_log.fd, 0, SEEK_END);
    setvbuf(stdout, nullptr, _IOFBF, 65536);
    fcntl(STDOUT_FILENO, F_SETFD, FD_CLOEXEC);
    if (device_log.fd < 0 || !watch_display())
        return 1;
    start(argv + 2);
    printf("%d\n", static_cast<int>(child));
    fflush(stdout);
    while (fgets(line, sizeof line, stdin) != nullptr) {
        const bool done = obey(line);

        puts(done ? "ok" : "failed");
        fflush(stdout);
        if (child == 0)
            return 0;
    }
    kill(child, SIGKILL);
    return 0;
}
