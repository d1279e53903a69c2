# SPDX-License-Identifier: MIT
"""A person's hands on the pointer and the keys of an X server, and an ear on what clients write to
its root window."""

import threading

from Xlib import X, XK, Xatom, display as xdisplay, error
from Xlib.ext import randr, record, xtest
from Xlib.protocol import event

from .wait import wait_until

CHANGE_PROPERTY = 18
BUTTONS = X.Button1Mask | X.Button2Mask | X.Button3Mask | X.Button4Mask | X.Button5Mask


class Screen:
    def __init__(self, name):
        """`name`: the server's, as in DISPLAY."""
        self.name = name
        self._x = xdisplay.Display(name)
        self.root = self._x.screen().root
        self.width = self._x.screen().width_in_pixels
        self.height = self._x.screen().height_in_pixels
        self._listen()

    # What clients ask of the server, in the server's own order: nothing is missed, nothing is read
    # too late, as it would be by looking at a property after the news that it changed.
    def _listen(self):
        self._changes, self._atoms = [], {}
        # A property of a window of our own counts what the ear has been asked to catch up with.
        self._asked = self._caught_up = 0
        self._own = self.root.create_window(-1, -1, 1, 1, 0, X.CopyFromParent)
        self._ear = xdisplay.Display(self.name)
        self._context = self._x.record_create_context(
            0, [record.AllClients],
            [{"core_requests": (CHANGE_PROPERTY, CHANGE_PROPERTY), "core_replies": (0, 0),
              "ext_requests": (0, 0, 0, 0), "ext_replies": (0, 0, 0, 0), "delivered_events": (0, 0),
              "device_events": (0, 0), "errors": (0, 0), "client_started": False,
              "client_died": False}])
        self._x.sync()
        self._listening = threading.Event()
        self._thread = threading.Thread(target=self._ear_loop, daemon=True)
        self._thread.start()
        assert self._listening.wait(10), "the X server does not record"

    def _ear_loop(self):
        try:
            self._ear.record_enable_context(self._context, self._heard)
        except Exception:  # the server is gone
            pass

    def _heard(self, reply):
        if reply.category == record.StartOfData:
            self._listening.set()
        if reply.category != record.FromClient or reply.client_swapped:
            return
        data = reply.data
        while len(data) >= 24:
            opcode, mode = data[0], data[1]
            length = int.from_bytes(data[2:4], "little") * 4
            if opcode != CHANGE_PROPERTY or length < 24:
                return
            window = int.from_bytes(data[4:8], "little")
            if window == self._own.id:
                self._caught_up = int.from_bytes(data[24:28], "little")
            elif window == self.root.id:
                self._changes.append((
                    int.from_bytes(data[8:12], "little"), int.from_bytes(data[12:16], "little"),
                    data[16], mode,
                    bytes(data[24:24 + int.from_bytes(data[20:24], "little") * data[16] // 8])))
            data = data[length:]

    def root_changes(self):
        """(name, type, format, mode, value) of every change of a root window property that the
        server has been asked for so far, in order."""
        self._asked += 1
        self._own.change_property(Xatom.INTEGER, Xatom.INTEGER, 32, [self._asked])
        self._x.sync()
        wait_until(lambda: self._caught_up == self._asked, "the ear to hear what was said")
        changes = list(self._changes)
        for change in changes:
            if change[0] not in self._atoms:
                self._atoms[change[0]] = self._x.get_atom_name(change[0])
        return [(self._atoms[change[0]],) + change[1:] for change in changes]

    def root_property(self, name):
        value = self.root.get_full_property(self._x.intern_atom(name), X.AnyPropertyType)
        return value and (value.value if isinstance(value.value, bytes)
                          else bytes(value.value))

    def stacking(self):
        """Titles of the window manager's windows, the lowest first."""
        windows = self.root.get_full_property(
            self._x.intern_atom("_NET_CLIENT_LIST_STACKING"), X.AnyPropertyType).value
        return [self._x.create_resource_object("window", one).get_wm_name() for one in windows]

    def wait_window_manager(self):
        """Until it has started, and has done what it was asked for meanwhile."""
        for name in ("_NET_SUPPORTING_WM_CHECK", "_NET_SUPPORTED"):
            atom = self._x.intern_atom(name)
            wait_until(lambda atom=atom: self.root.get_full_property(atom, X.AnyPropertyType),
                       "the window manager did not start")
        self.wait_window_manager_done()

    def wait_window_manager_done(self):
        """Until it has done what it was asked for before: it reads its events in order and answers
        a request for the frame of a window (Extended Window Manager Hints). Nothing where none
        runs, or one that knows no such request."""
        request = self._x.intern_atom("_NET_REQUEST_FRAME_EXTENTS")
        known = self.root.get_full_property(self._x.intern_atom("_NET_SUPPORTED"), Xatom.ATOM)
        if known is None or request not in known.value:
            return
        window = self.root.create_window(-1, -1, 1, 1, 0, X.CopyFromParent)
        frame = self._x.intern_atom("_NET_FRAME_EXTENTS")

        def tell(window, message):
            self.root.send_event(event.ClientMessage(
                window=window, client_type=message, data=(32, [0] * 5)),
                X.SubstructureNotifyMask | X.SubstructureRedirectMask)

        def answered():
            # Openbox leaves what comes while it starts until the next event: one that it ignores.
            tell(self.root, frame)
            return window.get_full_property(frame, X.AnyPropertyType)

        tell(window, request)
        wait_until(answered, "an answer of the window manager")
        window.destroy()

    def turn(self, width, height):
        """Gives the screen another size while everything runs; no larger than it was at first."""
        resources = self.root.xrandr_get_screen_resources()
        crtc, output = resources.crtcs[0], resources.outputs[0]
        mode = next((one.id for one in resources.modes
                     if (one.width, one.height) == (width, height)), None)
        if mode is None:
            name = f"{width}x{height}"
            mode = self.root.xrandr_create_mode(
                (0, width, height, 0, 0, 0, 0, 0, 0, 0, 0, len(name), 0), name).mode
            self._x.xrandr_add_output_mode(output, mode)

        def show(mode, outputs):
            time = self.root.xrandr_get_screen_resources().config_timestamp
            self._x.xrandr_set_crtc_config(crtc, time, 0, 0, mode, randr.Rotate_0, outputs)

        show(0, [])
        self.root.xrandr_set_screen_size(width, height, width * 254 // 960, height * 254 // 960)
        show(mode, [output])
        self._x.sync()
        self.width, self.height = width, height

    def set_dpi(self, dpi):
        """Dots an inch, by which programs that start from now on choose the size of their type."""
        self.root.change_property(Xatom.RESOURCE_MANAGER, Xatom.STRING, 8,
                                  f"Xft.dpi: {dpi}\n".encode())
        self._x.sync()

    def panel(self, height):
        """A bar along the lower edge that the window manager keeps free of windows."""
        bar = self.root.create_window(0, self.height - height, self.width, height, 0,
                                      X.CopyFromParent)
        bar.change_property(self._x.intern_atom("_NET_WM_WINDOW_TYPE"), Xatom.ATOM, 32,
                            [self._x.intern_atom("_NET_WM_WINDOW_TYPE_DOCK")])
        bar.change_property(self._x.intern_atom("_NET_WM_STRUT"), Xatom.CARDINAL, 32,
                            [0, 0, 0, height])
        bar.map()
        self._x.sync()
        wait_until(lambda: self.work_area()[3] <= self.height - height, "the panel's place")
        return bar

    def set_work_area(self, *area):
        """What a window manager says that windows may cover: x, y, width, height."""
        self.root.change_property(self._x.intern_atom("_NET_WORKAREA"), Xatom.CARDINAL, 32,
                                  list(area) * 4)
        self._x.sync()

    def work_area(self):
        """[x, y, width, height] of what windows may cover."""
        area = self.root.get_full_property(self._x.intern_atom("_NET_WORKAREA"),
                                           X.AnyPropertyType)
        return list(area.value[:4]) if area else [0, 0, self.width, self.height]

    # Pointer and keys.
    def _let_go(self):
        """Until the last press has been passed on. A window manager may hold it back while it
        brings the window to the front; it then takes place where the pointer is by that time, and
        keys overtake it."""
        wait_until(lambda: not self.root.query_pointer().mask & BUTTONS,
                   "the last press to be passed on")

    def move(self, x, y):
        self._let_go()
        xtest.fake_input(self._x, X.MotionNotify, x=int(x), y=int(y))
        self._x.sync()

    def click(self, x, y, button=1, count=1):
        self.move(x, y)
        for _ in range(count):
            xtest.fake_input(self._x, X.ButtonPress, button)
            xtest.fake_input(self._x, X.ButtonRelease, button)
        self._x.sync()

    def _code(self, keysym):
        for code, level in self._x.keysym_to_keycodes(keysym):
            if level in (0, 1):
                return code, level == 1
        raise AssertionError(f"no key gives keysym {keysym:#x}")

    def key(self, combination):
        """One key, with modifiers before it: "Return", "shift+Tab", "ctrl+a"."""
        names = {"ctrl": "Control_L", "alt": "Alt_L", "shift": "Shift_L"}
        parts = [names.get(part, part) for part in combination.split("+")]
        codes = [self._code(XK.string_to_keysym(part))[0] for part in parts]
        self._let_go()
        for code in codes:
            xtest.fake_input(self._x, X.KeyPress, code)
        for code in reversed(codes):
            xtest.fake_input(self._x, X.KeyRelease, code)
        self._x.sync()

    def type(self, text):
        """Types a text; what has no key of its own goes by its number, as GTK+ takes it."""
        shift = self._code(XK.XK_Shift_L)[0]
        self._let_go()
        for character in text:
            if not " " <= character <= "~":
                self.key("ctrl+shift+u")
                self.type(f"{ord(character):x} ")
                continue
            code, shifted = self._code(ord(character))
            if shifted:
                xtest.fake_input(self._x, X.KeyPress, shift)
            xtest.fake_input(self._x, X.KeyPress, code)
            xtest.fake_input(self._x, X.KeyRelease, code)
            if shifted:
                xtest.fake_input(self._x, X.KeyRelease, shift)
        self._x.sync()

    def close_window(self, title):
        """What a press on the title bar's close button asks of the window."""
        window = wait_until(lambda: self._window(self.root, title), f"a window {title!r}")
        message = event.ClientMessage(
            window=window, client_type=self._x.intern_atom("WM_PROTOCOLS"),
            data=(32, [self._x.intern_atom("WM_DELETE_WINDOW"), X.CurrentTime, 0, 0, 0]))
        window.send_event(message)
        self._x.sync()

    def resize_window(self, title, **size):
        """Asks for another `width` or `height` of a window."""
        window = wait_until(lambda: self._window(self.root, title), f"a window {title!r}")
        window.configure(**size)
        self._x.sync()

    def window_size(self, title):
        """Its width and height, as the words of a command."""
        geometry = wait_until(lambda: self._window(self.root, title),
                              f"a window {title!r}").get_geometry()
        return f"{geometry.width} {geometry.height}"

    def _window(self, window, title):
        """The window with that title which the window manager has taken in."""
        try:
            for child in window.query_tree().children:
                if child.get_wm_name() == title and child.get_wm_state() is not None:
                    return child
                found = self._window(child, title)
                if found is not None:
                    return found
        except error.BadWindow:  # it went while we looked
            pass
        return None
