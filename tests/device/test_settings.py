# SPDX-License-Identifier: MIT
"""The dialog with the addressing of the interface: what it shows and how it follows the hand."""

import pytest

from harness import wait_until
from settings_page import (ADDRESSES, CONF, PREFIXES, TITLE, Settings,
                           dhcp, group, static)

EXPAND, FILL = 1, 4
TOOLTIPS = (
    "Enter your IP address here, e.g. 192.168.1.2",
    "Enter your netmask here, e.g. 255.255.255.0",
    "Enter your broadcast address here, usually the same like your IP with 255 as last number.",
    "Enter the IP Address of your default gateway here.",
)
KEYS = [prefix + "wlan0" for prefix in
        ("dhcp", "static", "auto_dns", "adhoc-host") + PREFIXES]


def place(pane, widget):
    """(left, right, top, bottom, x options, y options, x padding, y padding) in its table."""
    packing = pane.props(widget)["packing"]
    return tuple(packing[name] for name in
                 ("left-attach", "right-attach", "top-attach", "bottom-attach", "x-options",
                  "y-options", "x-padding", "y-padding"))


def values(pane, widget, *names):
    properties = pane.props(widget)["properties"]
    return [properties[name] for name in names]


def test_window(app):
    settings = Settings(app, static())
    window = settings.pane.tree()
    main = app.tree()

    assert window["title"] == TITLE
    properties = settings.app.ask("props " + window["id"])["properties"]
    assert properties["transient-for"]["id"] == main["id"]
    assert [properties[name] for name in
            ("modal", "destroy-with-parent", "type-hint", "default-width", "default-height",
             "resizable")] == [True, True, "dialog", 360, 320, True]
    buttons = {one["label"]: one for one in window.all(type="GtkButton")}
    assert set(buttons) == {"gtk-preferences", "gtk-cancel", "gtk-ok"}
    left = {name: one["rect"][0] for name, one in buttons.items()}
    assert left["gtk-ok"] < left["gtk-cancel"]
    assert buttons["gtk-cancel"]["default"] and not buttons["gtk-ok"]["default"]
    table = window.find(type="GtkTable")
    packing = settings.pane.props(table)["packing"]
    assert [packing[name] for name in ("expand", "fill", "padding", "pack-type")] == \
        [True, True, 0, "start"]
    settings.cancel()


def test_table(app):
    settings = Settings(app, static())
    pane = settings.pane
    table = pane.tree().find(type="GtkTable")

    assert values(pane, table, "n-rows", "n-columns", "homogeneous", "row-spacing",
                  "column-spacing", "border-width") == [16, 2, False, 5, 5, 5]
    box = settings.widget("dhcp").parent
    assert box["type"] == "GtkVBox" and box.parent["id"] == table["id"]
    assert place(pane, box) == (0, 2, 1, 2, FILL, FILL, 0, 0)
    assert values(pane, box, "homogeneous", "spacing") == [True, 0]
    radios = [pane.props(settings.widget(prefix))["packing"]["position"]
              for prefix in ("dhcp", "static")]
    assert radios == [0, 1]
    for row, (prefix, label, tooltip) in enumerate(
            zip(PREFIXES, ("Address", "Netmask", "Broadcast", "Gateway"), TOOLTIPS), 2):
        entry = pane.find(prefix)
        text = pane.find(type="GtkLabel", text=label)
        assert place(pane, entry) == (1, 2, row, row + 1, EXPAND | FILL, EXPAND | FILL, 5, 5)
        assert place(pane, text) == (0, 1, row, row + 1, FILL, FILL, 5, 5)
        assert values(pane, text, "xalign", "yalign") == [0, 0.5]
        assert (entry["tooltip"], text["tooltip"]) == (tooltip, tooltip)
        assert values(pane, entry, "editable") == [True]
    assert place(pane, settings.widget("auto_dns")) == (0, 2, 6, 7, FILL, FILL, 5, 5)
    assert place(pane, settings.widget("adhoc-host")) == (0, 1, 7, 8, FILL, FILL, 5, 5)
    assert place(pane, settings.preferences()) == (1, 2, 7, 8, FILL, FILL, 5, 5)
    settings.cancel()


