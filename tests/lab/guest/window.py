# SPDX-License-Identifier: MIT
"""The program's window as a person in the lab has it: the eyes and hands of tests/probe, and what
is waited for where the networks are real."""

import os
import time

from air import LOGS, start
from probe import Program, Screen, wait_until
from probe.program import IDLE

SOCKET = "/tmp/probe"
LIST = "view-press"
STATUS = "_NET_WIFI_CHANGE_STATUS"

screen = None
app = None  # the running program, and its main window
_told = 0  # how many of the desktop's notices have been looked at


def begin(more=None):
    """Starts the program, with MORE in its environment; returns when its window shows."""
    global screen, app
    screen = screen or Screen(os.environ["DISPLAY"])
    environment = {**os.environ, "GTK_MODULES": "/lab/probe.so", "PROBE_SOCKET": SOCKET,
                   "ASAN_OPTIONS": "detect_leaks=0:verify_asan_link_order=0",
                   "UBSAN_OPTIONS": "print_stacktrace=1", **(more or {})}
    notices()
    app = Program(start("/lab/wireless-lan", log="program.log", env=environment), SOCKET, screen)
    app.wait(120)


def rows():
    """The rows of the network list, five texts each."""
    return app.networks()


def connected_row(net):
    """The row that shows an address of subnet NET, or None."""
    prefix = f"Connected\nIP Address:10.9.{net}."
    return next((number for number, row in enumerate(rows()) if row[4].startswith(prefix)), None)


def title():
    """The line of text above the list."""
    return app.text("title-label")


def _states():
    return [value.decode() for name, _, _, _, value in screen.root_changes() if name == STATUS]


def notices():
    """The states that the desktop was told of since the last call, in order."""
    global _told
    states = _states()
    new = states[_told:]
    _told = len(states)
    return new


def idle(limit=120):
    """Waits until no search and no connect runs; a search that found nothing says so."""
    def is_idle():
        if any("No Network" in texts for _, texts in app.dialogs()):
            app.dialog(text="No Network").press("gtk-close")
        window = app.now()
        return window and window.find("button-refresh")["usable"] and \
            window.find("title-label")["text"] == IDLE
    wait_until(is_idle, lambda: f"the window to be idle\n{app.sketch()}", limit)


def refresh():
    # A search blocks the window: to look at it meanwhile may be to see it afterwards.
    before = _states().count("5")
    app.press("button-refresh")
    wait_until(lambda: _states().count("5") > before, "the search to begin")
    idle()


def refresh_until(wanted, what, limit=120):
    """One scan may miss a network: refreshes until WANTED(rows) holds; returns the rows."""
    latest = time.monotonic() + limit
    while True:
        now = rows()
        if wanted(now):
            return now
        assert time.monotonic() < latest, f"{what}; the list has {now}"
        refresh()


def select(row):
    """Presses on a row until it is selected: a press while the rows are written anew finds none.
    The presses are too far apart to be a double click."""
    def selected():
        app.click_row(LIST, row)
        try:
            return wait_until(lambda: app.selected(LIST) == [row], limit=2)
        except AssertionError:
            return False
    wait_until(selected, f"row {row} to be selected")


def photograph(name):
    """Keeps what the screen shows once it is at rest; tests/lab/run makes a picture of it."""
    last = None
    for _ in range(20):
        with open("/tmp/screen/Xvfb_screen0", "rb") as file:
            now = file.read()
        if now == last:
            break
        last = now
        time.sleep(0.5)
    with open(f"{LOGS}/{name}.xwd", "wb") as file:
        file.write(now)
