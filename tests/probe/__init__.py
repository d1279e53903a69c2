# SPDX-License-Identifier: MIT
"""Eyes and hands on the program's windows, for every test that drives the real program: `Program`
is a running one with its main window, `Screen` the X server's pointer and keys."""

from .program import Program
from .screen import Screen
from .wait import LIMIT, wait_until

__all__ = ["LIMIT", "Program", "Screen", "wait_until"]