def test_registered_while_open(app):
    settings = Settings(app, static())
    found = {key: app.registry(key) for key in KEYS}

    for prefix in PREFIXES:
        assert found[prefix + "wlan0"]["name"] == prefix
        assert found[prefix + "wlan0"]["id"] == settings.pane.find(prefix)["id"]
    for prefix, kind in (("dhcp", "GtkRadioButton"), ("static", "GtkRadioButton"),
                         ("auto_dns", "GtkCheckButton"), ("adhoc-host", "GtkCheckButton")):
        one = found[prefix + "wlan0"]
        assert (one["type"], one["name"]) == (kind, prefix + "wlan0")
        assert one["id"] == settings.widget(prefix)["id"]
    assert [settings.widget(prefix)["label"] for prefix in
            ("dhcp", "static", "auto_dns", "adhoc-host")] == \
        ["dhcp", "static", "Auto DNS", "Ad-Hoc Host"]
    settings.cancel()
    # Nothing destroyed can be looked up, and the next dialog takes the keys.
    assert [app.registry(key) for key in KEYS] == [None] * len(KEYS)
    settings = Settings(app)
    assert settings.widget("dhcp")["id"] == app.registry("dhcpwlan0")["id"]
    settings.cancel()


def test_shows_static(app):
    settings = Settings(app, static(host=0))
    assert settings.active("dhcp", "static", "auto_dns", "adhoc-host") == \
        [False, True, False, False]
    assert settings.texts() == ADDRESSES
    assert settings.entries_sensitive() is True
    assert not settings.widget("auto_dns")["sensitive"]
    assert not settings.preferences()["sensitive"]
    settings.cancel()


@pytest.mark.parametrize("dns, ticked", [("auto", True), ("manual", False), ("else", False)])
def test_shows_dhcp(app, dns, ticked):
    settings = Settings(app, dhcp(dns, host=1, essid="board"))
    assert settings.active("dhcp", "static", "auto_dns", "adhoc-host") == \
        [True, False, ticked, True]
    assert settings.texts() == ("", "", "", "")
    assert settings.entries_sensitive() is False
    assert settings.widget("auto_dns")["sensitive"]
    assert settings.preferences()["sensitive"]
    settings.cancel()


# No line of a file has been read, so neither flag is set; one radio of a group is always chosen.
def test_neither_flag(device):
    street = device("street")
    program = street.start()
    program.wait_listed()
    settings = Settings(program)
    assert settings.active("dhcp", "static", "auto_dns", "adhoc-host") == \
        [True, False, False, False]
    assert settings.texts() == ("", "", "", "")
    assert settings.entries_sensitive() is False
    assert not settings.widget("auto_dns")["sensitive"]
    settings.ok()
    assert street.file(CONF).decode() == "iface wlan0\naddrtype static\ndns manual\n" + group()
    # The file says static, but its lines are not those of a static stanza.
    settings = Settings(program)
    assert settings.active("dhcp", "static") == [False, True]
    assert settings.texts() == ("", "", "", "")
    assert settings.entries_sensitive() is True
    settings.cancel()


def test_toggling_from_dhcp(app):
    settings = Settings(app, dhcp("manual"))
    settings.toggle("static")
    assert settings.active("dhcp", "static", "auto_dns") == [False, True, False]
    assert settings.entries_sensitive() is True
    assert settings.texts() == ("", "", "", "")  # they started empty
    assert not settings.widget("auto_dns")["sensitive"]
    settings.pane.type("address", "10.0.0.7")
    settings.toggle("dhcp")
    assert settings.active("dhcp", "static", "auto_dns") == [True, False, True]
    assert settings.entries_sensitive() is False
    assert settings.widget("auto_dns")["sensitive"]
    assert settings.texts() == ("10.0.0.7", "", "", "")
    settings.toggle("static")  # the tick stays, greyed
    assert settings.active("auto_dns") == [True]
    assert not settings.widget("auto_dns")["sensitive"]
    settings.cancel()
    assert app.device.file(CONF).decode() == dhcp("manual")


