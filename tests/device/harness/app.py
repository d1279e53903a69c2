# SPDX-License-Identifier: MIT
"""The program on a simulated device: its windows, what it prints, and its process."""

import os
import re
import signal
import time

from probe import LIMIT, Program, wait_until


class App(Program):
    def __init__(self, device, process, number):
        self.device, self.process, self._number = device, process, number
        super().__init__(process, device.probe_path(number), device.display,
                         device.window_manager)

    def stdout(self):
        return self.device.state_file(f"stdout.{self._number}").decode("utf-8", "surrogateescape")

    def stderr(self):
        return self.device.state_file(f"stderr.{self._number}").decode("utf-8", "surrogateescape")

    def said(self):
        return self.stderr()[-3000:]

    def wait_printed(self, text, count=1, limit=LIMIT):
        """Until standard output or standard error holds the text `count` times."""
        wait_until(lambda: self.stdout().count(text) + self.stderr().count(text) >= count,
                   lambda: f"{text!r} printed {count} times in\n{self.stdout()}\n{self.stderr()}",
                   limit)

    def refresh(self):
        """Presses Refresh and waits until the rows are there again."""
        scans = len(self.device.commands("iwlist"))
        self.press("button-refresh")
        # The press may still be on its way through the window manager; the old rows are there.
        self.device.wait_command("iwlist", scans + 1)
        return self.wait_listed()

    @property
    def pid(self):
        """Process id as this machine sees it."""
        return wait_until(lambda: child_ids(self.process.pid), "the program's process")[0]

    @property
    def inner_pid(self):
        """Process id as the program itself sees it."""
        with open(f"/proc/{self.pid}/status", encoding="ascii") as status:
            return int(re.search(r"^NSpid:.*?(\d+)$", status.read(), re.M)[1])

    def descriptors(self):
        """What each of its open descriptors is: {number: target}."""
        directory = f"/proc/{self.pid}/fd"
        return {int(name): os.readlink(f"{directory}/{name}") for name in os.listdir(directory)}

    def sanitized(self):
        """Whether this is a build with sanitizers."""
        with open(f"/proc/{self.pid}/maps", encoding="utf-8") as maps:
            return "libasan" in maps.read() or b"__asan_init" in self._image()

    def _image(self):
        with open(f"/proc/{self.pid}/exe", "rb") as image:
            return image.read()

    def private_memory(self):
        """Private dirty memory, KiB."""
        with open(f"/proc/{self.pid}/smaps_rollup", encoding="ascii") as sums:
            return int(re.search(r"^Private_Dirty: *(\d+)", sums.read(), re.M)[1])

    def kill(self):
        while self.running():  # which it may not be any more a moment later
            for child in child_ids(self.process.pid)[:1]:
                kill(child)
            time.sleep(0.005)
        self.disconnect()
        return self.wait_end()


def kill(pid):
    """Kills a process that may have ended by itself."""
    try:
        os.kill(pid, signal.SIGKILL)
    except ProcessLookupError:
        pass


def child_ids(pid):
    """Process ids of the children of a process."""
    with open(f"/proc/{pid}/task/{pid}/children", encoding="ascii") as children:
        return [int(child) for child in children.read().split()]
