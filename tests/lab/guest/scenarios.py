# SPDX-License-Identifier: MIT
"""scenarios.py GROUP: runs the scenarios of groups/GROUP.py, in the order of its list SCENARIOS.

Every scenario is one function; its name, with blanks, is the name of the test. A group shares one
machine and one run of the program; its function "prepare" prepares the air. A result is one line of
the file "results": "ok NAME" or "not ok NAME: reason".

A group that cuts the power (BOOTS) has a list of scenarios for each start of the machine; all but
the last end with a cut."""

import faulthandler
import importlib
import os
import sys
import time
import traceback

import air
import window as w
from air import run
from probe import wait_until

SYSTEMD = os.path.isdir("/run/systemd/system")


def journal():
    return run("journalctl", "-b", "--no-pager", "-o", "short-monotonic")


def look(name):
    """Keeps what helps to find out why a scenario failed."""
    w.photograph(f"failed-{name}")
    with open(f"{air.LOGS}/failed-{name}.txt", "w") as file:
        for command in (("iw", "dev"), ("iw", "dev", "wlan0", "link"), ("ip", "addr"),
                        ("ip", "route"), ("ps", "-ef"), ("cat", "/proc/net/wireless"),
                        ("cat", "/etc/wireless.conf"), ("dmesg",)):
            file.write(f"$ {' '.join(command)}\n{run(*command, check=False)}\n")
        if SYSTEMD:
            file.write(journal())


def recover():
    """After a failure: no dialog in the way of the next scenario, and a program that runs. A group
    without the program has nothing to recover."""
    if w.app is None:
        return
    for _ in range(4):
        if w.app.running() and w.app.dialogs():
            w.app.key("Escape")
            time.sleep(1)
    if not w.app.running():
        w.begin()
    wait_until(lambda: w.app.find("button-connect")["usable"] or w.title() == "Ad-Hoc Host Mode",
               "the window to be idle", 100)


def cut_the_power():
    """Ends the machine between two instructions. What it has not written to its disk is lost."""
    with open("/proc/uptime") as file:
        uptime = file.read().split()[0]
    with open("/dev/console", "w") as file:
        file.write(f"lab: the power is cut after {uptime} s\n")
    with open("/proc/sysrq-trigger", "w") as file:
        file.write("b")


def main():
    wanted = sys.argv[1]
    only = sys.argv[2:]
    group = importlib.import_module(f"groups.{wanted}")
    scenarios = group.SCENARIOS
    boots = getattr(group, "BOOTS", 0)
    if boots:
        with open("/lab/boot") as file:
            boot = int(file.read())
        scenarios = scenarios[boot - 1]
    names = [scenario.__name__ for scenario in scenarios]
    results = open(f"{air.LOGS}/results", "a", buffering=1)
    # Where it hangs, if it hangs, is in console.log.
    faulthandler.dump_traceback_later(200, repeat=True)
    begun = time.monotonic()
    try:
        group.prepare()
    except Exception as reason:
        traceback.print_exc()
        for name in names:
            results.write(f"not ok {wanted}: {name.replace('_', ' ')}: not begun, {reason}\n")
        look(wanted)
        return
    print(f"{wanted}: prepared after {time.monotonic() - begun:.0f} s")
    for scenario in scenarios:
        name = scenario.__name__
        if only and name not in only:
            continue
        begun = time.monotonic()
        # Anew for each: a look at what runs is no safe thing to do without need.
        faulthandler.dump_traceback_later(400, repeat=True)
        try:
            scenario()
            verdict = f"ok {wanted}: {name.replace('_', ' ')}"
        except Exception as reason:
            traceback.print_exc()
            first = str(reason).strip().replace("\n", "\\n")
            verdict = f"not ok {wanted}: {name.replace('_', ' ')}: {first}"
        results.write(f"{verdict} ({time.monotonic() - begun:.0f} s)\n")
        print(verdict)
        if verdict.startswith("not"):
            try:
                look(name)
                recover()
            except Exception:
                traceback.print_exc()
    if boots:
        with open(f"{air.LOGS}/journal-{boot}.log", "w") as file:
            file.write(journal())
        if boot < boots:
            cut_the_power()


if __name__ == "__main__":
    main()
