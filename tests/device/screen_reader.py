# SPDX-License-Identifier: MIT
"""The ears of assistive technology: a bus of its own (AT-SPI) on the screen of a device, and on it
what a screen reader asks. Nothing is found by its widget, its place or a pointer."""

import contextlib
import os
import subprocess

import gi

from probe import wait_until

gi.require_version("Atspi", "2.0")
from gi.repository import Atspi, GLib  # pylint: disable=wrong-import-position

LAUNCHER = "/usr/libexec/at-spi-bus-launcher"
# What holds controls and does nothing itself; the content of a list is the user's.
CONTAINERS = ("split pane", "scroll pane", "table cell")
ANNOUNCEMENTS = ("object:text-changed:insert", "object:property-change:accessible-name")


def wait_heard(condition, what):
    """Waits for an answer of the program; what is asked about may go while it is asked."""
    def asked():
        with contextlib.suppress(GLib.Error):
            return condition()
        return None
    return wait_until(asked, what)


def called(one):
    """Its name; None where there is nothing any more."""
    return one and one.get_name()


def spoken(one):
    """What a screen reader calls a control: its label, else its name."""
    labels = [called(relation.get_target(0)) or "" for relation in one.get_relation_set()
              if relation.get_relation_type() == Atspi.RelationType.LABELLED_BY]
    return " ".join(labels + [one.get_name()] * (not labels)).strip()


def role(one):
    """What it is, None once it has gone."""
    with contextlib.suppress(GLib.Error):
        name = one.get_role_name()
        # As at-spi2-core 2.56 and later say it.
        return "push button" if name == "button" else name
    return None


def children(one):
    found = (one.get_child_at_index(index) for index in range(one.get_child_count()))
    return [child for child in found if child is not None]


def walk(one):
    """It and all below it that can be seen."""
    yield one
    for child in children(one):
        if child.get_state_set().contains(Atspi.StateType.SHOWING):
            yield from walk(child)


def row(table, number):
    """The texts of a row of a list."""
    grid = table.get_table_iface()
    return [called(grid.get_accessible_at(number, column))
            for column in range(grid.get_n_columns())]


def selected(table):
    """The texts of the selected rows."""
    return [row(table, number) for number in table.get_table_iface().get_selected_rows()]


def value(combo):
    """The item that a combo box shows."""
    return called(combo.get_selection_iface().get_selected_child(0))


