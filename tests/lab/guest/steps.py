# SPDX-License-Identifier: MIT
"""What a person does with the window, and what is checked after it: shared by the groups."""

import re

import window as w
from air import FAR, run
from probe import wait_until


OFFER = "Do you want to add this configuration to the preferred network?"
RECORD = ("USERCELL {0}\nALIAS {1}\nESSID {1}\nMODE Master\nKMGMT {2}\nKINDEX 0\nEncryption {3}\n"
          "KEY {4}\n")


def check(condition, reason):
    if not condition:
        raise AssertionError(reason)


def same(got, wanted, what):
    check(got == wanted, f"{what} is {got!r}, not {wanted!r}")


def connected_to(net, limit=90, card="wlan0"):
    """Waits until a row shows an address of subnet NET and the window is idle; returns the row."""
    wait_until(lambda: w.connected_row(net) is not None,
               lambda: f"a row with an address of 10.9.{net}.x in {w.rows()}", limit)
    row = w.connected_row(net)
    w.idle()
    same(w.app.label("button-connect"), "gtk-disconnect", "the button")
    shown = w.rows()[row][4][len("Connected\nIP Address:"):]
    have = re.findall(r"inet ([0-9.]+)/", run("ip", "-4", "addr", "show", "dev", card))
    same(have, [shown], "the interface's address, as shown,")
    same([i for i, one in enumerate(w.rows()) if one[4].startswith("Connected")], [row],
         "the rows called connected")
    run("ping", "-c", "1", "-W", "10", f"10.9.{net}.1")
    return row


def answer_encrypted(key, remember=None, index=0, alias=""):
    """Fills the dialog for the key: INDEX 1 of the first list is WPA. REMEMBER None: not asked."""
    box = w.app.dialog("Encrypted Network")
    if box.find("Authentication_ComboBox")["active"] != index:
        box.choose("Authentication_ComboBox", index)
    if key is not None:
        box.type("connect_key", key)
    box.press("gtk-ok")
    if remember is not None:
        prompt = w.app.dialog(text=OFFER)
        if remember:
            prompt.type("GtkEntry", alias)
        prompt.press("gtk-yes" if remember else "gtk-no")


def write_preferred(*networks):
    """The list of preferred networks, as the window writes it."""
    with open("/etc/wireless-user.conf", "w") as file:
        for number, one in enumerate(networks):
            key = one["key"]
            file.write(RECORD.format(number, one["name"].decode(), int(bool(key)),
                                     "open" if key else "off", key or "off"))


def wanted_row(name):
    """The row of a network by its name, after as many refreshes as it takes to show it."""
    rows = w.refresh_until(lambda now: name in [one[0] for one in now], f"{name!r} is listed")
    return [one[0] for one in rows].index(name)


def press_button(label):
    """Presses the button below the list once it says what it is to do."""
    wait_until(lambda: w.app.label("button-connect") == label, f"the button to say {label}")
    w.app.press("button-connect")


def press_connect(name, nth=0):
    row = wanted_row(name) + nth
    w.select(row)
    w.notices()
    press_button("gtk-connect")
    return row


def followed(*numbers, limit=20):
    """The notices since the connect was pressed are these, in this order."""
    got = []

    def all_there():
        got.extend(w.notices())
        return len(got) >= len(numbers)

    try:
        wait_until(all_there, "notices", limit)
    except AssertionError:
        pass
    same(got, list(numbers), "the notices to the desktop")


def linked(card="wlan0"):
    """The address of the access point that the kernel has a card associated with, or None."""
    found = re.search(r"Connected to ([0-9a-f:]+)", run("iw", "dev", card, "link", check=False))
    return found and found.group(1)


def open_settings():
    w.app.press("button-wifi-settings")
    return w.app.dialog("WLAN Setting")


def tick(box, name, active=True):
    """Presses a radio or check button unless it is as wanted."""
    if box.find(name)["active"] != active:
        box.press(name)
        wait_until(lambda: box.find(name)["active"] == active, f"{name} to be {active}")


def write_addresses(box, *values):
    tick(box, "staticwlan0")
    for name, value in zip(("address", "netmask", "broadcast", "gateway"), values):
        box.type(name, value)


def host(name, *addresses):
    """Has the settings host a network of this name, with these addresses."""
    box = open_settings()
    write_addresses(box, *addresses)
    tick(box, "adhoc-hostwlan0")
    box.press("gtk-preferences")
    details = w.app.dialog("Ad-Hoc Information")
    details.type("GtkEntry", name)
    details.press("gtk-ok")
    details.wait_gone()
    w.notices()
    box.press("gtk-ok")
    box.wait_gone()
    wait_until(lambda: w.title() == "Ad-Hoc Host Mode", "the title says so")


def second_station(card, name, net):
    """A station far away sees the network of equals of this name, joins it and reaches us."""
    run("ip", "link", "set", card, "up", netns=FAR)

    def seen():
        found = run("iw", "dev", card, "scan", netns=FAR, check=False)
        return f"SSID: {name}" in found and "IBSS" in found

    wait_until(seen, "a second station to see it", 90)
    run("ip", "link", "set", card, "down", netns=FAR)
    run("iw", "dev", card, "set", "type", "ibss", netns=FAR)
    run("ip", "link", "set", card, "up", netns=FAR)
    frequency = re.search(r"channel \d+ \((\d+) MHz", run("iw", "dev", "wlan0", "info")).group(1)
    run("iw", "dev", card, "ibss", "join", name, frequency, netns=FAR)
    run("ip", "addr", "add", f"10.9.{net}.2/24", "dev", card, netns=FAR)
    wait_until(lambda: "1 received" in run("ping", "-c", "1", "-W", "2", f"10.9.{net}.1", netns=FAR,
                                           check=False), "an answer to ping", 60)
