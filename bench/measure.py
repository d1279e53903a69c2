# SPDX-License-Identifier: MIT
"""Takes the measurements on the simulated device and prints the table. Started by ./run.

    measure.py BUILD [STARTS [REFRESHES [ONLY...]]]

BUILD is the build directory, ONLY names the measurements of MEASUREMENTS to take. README.md says
what each line of the table means.
"""

import os
import pathlib
import re
import statistics
import struct
import subprocess
import sys
import time

STATE = pathlib.Path("/device/state")
PROC = pathlib.Path("/proc/.kernel")

BUILD = pathlib.Path(sys.argv[1])
STARTS = int(sys.argv[2]) if len(sys.argv) > 2 else 15
REFRESHES = int(sys.argv[3]) if len(sys.argv) > 3 else 1000
ONLY = sys.argv[4:]
IDLE_SECONDS = 10
COUNTED_STARTS = 3
THEME = "Tango"
# How much slower a program is under the instruction counter, about.
COUNTER_SLOWNESS = 50

TOOLS = BUILD / "bench"
PROGRAM = BUILD / "wireless-lan" / "wireless-lan"
# Nothing more is drawn after so many milliseconds without drawing; before the scan they are 100.
QUIET = 400

rows = []


def progress(text):
    print("bench: " + text, file=sys.stderr, flush=True)


def report(what, measured, limit="", within=None):
    """One line of the table. `within` is None where there is nothing to keep within."""
    rows.append((what, measured, limit, "" if within is None else "yes" if within else "NO"))


def missing(what, reason):
    rows.append((what, "not measured: " + str(reason), "", "?"))


# --- the device ---------------------------------------------------------------------------------


def put(name, text):
    (STATE / (name + ".new")).write_text(text)
    (STATE / (name + ".new")).rename(STATE / name)


def set_interfaces(count):
    put("wireless",
        "Inter-| sta-|   Quality        |   Discarded packets               | Missed | WE\n"
        " face | tus | link level noise |  nwid  crypt   frag  retry   misc | beacon | 22\n"
        + " wlan0: 0000    0     0     0        0      0      0      0      0        0\n" * count)


def set_networks(count):
    text = ["wlan0     Scan completed :\n"]
    for number in range(1, count + 1):
        channel = number % 11 + 1
        text.append(
            f"          Cell {number:02d} - Address: "
            f"02:00:00:00:{number // 256:02X}:{number % 256:02X}\n"
            f"                    ESSID:\"network {number:03d}\"\n"
            "                    Mode:Master\n"
            f"                    Frequency:{(2407 + 5 * channel) / 1000:.3f} GHz "
            f"(Channel {channel})\n"
            f"                    Quality:{number % 100}/100  Signal level:-60 dBm  "
            "Noise level:-95 dBm\n"
            f"                    Encryption key:{'on' if number % 3 == 0 else 'off'}\n"
            "                    Bit Rates:54 Mb/s\n")
    put("scan", "".join(text))


# --- one start of one program -------------------------------------------------------------------


class Failure(Exception):
    pass


class Start:
    """A program under watch."""

    def __init__(self, *command):
        self.name = " ".join(os.path.basename(word) for word in map(str, command))
        self.watch = subprocess.Popen([TOOLS / "watch", STATE / "log", *map(str, command)],
                                      stdin=subprocess.PIPE, stdout=subprocess.PIPE, text=True)
        pid = self.watch.stdout.readline()
        if not pid:
            raise Failure("watch did not start")
        self.pid = int(pid)

    def ask(self, command):
        self.watch.stdin.write(command + "\n")
        self.watch.stdin.flush()
        answer = []
        while True:
            line = self.watch.stdout.readline()
            if line == "ok\n":
                return answer
            if line in ("", "failed\n"):
                self.watch.stdin.close()
                self.watch.wait()
                raise Failure(f"{self.name}: {command}")
            answer.append(line.split())

    def settle(self, scans, quiet=QUIET):
        """What was drawn until the last scan is shown: [(ms, (x, y, width, height))]."""
        return [(float(line[1]), tuple(map(int, line[2:])))
                for line in self.ask(f"settle {quiet} {scans}")]

    def window(self):
        return tuple(map(int, self.ask("window")[0]))

    def picture(self):
        return self.ask("picture")[0][0]

    def close(self):
        """CPU time in ms."""
        status, used = self.ask("close")[0]
        self.watch.wait()
        if status != "0":
            raise Failure(f"{self.name} left with status {status}")
        return float(used)

    def memory(self):
        """PSS and private dirty memory, KiB."""
        text = (PROC / str(self.pid) / "smaps_rollup").read_text()
        return tuple(int(re.search(rf"^{field}:\s+(\d+) kB", text, re.M)[1])
                     for field in ("Pss", "Private_Dirty"))

    def descriptors(self):
        return len(os.listdir(PROC / str(self.pid) / "fd"))

    def libraries(self):
        text = (PROC / str(self.pid) / "maps").read_text()
        return {path for path in re.findall(r"(/\S+\.so[^/\s]*)$", text, re.M)}

    def activity(self):
        """Voluntary and involuntary context switches, and CPU time in ms."""
        directory = PROC / str(self.pid)
        status = (directory / "status").read_text()
        switches = [int(re.search(rf"^{kind}_ctxt_switches:\s+(\d+)", status, re.M)[1])
                    for kind in ("voluntary", "nonvoluntary")]
        return (*switches, int((directory / "schedstat").read_text().split()[0]) / 1e6)