class Reader:
    """One for a test process: its AT-SPI client knows one bus."""

    def __init__(self, device):
        """`device`: its `display`, and its directory `state`, where the probe is."""
        self.device = device
        self.heard = []
        self._processes = []
        bus = f"unix:path={device.state}/session"
        # Without a directory of sockets that both sides see all goes over the bus.
        self.environment = {"DBUS_SESSION_BUS_ADDRESS": bus,
                            "GTK_MODULES": f"{device.state}/probe.so:gail:atk-bridge",
                            "NO_AT_BRIDGE": "0"}
        self._run("dbus-daemon", "--session", "--nofork", "--nopidfile", f"--address={bus}")
        wait_until(lambda: os.path.exists(f"{device.state}/session"), "the session's bus")
        self._run(LAUNCHER, "--launch-immediately")
        # The program looks there for it too.
        address = wait_until(lambda: device.display.root_property("AT_SPI_BUS"),
                             "the address of the accessibility bus")
        os.environ["AT_SPI_BUS_ADDRESS"] = address.decode()
        os.environ["DBUS_SESSION_BUS_ADDRESS"] = bus
        Atspi.init()
        self._desktop = Atspi.get_desktop(0)
        self._desktop.set_cache_mask(Atspi.Cache.NONE)
        self._listener = Atspi.EventListener.new(self._hear)
        for event in ANNOUNCEMENTS:
            self._listener.register(event)

    def _run(self, *command):
        self._processes.append(subprocess.Popen(
            ["setpriv", "--pdeathsig", "TERM", *command], stdin=subprocess.DEVNULL,
            stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL,
            env={**os.environ, **self.environment, "DISPLAY": self.device.display.name,
                 "XDG_RUNTIME_DIR": self.device.state}))

    def close(self):
        for event in ANNOUNCEMENTS:
            self._listener.deregister(event)
        for process in reversed(self._processes):
            process.terminate()
            process.wait()

    def _hear(self, event):
        # Nothing is asked from here: the call that let the event in still waits for its answer.
        kind = next(one for one in ANNOUNCEMENTS if event.type.startswith(one))
        self.heard.append((kind, event.source, event.any_data))

    def announced(self, *texts):
        """Waits until the status bar has announced these texts, each once in each way."""
        def heard():
            while GLib.MainContext.default().iteration(False):
                pass
            return [[text for kind, source, text in self.heard if kind == one and
                     role(source) == "status bar"] for one in ANNOUNCEMENTS]
        wait_heard(lambda: all(len(one) >= len(texts) for one in heard()),
                   lambda: f"{texts} to be announced; heard was {self.heard}")
        assert heard() == [list(texts)] * len(ANNOUNCEMENTS)
        self.heard.clear()

    # What there is.
    def windows(self):
        return [window for program in children(self._desktop) for window in children(program)
                if window.get_state_set().contains(Atspi.StateType.SHOWING)]

    def find(self, window, name, kind):
        """The control of that name in a window."""
        return wait_heard(lambda: next((one for one in walk(window) if role(one) == kind and
                                        spoken(one) == name), None), lambda: f"{kind} {name!r}")

    def window(self, name):
        """The window of that name, once it has the keyboard."""
        def there():
            return next((one for one in self.windows() if one.get_name() == name and
                         one.get_state_set().contains(Atspi.StateType.ACTIVE)), None)
        return wait_heard(there, lambda: f"the window {name!r} to be active; there are "
                          f"{[one.get_name() for one in self.windows()]}")

    def wait_gone(self, name):
        wait_heard(lambda: name not in [one.get_name() for one in self.windows()],
                   lambda: f"the window {name!r} to go")

    def nameless(self, window):
        """The controls that could only be called by what they are or hold."""
        found = []
        for one in walk(window):
            if role(one) == "combo box":
                # The toolkit calls one without a name by its item.
                named = spoken(one) not in ("", value(one))
            else:
                named = role(one) in CONTAINERS or spoken(one) or \
                    not one.get_state_set().contains(Atspi.StateType.FOCUSABLE)
            if not named:
                found.append(role(one))
        return found

    # The keyboard.
    def focus(self, window):
        """(name, role) of the control that has the keyboard; a list's cell keeps its own mark."""
        return next(((spoken(one), role(one)) for one in walk(window)
                     if one.get_state_set().contains(Atspi.StateType.FOCUSED) and
                     role(one) != "table cell"), None)

    def go(self, window, name, kind):
        """Presses Tab until a control of that name has the keyboard. Every stop has a name."""
        stops = [wait_heard(lambda: self.focus(window), "a focus")]
        while stops[-1] != (name, kind):
            assert stops[-1] not in stops[:-1], f"{kind} {name!r} is not among {stops}"
            assert stops[-1][0], f"a stop has no name: {stops}"
            self.device.display.key("Tab")
            stops.append(wait_heard(
                lambda: self.focus(window) not in (None, stops[-1]) and self.focus(window),
                lambda: f"the focus to leave {stops[-1]}"))

    def press(self, window, name):
        self.go(window, name, "push button")
        self.device.display.key("space")

    def enter(self, window, name, text, kind="text"):
        """Types a text in place of an entry's own."""
        self.go(window, name, kind)
        self.device.display.key("ctrl+a")
        self.device.display.type(text)
        entry = self.find(window, name, kind)
        wait_heard(lambda: entry.get_character_count() == len(text),
                   lambda: f"{text!r} in the entry {name!r}")
