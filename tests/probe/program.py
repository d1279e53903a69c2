# SPDX-License-Identifier: MIT
"""The running program: what its widgets say (asked of probe.c on a socket), and a person's hands on
them."""

import json
import socket

from .wait import LIMIT, wait_until

IDLE = "Wireless network selection"  # the title while nothing is under way
EDGE = 3  # pixels of a scrolled window's shadow, which takes no press


class Widget(dict):
    """One widget as it was when the tree was read: type, name, text, label, sensitive, usable
    (sensitive with all its parents), visible, mapped, rect, focus, default, active, items ..."""

    parent = None

    def walk(self):
        """This one and all in it, each before what is in it."""
        ahead = [self]
        while ahead:
            one = ahead.pop()
            yield one
            ahead += reversed(one["children"])

    def all(self, name=None, type=None, **wanted):
        """All widgets in this one (itself too) with this name, type and further values."""
        return [one for one in self.walk()
                if (name is None or one["name"] == name) and (type is None or one["type"] == type)
                and all(one.get(key) == value for key, value in wanted.items())]

    def find(self, name=None, type=None, **wanted):
        found = self.all(name, type, **wanted)
        assert len(found) == 1, f"{len(found)} widgets {name or type} {wanted} in {self.sketch()}"
        return found[0]

    def texts(self):
        """Texts of all visible labels, in the order in which they are built."""
        return [one["text"] for one in self.walk() if "text" in one and one["type"] != "GtkEntry"
                and one["visible"]]

    def sketch(self, depth=0):
        line = "  " * depth + f"{self['type']} {self['name']!r}"
        for key in ("title", "label", "text"):
            if self.get(key):
                line += f" {key}={self[key]!r}"
        line += "" if self["visible"] else " hidden"
        line += "" if self["sensitive"] else " insensitive"
        return "\n".join([line] + [child.sketch(depth + 1) for child in self["children"]])


def _widget(node, parent=None):
    widget = Widget(node)
    widget.parent = parent
    widget["children"] = [_widget(child, widget) for child in node["children"]]
    return widget


