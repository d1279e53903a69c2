"""The program's window as a person has it: eyes that look at its widgets from outside (the probe of
tests/device, a GTK+ module that answers questions on a socket and changes nothing), and hands on
the pointer and the keys."""

import json
import os
import re
import socket
import subprocess
import time

from air import LOGS, run, start, until

SOCKET = "/tmp/probe"
IDLE = "Wireless network selection"

_program = None
_answers = None
_seen = 0


def begin():
    """Start the program and the watch on the desktop's notices. Return when its window shows."""
    global _program, _answers, _seen
    if not hasattr(begin, "watch"):
        # xprop follows only what is there.
        run("xprop", "-root", "-f", "_NET_WIFI_CHANGE_STATUS", "8s", "-set",
            "_NET_WIFI_CHANGE_STATUS", "none")
        begin.watch = start("xprop", "-root", "-spy", "_NET_WIFI_CHANGE_STATUS", log="notices.log")
        until(lambda: os.path.getsize(f"{LOGS}/notices.log"), "xprop watches the root window")
    _seen = os.path.getsize(f"{LOGS}/notices.log")
    if os.path.exists(SOCKET):
        os.unlink(SOCKET)
    environment = dict(os.environ, GTK_MODULES="/lab/probe.so", PROBE_SOCKET=SOCKET,
                       ASAN_OPTIONS="detect_leaks=0", UBSAN_OPTIONS="print_stacktrace=1")
    _program = start("/lab/wireless-lan", log="program.log", env=environment)
    until(lambda: os.path.exists(SOCKET) or not alive(), "the program answers", 60)
    connection = socket.socket(socket.AF_UNIX)
    connection.settimeout(120)
    until(lambda: connection.connect_ex(SOCKET) == 0, "the program answers", 60)
    _answers = connection, connection.makefile("rb")
    until(main, "the main window", 60)


def end():
    """Close the main window as its title bar does; return the exit status."""
    number = run("xdotool", "search", "--limit", "1", "--name", "^Wireless LAN$").split()[-1]
    run("xdotool", "windowactivate", "--sync", number)
    run("xdotool", "key", "alt+F4")
    try:
        return _program.wait(20)
    except subprocess.TimeoutExpired:
        _program.kill()
        raise


def alive():
    return _program.poll() is None


def ask(question):
    """One question to the probe, see tests/device/harness/probe.c."""
    connection, stream = _answers
    connection.sendall(question.encode() + b"\n")
    answer = stream.readline()
    if not answer:
        raise RuntimeError(f"the program ended with {_program.wait(20)}")
    return json.loads(answer)


def text_of(raw):
    """The probe gives a text's bytes as U+0000 to U+00FF."""
    return raw.encode("latin-1").decode(errors="replace") if raw is not None else None


def walk(thing):
    """Every shown widget below THING and THING itself."""
    yield thing
    for child in thing["children"]:
        if child["visible"]:
            yield from walk(child)


def windows():
    return [one for one in ask("tree") if one["visible"] and one["mapped"]
            and one["type"] != "GtkTooltip"]


def main():
    return next((one for one in windows() if text_of(one.get("title")) == "Wireless LAN"), None)


def texts(where):
    """What all shown labels below WHERE say."""
    return [text_of(one["text"]) for one in walk(where) if one["type"] == "GtkLabel"
            or one["type"] == "GtkAccelLabel"]


def find(where, kind=None, name=None, label=None, nth=0):
    """The NTH widget below WHERE of a type, name or label (a stock button's is its stock id)."""
    for one in walk(where):
        if (kind is None or one["type"] == kind) and (name is None or one["name"] == name) \
                and (label is None or text_of(one.get("label")) == label):
            if not nth:
                return one
            nth -= 1
    return None


def widget(name):
    """A widget of the main window by its name."""
    return find(main(), name=name)


def dialog(text, limit=60):
    """Wait for a window whose title is TEXT or that has a label which begins with it."""
    def there():
        for one in windows():
            if one.get("title") != "Wireless LAN" and (
                    text_of(one.get("title")) == text
                    or any(line.startswith(text) for line in texts(one))):
                return one
        return None
    return until(there, f"a window that says {text!r}", limit)


def again(thing):
    """The same widget as it is now, or None once it is gone."""
    for window in windows():
        for one in walk(window):
            if one["id"] == thing["id"]:
                return one
    return None


def gone(window):
    until(lambda: not again(window), "the window closes")