def without(area, hole):
    """The parts of a rectangle outside another one."""
    x, y, w, h = area
    left, top = max(x, hole[0]), max(y, hole[1])
    right, bottom = min(x + w, hole[0] + hole[2]), min(y + h, hole[1] + hole[3])
    if left >= right or top >= bottom:
        return [area]
    parts = [(x, y, w, top - y), (x, bottom, w, y + h - bottom), (x, top, left - x, bottom - top),
             (right, top, x + w - right, bottom - top)]
    return [part for part in parts if part[2] > 0 and part[3] > 0]


def first_picture(drawn, window):
    """When every pixel of the window had been drawn by the program. The first piece is the display
    server's: the background of the new window."""
    if not drawn or drawn[0][1] != window:
        raise Failure("the window's background was not seen")
    open_parts = [window]
    for when, area in drawn[1:]:
        open_parts = [rest for part in open_parts for rest in without(part, area)]
        if not open_parts:
            return when
    raise Failure("the window was never drawn as a whole")


# --- the measurements ---------------------------------------------------------------------------


def median(values):
    return statistics.median(values)


def spread(values):
    low, _, high = statistics.quantiles(values, n=4)
    return f"{median(values):.1f} ms (quartiles {low:.1f}, {high:.1f})"


class Case:
    """One program in one situation, started again and again."""

    def __init__(self, command, interfaces, scans):
        self.command, self.interfaces, self.scans = command, interfaces, scans
        self.picture_ms, self.last_ms, self.pss, self.dirty, self.cpu = [], [], [], [], []
        self.shown = self.libraries = None

    def run(self):
        set_interfaces(self.interfaces)
        start = Start(*self.command)
        drawn = start.settle(self.scans)
        self.picture_ms.append(first_picture(drawn, start.window()))
        self.last_ms.append(drawn[-1][0])
        pss, dirty = start.memory()
        self.pss.append(pss)
        self.dirty.append(dirty)
        self.shown, self.libraries = start.picture(), start.libraries()
        self.cpu.append(start.close())


def program_size():
    """Width and height of the program's window: the floors get the same."""
    set_interfaces(0)
    start = Start(PROGRAM)
    start.settle(0)
    size = start.window()[2:]
    start.close()
    return size


def ratio(what, value, floor, limit, digits=3):
    measured = median(value) / median(floor)
    report(what, f"{measured:.{digits}f} x", f"{limit:.2f} x", measured <= limit)


def themed():
    """What starts a program on a desktop where somebody has chosen an icon theme."""
    put("theme.rc", f'gtk-icon-theme-name = "{THEME}"\n')
    return "env", f"GTK2_RC_FILES={STATE}/theme.rc"


def starts(size):
    cases = {
        "empty": Case((TOOLS / "empty",), 0, 0),
        "widgets": Case((TOOLS / "widgets", *size), 0, 0),
        "program, no interface": Case((PROGRAM,), 0, 0),
        "refresh": Case((TOOLS / "refresh", *size), 1, 1),
        "program": Case((PROGRAM,), 1, 1),
        "widgets, theme chosen": Case((*themed(), TOOLS / "widgets", *size), 0, 0),
        "refresh, theme chosen": Case((*themed(), TOOLS / "refresh", *size), 1, 1),
        "program, theme chosen": Case((*themed(), PROGRAM), 1, 1),
    }
    set_networks(128)
    for case in cases.values():
        case.run()
        case.__init__(case.command, case.interfaces, case.scans)  # the first one warms the caches
    for number in range(STARTS):
        progress(f"start {number + 1} of {STARTS}")
        for case in cases.values():
            case.run()
    return cases