def test_toggling_from_static(app):
    settings = Settings(app, static())
    settings.toggle("dhcp")
    assert settings.active("auto_dns") == [True]
    assert settings.entries_sensitive() is False
    assert settings.texts() == ADDRESSES
    settings.toggle("auto_dns")
    settings.toggle("static")
    settings.toggle("dhcp")
    assert settings.active("auto_dns") == [True]
    settings.cancel()


def test_toggling_host(app):
    settings = Settings(app, static())
    for _ in range(2):
        settings.toggle("adhoc-host")
        assert settings.preferences()["sensitive"] is settings.active("adhoc-host")[0]
    settings.cancel()


@pytest.mark.parametrize("way", ["cancel", "Escape", "close"])
def test_left_without_writing(app, way):
    before = static(essid="board")
    settings = Settings(app, before)
    settings.toggle("dhcp")
    settings.toggle("adhoc-host")
    app.device.clear_commands()
    states = app.device.states()
    if way == "cancel":
        settings.pane.press("gtk-cancel")
    elif way == "Escape":
        app.key("Escape")
    else:
        app.display.close_window(TITLE)
    settings.pane.wait_gone()
    assert app.device.file(CONF).decode() == before
    assert app.device.commands() == []
    assert app.device.states() == states
    # The next opening reads the file and nothing else.
    settings = Settings(app)
    assert settings.active("dhcp", "static", "adhoc-host") == [False, True, False]
    assert settings.texts() == ADDRESSES
    settings.cancel()


def test_another_interface_in_the_file(app):
    settings = Settings(app, static())
    settings.cancel()
    other = dhcp().replace("wlan0", "wlan1")
    settings = Settings(app, other)
    assert settings.active("dhcp", "static") == [False, True]
    assert settings.texts() == ADDRESSES
    settings.cancel()


def test_no_device(device):
    empty = device("no-interface")
    program = empty.start()
    message = program.dialog(text="No Wireless Device")
    message.press("gtk-close")
    message.wait_gone()
    empty.clear_commands()
    program.press("button-wifi-settings")
    message = program.dialog(text="No Wireless Device")
    window = message.tree()
    assert window["modal"]
    assert [one["label"] for one in window.all(type="GtkButton")] == ["gtk-close"]
    properties = program.ask("props " + window["id"])["properties"]
    assert properties["message-type"] == "info"
    assert properties["transient-for"]["id"] == program.tree()["id"]
    assert program.stderr().count("No interface\n") == 1  # that of the start
    message.press("gtk-close")
    message.wait_gone()
    program.wait_printed("WIRELESS-LAN-DEBUG: No interface\n", 2)
    assert program.dialogs() == []
    assert [one.argv for one in empty.commands()] == [["cat", "/proc/net/wireless"]]


def test_keyboard(app):
    """Tab goes round through all that can be used, in the order in which it is read."""
    settings = Settings(app, static())

    def focus():
        return next((one for one in settings.pane.tree().walk() if one["focus"]), None)

    seen = []
    at = wait_until(focus, "a focus")
    while at["id"] not in [one["id"] for one in seen]:
        seen.append(at)
        app.key("Tab")
        at = wait_until(lambda: (lambda now: now and now["id"] != seen[-1]["id"] and now)(focus()),
                        "the focus to go on")
    assert [one["label"] if one["type"] == "GtkButton" else one["name"] for one in seen] == \
        ["staticwlan0", *PREFIXES, "adhoc-hostwlan0", "gtk-ok", "gtk-cancel"]
    app.key("alt+c")
    settings.pane.wait_gone()


def test_opens_again_and_again(app):
    for _ in range(3):
        Settings(app, static()).cancel()
    before = app.descriptors()
    for _ in range(20):
        Settings(app, dhcp()).cancel()
    assert app.descriptors() == before
