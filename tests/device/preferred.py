# SPDX-License-Identifier: MIT
"""Preferred networks in the tests: the layout of their file, written without the program, and
the way to their dialogs."""

from typing import NamedTuple

from harness import wait_until
from support.grammar import to_bytes

FILE = "/etc/wireless-user.conf"
FRONT = "user_cell_list_front"
BACKEND = "user_cell_list_backend"
LIST = "Preferred Network Setting"
ADD = "Add WiFi Network"
PROPERTIES = "Properties"
DELETE = "Delete Network"
NO_ESSID = "Please enter the ESSID."
NO_KEY = "Please enter the Key."


class Network(NamedTuple):
    essid: str
    alias: str = ""
    mode: str = "Managed"
    wpa: int = 0
    index: int = 0
    enc: str = "off"
    key: str = "off"

    def row(self):
        """The row of the hidden list."""
        return [self.alias, self.essid, self.mode, "ENC_" + self.enc.upper(), self.key,
                str(self.wpa), str(self.index)]

    def shown(self):
        return self.alias or self.essid


def file_of(*networks):
    """The file of these networks (bytes)."""
    text = b""
    for number, one in enumerate(networks):
        values = {"USERCELL": number, "ALIAS": one.alias, "ESSID": one.essid, "MODE": one.mode,
                  "KMGMT": one.wpa, "KINDEX": one.index, "Encryption": one.enc,
                  "KEY": "off" if one.enc == "off" else one.key}
        for name, value in values.items():
            value = str(value) if isinstance(value, int) else value
            text += to_bytes(name) + b" " + to_bytes(value) + b"\n"
    return text


def start(device, *networks, scenario="street"):
    """A device with these preferred networks, and the program on it."""
    d = device(scenario, files={FILE: file_of(*networks)})
    app = d.start()
    app.wait_listed()
    return d, app


def open_list(app):
    app.press("button-network-configure")
    dialog = app.dialog(LIST)
    last = []

    def settled():
        # In its place: a row is clicked by its place.
        tree = dialog.tree()
        steady = tree["active"] and last == [tree.find(FRONT)["rect"]]
        last[:] = [tree.find(FRONT)["rect"]]
        return steady

    wait_until(settled, "the list to stand still")
    return dialog


def close(dialog, button):
    dialog.press(button)
    dialog.wait_gone()


def warned(app, dialog, button, message):
    """Presses a button that is answered with a message, and reads that away."""
    dialog.press(button)
    box = app.dialog(text=message)
    assert [one["label"] for one in box.all(type="GtkButton")] == ["gtk-close"]
    close(box, "gtk-close")


def names(app):
    """What the list shows."""
    return [row[0] for row in app.registered_rows(FRONT)]


def select(dialog, row):
    dialog.click_row(FRONT, row)
    wait_until(lambda: dialog.selected(FRONT) == [row], f"row {row} to be selected")


def change(dialog, button, wanted):
    """Presses a button of the list dialog and waits for the names that the list then shows."""
    dialog.press(button)
    wait_until(lambda: names(dialog.app) == wanted,
               lambda: f"{wanted}; the list shows {names(dialog.app)}")


def printed(app, text):
    return app.stdout().count(text) + app.stderr().count(text)