def report_starts(cases):
    widgets, refresh, program = (cases[name] for name in ("widgets", "refresh", "program"))
    themed_widgets, themed_refresh, themed_program = (
        cases[name + ", theme chosen"] for name in ("widgets", "refresh", "program"))
    for name, case in cases.items():
        report(f"first whole picture: {name}", spread(case.picture_ms))
    for name in ("refresh", "program"):
        report(f"filled list, 128 networks: {name}", spread(cases[name].last_ms))
    for name, case in cases.items():
        report(f"CPU time of it and its commands: {name}", spread(case.cpu))
    ratio("start to first whole picture / widgets", program.picture_ms, widgets.picture_ms, 0.95)
    ratio("start to filled list, 128 networks / refresh", program.last_ms, refresh.last_ms, 1.00)
    ratio("theme chosen: start to first whole picture / refresh", themed_program.picture_ms,
          themed_refresh.picture_ms, 1.02)
    ratio("theme chosen: start to filled list / refresh", themed_program.last_ms,
          themed_refresh.last_ms, 1.03)
    report("list shown, pixel by pixel / refresh",
           "the same" if program.shown == refresh.shown else "another")
    for name, case in cases.items():
        report(f"memory: {name}", f"PSS {median(case.pss):.0f}, private dirty "
               f"{median(case.dirty):.0f} KiB")
    for what, one, floor, limit in (("", program, widgets, -550),
                                    ("theme chosen: ", themed_program, themed_widgets, 64)):
        more = median(one.dirty) - median(floor.dirty)
        report(f"{what}private dirty memory, 128 networks listed - widgets", f"{more:.0f} KiB",
               f"{limit} KiB", more <= limit)
    report("the same for refresh - widgets",
           f"{median(refresh.dirty) - median(widgets.dirty):.0f} KiB")
    others = sorted(program.libraries - widgets.libraries)
    report("shared libraries loaded beyond widgets'",
           f"{len(others)} {' '.join(map(os.path.basename, others))} (of {len(program.libraries)})",
           "0", not others)


def slow_clock():
    """Lets the clock that device/sim/clock.c preloads go as slowly as the instruction counter: GTK+
    works the rows of a list off in slices of time, and draws between them."""
    now = time.monotonic_ns()
    (STATE / "clock").write_bytes(struct.pack("=IIqqd", 0, 0, now, now, 1 / COUNTER_SLOWNESS))
    return "env", "LD_PRELOAD=/device/clock.so"


def instructions(size):
    commands = {"refresh": (TOOLS / "refresh", *size), "program": (PROGRAM,)}
    counts = {(theme, name): [] for theme in ("", "theme chosen: ") for name in commands}
    set_interfaces(1)
    set_networks(128)
    for number in range(COUNTED_STARTS):
        for theme, name in counts:
            progress(f"instruction count {number + 1} of {COUNTED_STARTS}: {theme}{name}")
            out = STATE / f"callgrind.{name}"
            start = Start(*slow_clock(), *(themed()[1:] if theme else ()), "valgrind", "-q",
                          "--tool=callgrind", f"--callgrind-out-file={out}", *commands[name])
            start.settle(1, quiet=4000)
            start.close()
            counts[theme, name].append(int(re.search(r"^totals: (\d+)", out.read_text(), re.M)[1]))
    for (theme, name), values in counts.items():
        report(f"{theme}instructions, start to filled list and end: {name}",
               f"{median(values) / 1e6:.1f} M")
    for theme, limit in (("", 0.82), ("theme chosen: ", 1.03)):
        ratio(f"{theme}instructions / refresh", counts[theme, "program"], counts[theme, "refresh"],
              limit)


def idle(size):
    set_interfaces(1)
    set_networks(128)
    for name, command, scans in (("widgets", (TOOLS / "widgets", *size), 0),
                                 ("program", (PROGRAM,), 1)):
        progress(f"idle, {IDLE_SECONDS} s: {name}")
        start = Start(*command)
        start.settle(scans)
        before = start.activity()
        subprocess.run(["sleep", str(IDLE_SECONDS)], check=True)
        woken, pushed, used = (now - then for now, then in zip(start.activity(), before))
        start.close()
        limit = name == "program"
        report(f"idle, {IDLE_SECONDS} s: {name}",
               f"{woken} wake-ups, {pushed} preemptions, {used:.1f} ms CPU",
               "0, 0 ms" if limit else "", woken == 0 and used == 0 if limit else None)