class Pane:
    """A window of the program: the main one or a dialog. Looks anew at every question."""

    def __init__(self, app, description, choose):
        self.app = app
        self.description = description
        self._choose = choose

    def now(self):
        """The window's widget tree, None when there is no such window on the screen."""
        for window in self.app.windows():
            if window["visible"] and self._choose(window):
                return window
        return None

    def tree(self):
        found = self.now()
        assert found, f"no {self.description} on the screen; there is\n{self.app.sketch()}"
        return found

    def wait(self, limit=LIMIT):
        wait_until(lambda: (self.now() or {}).get("mapped"),
                   lambda: f"{self.description}; on the screen is\n{self.app.sketch()}", limit)
        return self

    def wait_gone(self, limit=LIMIT):
        wait_until(lambda: self.now() is None, f"{self.description} to go", limit)

    def exists(self):
        return self.now() is not None

    @property
    def title(self):
        return self.tree()["title"]

    def find(self, name=None, type=None, **wanted):
        """The one widget with this widget name (and type, and values); fails without one."""
        return self.tree().find(name, type, **wanted)

    def all(self, name=None, type=None, **wanted):
        return self.tree().all(name, type, **wanted)

    def texts(self):
        return self.tree().texts()

    def text(self, name):
        widget = self.find(name)
        return widget["text"] if "text" in widget else widget["label"]

    def label(self, name):
        return self.find(name)["label"]

    def sensitive(self, name):
        return self.find(name)["sensitive"]

    def props(self, widget):
        """All properties of a widget (or of the one with that name): {"properties", "packing",
        "size-request"}; packing is what its container holds for it (attach edges, expand ...)."""
        if isinstance(widget, str):
            widget = self.find(widget)
        return self.app.ask("props " + widget["id"])

    def rows(self, name):
        """Rows of a GtkTreeView or GtkCList by widget name: lists of texts."""
        return [row["texts"] for row in self.app.ask("rows " + self.find(name)["id"])]

    def columns(self, name):
        """Columns of a GtkTreeView: {"title", "width", "renderers": [{"id", "type",
        "foreground"}]}."""
        return self.app.ask("columns " + self.find(name)["id"])

    def selected(self, name):
        """Numbers of its selected rows."""
        rows = self.app.ask("rows " + self.find(name)["id"])
        return [number for number, row in enumerate(rows) if row["selected"]]

    # Hands.
    def _button(self, what):
        buttons = [one for one in self.tree().walk() if one["type"].endswith("Button")]
        return next((one for one in buttons if one["name"] == what),
                    next((one for one in buttons if one.get("label") == what), None))

    def press(self, what, limit=LIMIT):
        """Clicks the button with this name or label ("gtk-ok" is a stock button's label) once it
        can be clicked."""
        self.click(lambda: self._button(what), what, limit=limit)

    def click(self, what, description=None, button=1, count=1, limit=LIMIT, at=(1 / 2, 1 / 2)):
        """Clicks into a widget: its name, its record, or a function that finds it. `at`: how far
        from its left and upper edge, in parts of its width and height."""
        def found():
            if callable(what):
                return what()
            key, value = ("name", what) if isinstance(what, str) else ("id", what["id"])
            return next((one for one in self.tree().walk() if one[key] == value), None)

        def in_place():
            return self._in_place(found, lambda widget: widget["rect"],
                                  f"{description or what} to press", limit)

        widget = in_place()
        if self._scroll_to(found, widget):
            widget = in_place()
        x, y, width, height = widget["rect"]
        self.app.display.click(x + width * at[0], y + height * at[1], button, count)
        return widget

    def _now(self, widget):
        """The record of a widget as it is now."""
        return next(one for one in self.tree().walk() if one["id"] == widget["id"])

    def _scroll_to(self, find, widget):
        """Turns the wheel over the scroll bars around `widget` until the middle of what `find`
        gives, in it, is in sight; gives whether there was anything to do."""
        moved = False
        while widget is not None:
            frame = widget.parent
            if widget["type"] == "GtkViewport" and frame["type"] == "GtkScrolledWindow":
                for axis, bar in enumerate(("GtkHScrollbar", "GtkVScrollbar")):
                    moved |= self._scroll(find, widget, axis, bar)
            widget = frame
        return moved

    def _scroll(self, find, viewport, axis, kind):
        turns = []
        while True:
            rect = find()["rect"]
            middle = rect[axis] + rect[axis + 2] // 2
            viewport = self._now(viewport)
            low, size = viewport["rect"][axis], viewport["rect"][axis + 2]
            if low + EDGE < middle < low + size - EDGE:
                return bool(turns)
            # A step may lead past what is in sight at once.
            turn = 5 if middle > low + EDGE else 4
            assert turns[-4:] != [turn, 9 - turn] * 2, f"{find()['name']} does not come into sight"
            bar, = [one for one in viewport.parent["children"] if one["type"] == kind]
            assert bar["mapped"], f"{find()['name']} is out of sight, with no {kind} to it"
            self._scroll_to(lambda: self._now(bar), bar.parent)
            rect, bar = find()["rect"], self._now(bar)
            x, y, width, height = bar["rect"]
            self.app.display.click(x + width // 2, y + height // 2, turn)
            turns.append(turn)
            wait_until(lambda: find()["rect"] != rect, f"{find()['name']} to come into sight")

    def _in_place(self, find, place, what, limit=LIMIT):
        """The widget, once it can be used, its window is in front, and its place is the same twice
        running: not about to be moved by the window manager. When two dialogs go at once it may
        have left no window active: then the press is what brings this one to the front."""
        last = []
        left_alone = [0]

        def in_front():
            if self.tree().get("active", True):
                return True
            if any(one.get("active") for one in self.app.windows()):
                left_alone[0] = 0
                return False
            if left_alone[0] == 0:
                self.app.display.wait_window_manager_done()
            left_alone[0] += 1
            return left_alone[0] >= 20

        def ready():
            widget = find()
            usable = widget and widget["mapped"] and widget["usable"] and widget["rect"][2] > 1 \
                and in_front()
            now = [place(widget)] if usable else []
            steady = usable and last == now
            last[:] = now
            return widget if steady else None

        return wait_until(ready, lambda: f"{what} in\n{self.app.sketch()}", limit)

    def type(self, name, text, replace=True):
        """Types into an entry, with a click into it when the focus is elsewhere; `replace` takes
        away what it holds."""
        wait_until(lambda: self.tree()["active"], f"{self.description} to be the active window")
        # A click into the entry that has the focus would leave nothing to wait for, and the window
        # manager may hold it back until after the keys.
        if not self.find(name)["focus"]:
            self.click(name)
            wait_until(lambda: self.find(name)["focus"], f"the focus on {name}")
        if replace:
            self.app.display.key("ctrl+a")
            self.app.display.key("Delete")
            wait_until(lambda: self.find(name)["text"] == "", f"{name} to be empty")
            self.app.display.type(text)
            wait_until(lambda: self.find(name)["text"] == text,
                       lambda: f"{name} to hold {text!r}; holds {self.find(name)['text']!r}")
        else:
            self.app.display.type(text)

    def choose(self, name, item):
        """Chooses an item (its text or number) of a combo box in its menu."""
        combo = self.find(name)
        wanted = combo["items"].index(item) if isinstance(item, str) else item
        self.click(name)

        def items():
            menus = [one for one in self.app.windows() if one["mapped"] and one.all(type="GtkMenu")]
            return [one for menu in menus for one in menu.walk()
                    if one["type"].endswith("MenuItem") and one["mapped"]]

        x, y, width, height = wait_until(items, f"the menu of {name}")[wanted]["rect"]
        self.app.display.click(x + width // 2, y + height // 2)
        wait_until(lambda: self.find(name)["active"] == wanted, f"{name} to change")

    def cell(self, name, row, column=0):
        return self.app.ask(f"cell {self.find(name)['id']} {row} {column}")

    def click_row(self, name, row, button=1, count=1, column=0):
        """Clicks into a row of a list, near the left of the column."""
        self._in_place(lambda: self.find(name), lambda widget: self.cell(name, row, column), name)
        self._reach(name, row, column)
        x, y, width, height = self.cell(name, row, column)
        self.app.display.click(x + min(width, 40) // 2, y + height // 2, button, count)

    def _reach(self, name, row, column):
        """Turns the wheel until the row, near its left edge, is in sight."""
        def place():
            x, y, width, height = self.cell(name, row, column)
            return {"name": name, "rect": [x, y, min(width, 40), height]}

        self._scroll_to(place, self.find(name))


class Program(Pane):
    """The program that runs, and its main window: the widgets of the pane are those of it."""

    def __init__(self, process, socket_path, display, window_manager=True):
        """`process`: its Popen; `socket_path`: PROBE_SOCKET of its environment; `display`: the
        Screen that it is on."""
        self.display, self.window_manager = display, window_manager
        self._process, self._path = process, socket_path
        self._socket = None
        super().__init__(self, "main window", self._is_main)

    def _is_main(self, window):
        return any(one["name"] == "view-press" for one in window.walk())

    def said(self):
        """What it printed last, for the message of a failure."""
        return ""

    def _ended(self):
        return f"the program ended ({self._process.poll()}):\n{self.said()}"

    # The probe.
    def ask(self, question):
        if self._socket is None:
            self._connect()
        self._socket.sendall(question.encode() + b"\n")
        answer = self._stream.readline()
        assert answer, self._ended()
        # Stray bytes in a text become surrogates.
        return json.loads(answer.decode("utf-8", "surrogateescape"))

    def _connect(self):
        def attempt():
            connection = socket.socket(socket.AF_UNIX)
            connection.settimeout(120)
            try:
                connection.connect(self._path)
                return connection
            except OSError:
                connection.close()
                assert self._process.poll() is None, self._ended()
                return None

        self._socket = wait_until(attempt, lambda: "the program to answer\n" + self.said(), 60)
        self._stream = self._socket.makefile("rb")

    def windows(self):
        """All top-level windows, shown or not."""
        return [_widget(window) for window in self.ask("tree")]

    def window_count(self):
        """How many top-level windows there are, shown or not. GTK+'s own for tooltips is left out:
        it begins to exist when the pointer first moves over a widget that has one."""
        return len([one for one in self.windows() if one["name"] != "gtk-tooltip"])

    def sketch(self):
        """What is on the screen, to be read."""
        return "\n".join(one.sketch() for one in self.windows() if one["visible"])

    def registry(self, key):
        """{"id", "type", "name"} of what the main window holds under the key, or None."""
        return self.ask("registry " + key)

    def registered_rows(self, key):
        """Rows of a list that is registered under the key, shown or not."""
        rows = self.ask("rows @" + key)
        return rows and [row["texts"] for row in rows]

    # The main window's list.
    def networks(self):
        """The shown rows, five texts each."""
        return self.rows("view-press")

    def wait_title(self, text, limit=LIMIT):
        wait_until(lambda: self.text("title-label") == text,
                   lambda: f"the title {text!r}; it is {self.text('title-label')!r}", limit)

    def wait_listed(self, limit=LIMIT):
        """Until a refresh is over and its rows are there."""
        def listed():
            window = self.tree()
            return window.find("title-label")["text"] == IDLE and \
                window.find("view-press")["sensitive"] and self.networks()
        wait_until(listed, lambda: "networks\n" + self.sketch(), limit)
        return self.networks()

    def wait_state(self, row, text, limit=LIMIT):
        """Until a row's last column shows a text."""
        def state():
            rows = self.networks()
            return rows[row][4] if row < len(rows) else None
        wait_until(lambda: state() == text, lambda: f"state {text!r}; it is {state()!r}", limit)

    # Dialogs.
    def dialog(self, title=None, text=None, limit=LIMIT):
        """The dialog with this title, or with a label that has this text, once it is shown."""
        def choose(window):
            return not self._is_main(window) and window["type"] != "GtkTooltip" and \
                (title is None or window["title"] == title) and \
                (text is None or any(one.get("text") == text for one in window.walk()
                                     if one["visible"]))
        pane = Pane(self, f"dialog {title or text!r}", choose).wait(limit)

        def in_front():
            # It may have gone again.
            window = pane.now()
            return window is None or window["active"] or \
                self.props(window)["properties"]["type"] == "popup"

        if self.window_manager:  # and in front, with the keys
            wait_until(in_front, lambda: f"the focus of {pane.description}\n{self.sketch()}", limit)
        return pane

    def window(self, identity):
        """The window with that id in its record."""
        return Pane(self, f"window {identity}", lambda window: window["id"] == identity)

    def dialogs(self):
        """Titles and texts of all shown windows but the main one."""
        return [(one["title"], one.texts()) for one in self.windows()
                if one["visible"] and not self._is_main(one)]

    # Keys go where the focus is.
    def key(self, combination):
        if self.window_manager:
            wait_until(lambda: any(one["active"] for one in self.windows() if "active" in one),
                       lambda: f"a window for {combination}\n{self.sketch()}")
        self.display.key(combination)

    # Its end.
    def running(self):
        return self._process.poll() is None

    def wait_end(self, limit=LIMIT):
        wait_until(lambda: self._process.poll() is not None, "the program to end", limit)
        return self._process.returncode

    def quit(self, limit=60):
        """Closes the main window as its title bar does, once the last dialog has gone (the window
        takes no notice before); gives the exit status."""
        wait_until(lambda: not any(one["visible"] and one["type"].endswith("Dialog")
                                   for one in self.windows()), "the dialogs to go", limit)
        title = self.tree()["title"]
        self.disconnect()
        self.display.close_window(title)
        return self.wait_end(limit)

    def disconnect(self):
        """Leaves the probe; the next question connects again."""
        if self._socket is not None:
            self._stream.close()
            self._socket.close()
            self._socket = None
