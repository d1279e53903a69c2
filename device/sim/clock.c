// SPDX-License-Identifier: MIT
// Preloaded into the program when a test rules its time: the clocks, and everything that waits by
// them, follow a page that the test writes. Virtual time passes RATE times as fast as real time;
// at rate 0 it does not move until the test moves it.
#define _GNU_SOURCE
#include <dlfcn.h>
#include <errno.h>
#include <fcntl.h>
#include <linux/futex.h>
#include <poll.h>
#include <signal.h>
#include <stdarg.h>
#include <stdbool.h>
#include <stdint.h>
#include <sys/mman.h>
#include <sys/select.h>
#include <sys/syscall.h>
#include <sys/time.h>
#include <time.h>
#include <unistd.h>

// The layout is shared with tests/device/harness/clock.py. The sequence number is odd while the
// page is being written.
struct page {
    uint32_t sequence;
    uint32_t unused;
    int64_t virtual_base; // ns
    int64_t real_base;    // ns
    double rate;
};

// The longest wait before the page is read again.
#define SLICE_NS 2000000

static const volatile struct page *page;

// How far these clocks are ahead of the monotonic one. It is measured once: measured at every call
// it would differ a little each time, and a stopped clock would move.
static int64_t real_ahead, boot_ahead;

// The system call itself: a name looked up in the next library may lead back here.
static int64_t real_now(clockid_t id)
{
    struct timespec now;
    syscall(SYS_clock_gettime, id, &now);
    return (int64_t)now.tv_sec * 1000000000 + now.tv_nsec;
}

__attribute__((constructor)) static void open_page(void)
{
    int fd = open("/device/state/clock", O_RDONLY | O_CLOEXEC);
    if (fd < 0)
        return;
    void *at = mmap(NULL, sizeof(struct page), PROT_READ, MAP_SHARED, fd, 0);
    close(fd);
    if (at != MAP_FAILED)
        page = at;
    real_ahead = real_now(CLOCK_REALTIME) - real_now(CLOCK_MONOTONIC);
    boot_ahead = real_now(CLOCK_BOOTTIME) - real_now(CLOCK_MONOTONIC);
}

static int64_t virtual_now(double *rate)
{
    struct page copy;
    int64_t now;
    if (page == NULL) {
        *rate = 1;
        return real_now(CLOCK_MONOTONIC);
    }
    do {
        copy.sequence = __atomic_load_n(&page->sequence, __ATOMIC_ACQUIRE);
        copy.virtual_base = page->virtual_base;
        copy.real_base = page->real_base;
        copy.rate = page->rate;
        __atomic_thread_fence(__ATOMIC_ACQUIRE);
        now = real_now(CLOCK_MONOTONIC);
    } while (copy.sequence % 2 != 0 || copy.sequence != page->sequence);
    *rate = copy.rate;
    return copy.virtual_base + (int64_t)((double)(now - copy.real_base) * copy.rate);
}

static struct timespec to_timespec(int64_t ns)
{
    return (struct timespec){.tv_sec = ns / 1000000000, .tv_nsec = ns % 1000000000};
}

// The real time to wait before looking again, 0 when the deadline has come.
static int64_t next_slice(int64_t deadline)
{
    double rate;
    int64_t left = deadline - virtual_now(&rate);
    if (left <= 0)
        return 0;
    if (rate <= 0 || (double)left / rate > SLICE_NS)
        return SLICE_NS;
    return (int64_t)((double)left / rate) + 1;
}

static int64_t deadline_after(int64_t ns)
{
    double rate;
    return virtual_now(&rate) + ns;
}

static int wait_for(int64_t deadline)
{
    int64_t slice;
    while ((slice = next_slice(deadline)) > 0) {
        struct timespec wait = to_timespec(slice);
        if (syscall(SYS_nanosleep, &wait, NULL) != 0)
            return -1;
    }
    return 0;
}

int clock_gettime(clockid_t id, struct timespec *now)
{
    double rate;
    int64_t ahead = 0;
    switch (id) {
    case CLOCK_MONOTONIC:
    case CLOCK_MONOTONIC_COARSE:
    case CLOCK_MONOTONIC_RAW:
        break;
    case CLOCK_REALTIME:
    case CLOCK_REALTIME_COARSE:
        ahead = real_ahead;
        break;
    case CLOCK_BOOTTIME:
        ahead = boot_ahead;
        break;
    default:
        return (int)syscall(SYS_clock_gettime, id, now);
    }
    if (page == NULL)
        return (int)syscall(SYS_clock_gettime, id, now);
    *now = to_timespec(virtual_now(&rate) + ahead);
    return 0;
}

int gettimeofday(struct timeval *restrict now, void *restrict zone)
{
    struct timespec precise;
    (void)zone;
    clock_gettime(CLOCK_REALTIME, &precise);
    now->tv_sec = precise.tv_sec;
    now->tv_usec = precise.tv_nsec / 1000;
    return 0;
}

