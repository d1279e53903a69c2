# SPDX-License-Identifier: MIT
"""A screen of a test's own: X server and window manager."""

import contextlib
import os
import signal
import subprocess
import threading

from Xlib import X

from probe import Screen
from support.png import save_png

WINDOW_MANAGERS = {True: ["openbox", "--sm-disable"], "blackbox": ["blackbox"]}


class Display(Screen):
    def __init__(self, directory, size="1024x768", window_manager=True):
        """`window_manager`: one of WINDOW_MANAGERS, or False for none."""
        self._processes = []
        self._log = open(os.path.join(directory, "display.log"), "wb")
        reading, writing = os.pipe()
        self._start(["Xvfb", "-displayfd", str(writing), "-screen", "0", size + "x24",
                     "-nolisten", "tcp", "-noreset"], pass_fds=(writing,))
        os.close(writing)
        with os.fdopen(reading) as answer:
            number = answer.readline().strip()
        if not number:
            raise AssertionError("Xvfb did not start; see display.log")
        super().__init__(":" + number)
        if window_manager:
            environment = {"PATH": os.environ["PATH"], "DISPLAY": self.name, "HOME": directory,
                           "XDG_CONFIG_HOME": directory, "XDG_CACHE_HOME": directory, "LANG": "C"}
            self._start(WINDOW_MANAGERS[window_manager], env=environment)
            self.wait_window_manager()

    def _start(self, command, **more):
        # Nothing stays when the tests are killed.
        self._processes.append(subprocess.Popen(
            ["setpriv", "--pdeathsig", "KILL"] + command, stdin=subprocess.DEVNULL,
            stdout=self._log, stderr=self._log, **more))

    @contextlib.contextmanager
    def window_manager_asleep(self):
        """Stops it; its events are handled when it goes on: at the end, or before it, a number of
        seconds after the function that this gives has been called with that number."""
        manager = self._processes[1]
        timers = []

        def wake_after(seconds):
            timers.append(threading.Timer(seconds, manager.send_signal, [signal.SIGCONT]))
            timers[-1].start()

        manager.send_signal(signal.SIGSTOP)
        try:
            yield wake_after
        finally:
            for timer in timers:
                timer.cancel()
            manager.send_signal(signal.SIGCONT)

    def screenshot(self, path):
        """Saves what the screen shows as a PNG file; gives the path."""
        size = self.root.get_geometry()
        image = self.root.get_image(0, 0, size.width, size.height, X.ZPixmap, 0xFFFFFFFF)
        return save_png(path, size.width, size.height, image.data)

    def alive(self):
        return all(process.poll() is None for process in self._processes)

    def close(self):
        for process in reversed(self._processes):
            process.kill()
        for process in self._processes:
            process.wait()
        self._log.close()
