"""The program's window as a person has it: eyes through AT-SPI, hands through the pointer."""

import os
import re
import shutil
import signal
import subprocess
import time

import gi

gi.require_version("Atspi", "2.0")
from gi.repository import Atspi, GLib  # noqa: E402

from air import LOGS, run, start, until  # noqa: E402

Role = Atspi.Role
ACTIVE = "button-active-device"

# A scan blocks the program for seconds; what asks it meanwhile has to wait for the answer.
Atspi.set_timeout(90000, 90000)

_program = None
_notices = None


def begin():
    """Start the program and the watch on the desktop's notices. Return when its window shows."""
    global _program, _notices
    path = f"{LOGS}/notices.log"
    _notices = [path, os.path.getsize(path) if os.path.exists(path) else 0]
    if not hasattr(begin, "watch"):
        begin.watch = start("xprop", "-root", "-spy", "_NET_WIFI_CHANGE_STATUS",
                            "_NET_WIFI_STOP_CHECK", log="notices.log")
        # Both properties are named once, set or not, before changes are followed.
        until(lambda: open(path).read().count("\n") >= 2, "xprop watches the root window")
        _notices[1] = os.path.getsize(path)
    _program = start("/lab/wireless-lan", log="program.log")
    until(main, "the main window", 120)
    return _program


def end():
    """End the program by the close button's request and say whether it ended with status 0."""
    run("xdotool", "search", "--limit", "1", "--name", "^Wireless LAN$", "windowclose")
    try:
        return _program.wait(20)
    except subprocess.TimeoutExpired:
        _program.kill()
        raise


def alive():
    return _program.poll() is None


def quiet(call, *args):
    """The value of an AT-SPI call, or None for an object that has gone meanwhile."""
    try:
        return call(*args)
    except GLib.Error:
        return None


def children(thing):
    count = quiet(thing.get_child_count) or 0
    return [child for child in (quiet(thing.get_child_at_index, i) for i in range(count)) if child]


def application():
    for one in children(Atspi.get_desktop(0)):
        if quiet(one.get_process_id) == _program.pid:
            # Nothing is remembered on this side: what is asked is what is there.
            one.set_cache_mask(Atspi.Cache.NONE)
            return one
    return None


def showing(thing):
    states = quiet(thing.get_state_set)
    return bool(states) and states.contains(Atspi.StateType.SHOWING)


def enabled(thing):
    states = quiet(thing.get_state_set)
    return bool(states) and states.contains(Atspi.StateType.SENSITIVE)


def checked(thing):
    return thing.get_state_set().contains(Atspi.StateType.CHECKED)


def windows():
    one = application()
    return [window for window in (children(one) if one else []) if showing(window)]


def main():
    for window in windows():
        if window.get_name() == "Wireless LAN":
            return window
    return None


def walk(thing):
    """Every showing object below THING, cells of tables left out."""
    for child in children(thing):
        if not showing(child):
            continue
        yield child
        if child.get_role() != Role.TABLE:
            yield from walk(child)


def find(where, role, name=None, nth=0):
    for thing in walk(where):
        if thing.get_role() == role and (name is None or thing.get_name() == name):
            if not nth:
                return thing
            nth -= 1
    return None


def texts(where):
    """The texts of all labels below WHERE."""
    return [one.get_name() for one in walk(where) if one.get_role() == Role.LABEL]


def dialog(text, limit=60):
    """Wait for a window whose title or one of whose labels is, or begins with, TEXT."""
    def there():
        for window in windows():
            if window.get_name() == text or any(t.startswith(text) for t in texts(window)):
                if window.get_name() != "Wireless LAN":
                    return window
        return None
    return until(there, f"a window that says {text!r}", limit)


def gone(window):
    until(lambda: not showing(window), "the window closes")


def middle(thing):
    box = thing.get_extents(Atspi.CoordType.SCREEN)
    return box.x + box.width // 2, box.y + box.height // 2


def press(thing, times=1):
    """Press the first pointer button over the middle of THING, once it answers to a press."""
    until(lambda: enabled(thing), f"{thing.get_name()!r} is sensitive", 120)
    x, y = middle(thing)
    run("xdotool", "mousemove", str(x), str(y), "click", "--repeat", str(times), "--delay", "60",
        "1")


def button(name, where=None):
    """A push button by its text; stock buttons have theirs without the underscore."""
    where = where or main()
    return until(lambda: find(where, Role.PUSH_BUTTON, name), f"a button {name!r}")


def fill(entry, text):
    entry.set_text_contents(text)


def choose(combo, index):
    combo.select_child(index)


def table():
    return find(main(), Role.TABLE)


def rows():
    """The rows of the network list, five texts each."""
    grid = table()
    count = grid.get_n_rows()
    return [[grid.get_accessible_at(row, column).get_name() for column in range(5)]
            for row in range(count)]


def names():
    grid = table()
    return [grid.get_accessible_at(row, 0).get_name() for row in range(grid.get_n_rows())]


def state_of(row):
    return table().get_accessible_at(row, 4).get_name()


def title():
    """The line of text above the list."""
    for text in texts(main()):
        if text not in ("Settings",):
            return text
    return None


def idle():
    """Wait until no search and no connect runs."""
    refresh = button("Refresh")
    until(lambda: enabled(refresh) and title() == "Wireless network selection",
          "the window is idle", 120)


def refresh():
    press(button("Refresh"))
    time.sleep(0.3)  # the search begins 100 ms after the press and blocks the window
    idle()


def refresh_until(wanted, what, limit=120):
    """One scan may miss a network: refresh until WANTED(rows) holds; return the rows."""
    end_of_wait = time.monotonic() + limit
    while True:
        now = rows()
        if wanted(now):
            return now
        if time.monotonic() > end_of_wait:
            raise TimeoutError(f"{what}; the list has {now}")
        refresh()


def select(row, times=1):
    """Press on a row of the list, twice for a double click."""
    cell = table().get_accessible_at(row, 0)
    x, y = middle(cell)
    box = cell.get_extents(Atspi.CoordType.SCREEN)
    x = box.x + min(box.width // 2, 30)
    run("xdotool", "mousemove", str(x), str(y), "click", "--repeat", str(times), "--delay", "60",
        "1")


def notices():
    """The desktop's notices since the last call, in order."""
    path, seen = _notices
    with open(path) as file:
        file.seek(seen)
        new = file.read()
    new = new[:new.rfind("\n") + 1]
    _notices[1] = seen + len(new)
    return re.findall(r'_NET_WIFI_CHANGE_STATUS\(STRING\) = "(\d+)"', new)


def photograph(name):
    """Keep what the screen shows; tests/lab/run makes a picture of it."""
    shutil.copy("/tmp/screen/Xvfb_screen0", f"{LOGS}/{name}.xwd")