time_t time(time_t *result)
{
    struct timespec now;
    clock_gettime(CLOCK_REALTIME, &now);
    if (result != NULL)
        *result = now.tv_sec;
    return now.tv_sec;
}

int ppoll(struct pollfd *fds, nfds_t count, const struct timespec *timeout, const sigset_t *mask)
{
    if (timeout == NULL || (timeout->tv_sec == 0 && timeout->tv_nsec == 0)) {
        struct timespec copy = {0, 0};
        return (int)syscall(SYS_ppoll, fds, count, timeout == NULL ? NULL : &copy, mask, _NSIG / 8);
    }
    int64_t deadline = deadline_after((int64_t)timeout->tv_sec * 1000000000 + timeout->tv_nsec);
    for (;;) {
        int64_t slice = next_slice(deadline);
        struct timespec wait = to_timespec(slice);
        int ready = (int)syscall(SYS_ppoll, fds, count, &wait, mask, _NSIG / 8);
        if (ready != 0 || slice == 0)
            return ready;
    }
}

int poll(struct pollfd *fds, nfds_t count, int timeout)
{
    struct timespec wait = to_timespec((int64_t)timeout * 1000000);
    return ppoll(fds, count, timeout < 0 ? NULL : &wait, NULL);
}

int __poll_chk(struct pollfd *fds, nfds_t count, int timeout, size_t size);
int __poll_chk(struct pollfd *fds, nfds_t count, int timeout, size_t size)
{
    (void)size;
    return poll(fds, count, timeout);
}

int select(int count, fd_set *restrict in, fd_set *restrict out, fd_set *restrict error,
           struct timeval *restrict timeout)
{
    if (timeout == NULL)
        return (int)syscall(SYS_pselect6, count, in, out, error, NULL, NULL);
    fd_set empty;
    FD_ZERO(&empty);
    fd_set in_copy = in != NULL ? *in : empty, out_copy = out != NULL ? *out : empty,
           error_copy = error != NULL ? *error : empty;
    int64_t deadline =
        deadline_after((int64_t)timeout->tv_sec * 1000000000 + (int64_t)timeout->tv_usec * 1000);
    for (;;) {
        int64_t slice = next_slice(deadline);
        struct timespec wait = to_timespec(slice);
        int ready = (int)syscall(SYS_pselect6, count, in, out, error, &wait, NULL);
        if (ready != 0 || slice == 0)
            return ready;
        if (in != NULL)
            *in = in_copy;
        if (out != NULL)
            *out = out_copy;
        if (error != NULL)
            *error = error_copy;
    }
}

int nanosleep(const struct timespec *wait, struct timespec *left)
{
    (void)left;
    return wait_for(deadline_after((int64_t)wait->tv_sec * 1000000000 + wait->tv_nsec));
}

unsigned int sleep(unsigned int seconds)
{
    wait_for(deadline_after((int64_t)seconds * 1000000000));
    return 0;
}

int usleep(useconds_t microseconds)
{
    return wait_for(deadline_after((int64_t)microseconds * 1000));
}

// Waits as futex(2) does with FUTEX_WAIT, until a moment of the monotonic clock.
static long wait_on_futex(uint32_t *word, int flags, uint32_t expected,
                          const struct timespec *moment)
{
    int64_t deadline = (int64_t)moment->tv_sec * 1000000000 + moment->tv_nsec;
    for (;;) {
        int64_t slice = next_slice(deadline);
        struct timespec wait = to_timespec(slice);
        long result = syscall(SYS_futex, word, FUTEX_WAIT | flags, expected, &wait, NULL, 0);
        if (result == 0 || errno != ETIMEDOUT || slice == 0)
            return result;
    }
}

// Some runtimes compute a moment from the clock here and give it to the kernel, which would wait by
// its own: Rust's standard library, in the toolkit's later picture loaders.
long syscall(long number, ...)
{
    static long (*next)(long number, ...);
    unsigned long argument[6];
    va_list list;
    va_start(list, number);
    for (int i = 0; i < 6; i++)
        argument[i] = va_arg(list, unsigned long);
    va_end(list);
    int operation = (int)argument[1];
    if (number == SYS_futex && page != NULL && argument[3] != 0 &&
        (operation & ~FUTEX_PRIVATE_FLAG) == FUTEX_WAIT_BITSET)
        return wait_on_futex((uint32_t *)argument[0], operation & FUTEX_PRIVATE_FLAG,
                             (uint32_t)argument[2], (const struct timespec *)argument[3]);
    if (next == NULL)
        next = (long (*)(long number, ...))dlsym(RTLD_NEXT, "syscall");
    return next(number, argument[0], argument[1], argument[2], argument[3], argument[4],
                argument[5]);
}