def click(x, y, times=1):
    run("xdotool", "mousemove", str(x), str(y), "click", "--repeat", str(times), "--delay", "60",
        "1")


def settled(thing):
    """Wait until a widget is usable and stands still; return it."""
    def still():
        first = again(thing)
        return first and first["usable"] and first["mapped"] and \
            (second := again(thing)) and second["rect"] == first["rect"] and second
    return until(still, f"{thing['name']} {thing.get('label')} can be pressed", 120)


def press(thing):
    """Press the first pointer button over the middle of a widget, once it answers to a press."""
    x, y, width, height = settled(thing)["rect"]
    click(x + width // 2, y + height // 2)


def press_in(window, label):
    """Press a button of a dialog by its label."""
    press(until(lambda: find(again(window) or window, label=label), f"a button {label!r}"))


def fill(entry, text):
    """Type a text in place of what an entry holds."""
    press(entry)
    until(lambda: (again(entry) or {}).get("focus"), "the entry has the focus", 20)
    run("xdotool", "key", "ctrl+a", "key", "BackSpace", "type", "--delay", "20", text)
    until(lambda: text_of(again(entry)["text"]) == text,
          lambda: f"the entry holds {text!r}, it has {text_of(again(entry)['text'])!r}", 20)


def choose(combo, index):
    """Choose an item of a combo box from its menu, with the keys."""
    press(combo)
    until(lambda: any(one["type"] == "GtkMenu" for window in windows() for one in walk(window)),
          "the menu shows", 20)
    steps = index - combo["active"]
    for _ in range(abs(steps)):
        run("xdotool", "key", "Down" if steps > 0 else "Up")
    run("xdotool", "key", "Return")
    until(lambda: again(combo)["active"] == index, "the choice is taken", 20)


def rows():
    """The rows of the network list, five texts each."""
    return [[text_of(text) for text in row["texts"]]
            for row in ask(f"rows {widget('view-press')['id']}")]


def title():
    """The line of text above the list."""
    return text_of(widget("title-label")["text"])


def idle():
    """Wait until no search and no connect runs; a search that found nothing says so."""
    def is_idle():
        top = main()
        for one in windows():
            if "No Network" in texts(one):
                press_in(one, "gtk-close")
                gone(one)
        return top and find(top, name="button-refresh")["usable"] and \
            text_of(find(top, name="title-label")["text"]) == IDLE
    until(is_idle, "the window is idle", 120)


def searches():
    """How many searches the desktop has been told of."""
    with open(f"{LOGS}/notices.log") as file:
        return file.read().count('= "5"')


def refresh():
    # A search blocks the window: to look at it meanwhile may be to see it afterwards.
    before = searches()
    press(widget("button-refresh"))
    until(lambda: searches() > before, "the search begins")
    idle()


def refresh_until(wanted, what, limit=120):
    """One scan may miss a network: refresh until WANTED(rows) holds; return the rows."""
    latest = time.monotonic() + limit
    while True:
        now = rows()
        if wanted(now):
            return now
        if time.monotonic() > latest:
            raise TimeoutError(f"{what}; the list has {now}")
        refresh()


def select(row, times=1):
    """Press on a row of the list, twice for a double click."""
    x, y, width, height = ask(f"cell {widget('view-press')['id']} {row} 0")
    click(x + min(width // 2, 20), y + height // 2, times)


def select_surely(row):
    """Press on a row until it is selected: a press while the rows are written anew finds none."""
    def selected():
        select(row)
        time.sleep(0.3)
        return ask(f"rows {widget('view-press')['id']}")[row]["selected"]
    until(selected, f"row {row} is selected", 20)


def notices():
    """The desktop's notices since the last call, in order."""
    global _seen
    with open(f"{LOGS}/notices.log") as file:
        file.seek(_seen)
        new = file.read()
    new = new[:new.rfind("\n") + 1]
    _seen += len(new)
    return re.findall(r'_NET_WIFI_CHANGE_STATUS\(STRING\) = "(\d+)"', new)


def photograph(name):
    """Keep what the screen shows once it stands still; tests/lab/run makes a picture of it."""
    path = f"{LOGS}/{name}.xwd"
    before = None
    for _ in range(20):
        with open("/tmp/screen/Xvfb_screen0", "rb") as file:
            now = file.read()
        if now == before:
            break
        before = now
        time.sleep(0.5)
    with open(path, "wb") as file:
        file.write(now)
