# SPDX-License-Identifier: MIT
"""The program's time, ruled by the test; the page is read by device/sim/clock.c."""

import mmap
import struct
import time

LAYOUT = struct.Struct("=qqd")


class Clock:
    def __init__(self, path, rate):
        with open(path, "wb") as page:
            page.write(bytes(8 + LAYOUT.size))
        self._file = open(path, "r+b")
        self._page = mmap.mmap(self._file.fileno(), 8 + LAYOUT.size)
        self._sequence = 0
        now = time.clock_gettime_ns(time.CLOCK_MONOTONIC)
        self._virtual, self._real, self._rate = now, now, float(rate)
        self._write()

    def _write(self):
        self._page[0:4] = struct.pack("=I", self._sequence + 1)
        self._page[8:] = LAYOUT.pack(self._virtual, self._real, self._rate)
        self._sequence += 2
        self._page[0:4] = struct.pack("=I", self._sequence)

    def _settle(self):
        now = time.clock_gettime_ns(time.CLOCK_MONOTONIC)
        self._virtual += int((now - self._real) * self._rate)
        self._real = now

    @property
    def rate(self):
        return self._rate

    @rate.setter
    def rate(self, rate):
        """From now on, time passes `rate` times as fast as real time; 0: it does not pass."""
        self._settle()
        self._rate = float(rate)
        self._write()

    def advance(self, milliseconds):
        """Moves the time on at once."""
        self._settle()
        self._virtual += int(milliseconds * 1_000_000)
        self._write()

    def close(self):
        self._page.close()
        self._file.close()
