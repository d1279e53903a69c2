"""What a person does with the window, and what is checked after it: shared by the groups."""

import re

import window as w
from air import run, until


def check(condition, reason):
    if not condition:
        raise AssertionError(reason)


def same(got, wanted, what):
    check(got == wanted, f"{what} is {got!r}, not {wanted!r}")


def connected_to(net, limit=90):
    """Wait until a row tells an address of subnet NET and the window is idle; return the row."""
    prefix = f"Connected\nIP Address:10.9.{net}."
    row = until(lambda: next((i for i, one in enumerate(w.rows()) if one[4].startswith(prefix)), -1)
                + 1, f"a row with an address of 10.9.{net}.x", limit, 0.5) - 1
    w.idle()
    same(w.widget("button-connect")["label"], "gtk-disconnect", "the button")
    shown = w.rows()[row][4][len("Connected\nIP Address:"):]
    have = re.findall(r"inet ([0-9.]+)/", run("ip", "-4", "addr", "show", "dev", "wlan0"))
    same(have, [shown], "the interface's address, as shown,")
    same([i for i, one in enumerate(w.rows()) if one[4].startswith("Connected")], [row],
         "the rows called connected")
    run("ping", "-c", "1", "-W", "10", f"10.9.{net}.1")
    return row


def answer_encrypted(key, remember=None, index=0, alias=""):
    """Fill the dialog for the key: INDEX 1 of the first list is WPA. REMEMBER None: not asked."""
    box = w.dialog("Encrypted Network")
    kind = next(one for one in w.walk(box) if one.get("items") == ["WEP", "WPA-PSK/WPA2-PSK"])
    if kind["active"] != index:
        w.choose(kind, index)
    if key is not None:
        w.fill(w.find(box, "GtkEntry"), key)
    w.press_in(box, "gtk-ok")
    if remember is not None:
        prompt = w.dialog("Do you want to add this configuration to the preferred network?")
        if remember:
            w.fill(w.find(prompt, "GtkEntry"), alias)
        w.press_in(prompt, "gtk-yes" if remember else "gtk-no")


def wanted_row(name):
    """The row of a network by its name, after as many refreshes as it takes to show it."""
    rows = w.refresh_until(lambda now: name in [one[0] for one in now], f"{name!r} is listed")
    return [one[0] for one in rows].index(name)


def press_button(label):
    """Press the button below the list once it says what it is to do."""
    until(lambda: w.widget("button-connect")["label"] == label, f"the button says {label}", 20)
    w.press(w.widget("button-connect"))


def press_connect(name, nth=0):
    row = wanted_row(name) + nth
    w.select_surely(row)
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
        until(all_there, "notices", limit)
    except TimeoutError:
        pass
    same(got, list(numbers), "the notices to the desktop")


def linked():
    """The address of the access point that the kernel is associated with, or None."""
    found = re.search(r"Connected to ([0-9a-f:]+)", run("iw", "dev", "wlan0", "link", check=False))
    return found and found.group(1)


def open_settings():
    w.press(w.widget("button-wifi-settings"))
    return w.dialog("WLAN Setting")


def tick(box, kind, label, active=True):
    """Press a radio or check button unless it is as wanted."""
    button = w.find(box, kind, label=label)
    if button["active"] != active:
        w.press(button)
        until(lambda: w.again(button)["active"] == active, f"{label} is {active}", 20)


def write_addresses(box, *values):
    tick(box, "GtkRadioButton", "static")
    for name, value in zip(("address", "netmask", "broadcast", "gateway"), values):
        w.fill(w.find(box, "GtkEntry", name), value)