# The C library keeps pieces that have been freed for the next request of their size, up to 230 KiB,
# and comes by more of them with each refresh for some hundreds.
NO_CACHE = ("env", "GLIBC_TUNABLES=glibc.malloc.tcache_count=0")


def refreshes():
    set_interfaces(1)
    set_networks(128)
    for note, ahead in (("", ()), (", freed pieces not kept", NO_CACHE)):
        start = Start(*ahead, PROGRAM)
        start.settle(1)
        looks = []
        for total, count in ((10, 10), (REFRESHES, REFRESHES - 10)):
            progress(f"refreshes: {total}{note}")
            start.ask(f"refresh {count}")
            start.settle(0)
            looks.append((*start.memory(), start.descriptors()))
            report(f"after {total} refreshes{note}", "PSS {}, private dirty {} KiB, "
                   "{} descriptors".format(*looks[-1]))
        start.close()
        few, many = looks
        report(f"growth from 10 to {REFRESHES} refreshes{note}",
               f"{many[1] - few[1]} KiB, {many[2] - few[2]} descriptors", "0, 0",
               many[1] <= few[1] and many[2] <= few[2])


def scan_cost():
    costs = {}
    for count in (10, 128, 10000):
        progress(f"get_cell: {count} networks")
        set_networks(count)
        done = subprocess.run([TOOLS / "scan_cost", str(4 * STARTS)], stdout=subprocess.PIPE,
                              stderr=subprocess.DEVNULL, text=True, check=True)
        lines = [line.split() for line in done.stdout.splitlines()]
        pipe, own = (median([float(us) for name, us in lines if name == kind])
                     for kind in ("pipe", "get_cell"))
        costs[count] = (pipe, own)
        what = f"get_cell, {count} networks / a pipe"
        measured = f"{own / pipe:.3f} x ({own:.0f} us, the pipe {pipe:.0f} us)"
        if count == 128:
            report(what, measured, "1.15 x", own / pipe <= 1.15)
        else:
            report(what, measured)
    pipe, own = ((costs[10000][i] - costs[128][i]) / (10000 - 128) for i in (0, 1))
    report("per further network past 128", f"{own:.2f} us, the pipe {pipe:.2f} us",
           "that of the pipe", own <= pipe)


def refill():
    samples = {"floor": [], "program": []}
    set_interfaces(1)
    set_networks(128)
    for number in range(STARTS):
        progress(f"refill {number + 1} of {STARTS}")
        for name, values in samples.items():
            done = subprocess.run([TOOLS / "refill", name, "20"], stdout=subprocess.PIPE,
                                  stderr=subprocess.DEVNULL, text=True, check=True)
            values.append(median(list(map(float, done.stdout.split()))))
    for name, values in samples.items():
        report(f"refill of 128 shown rows: {name}", f"{median(values) / 1000:.2f} ms")
    ratio("refill of 128 shown rows / floor", samples["program"], samples["floor"], 1.05)


def size_of_program():
    stripped = STATE / "stripped"
    subprocess.run(["strip", "-o", stripped, PROGRAM], check=True)
    size = stripped.stat().st_size
    report("stripped executable", f"{size / 1024:.1f} KiB", "96 KiB", size <= 96 * 1024)


MEASUREMENTS = {
    "starts": lambda size: report_starts(starts(size)),
    "instructions": instructions,
    "refreshes": lambda size: refreshes(),
    "idle": idle,
    "get_cell": lambda size: scan_cost(),
    "refill": lambda size: refill(),
    "size": lambda size: size_of_program(),
}


def print_table():
    rows.sort(key=lambda row: not row[2] and row[3] != "?")  # what has a limit comes first
    headings = ("what", "measured", "limit", "within")
    widths = [max(len(row[i]) for row in [headings, *rows]) for i in range(4)]
    for row in [headings, tuple("-" * width for width in widths), *rows]:
        print("| " + " | ".join(text.ljust(width) for text, width in zip(row, widths)) + " |")


def main():
    os.sync()  # pages of a file that are still to be written count as the process's dirty ones
    # What the device preloads to answer for the kernel costs every process some time, and nothing
    # here asks for its answers.
    os.environ.pop("LD_PRELOAD", None)
    size = program_size()
    for what, measure in MEASUREMENTS.items():
        if ONLY and what not in ONLY:
            continue
        try:
            measure(size)
        except (Failure, OSError, subprocess.SubprocessError, TypeError) as reason:
            missing(what, reason)
    print_table()
    return any(row[3] == "?" for row in rows)


if __name__ == "__main__":
    sys.exit(main())
