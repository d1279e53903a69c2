# SPDX-License-Identifier: MIT
"""The dialog with the network that the device hosts."""

import pytest
from Xlib import X, display as xdisplay

from harness import wait_until
from settings_page import CONF, GROUP_TITLE, Settings, dhcp

EXPAND, FILL = 1, 4
ENTRY = "GtkEntry"  # the dialog's only one has no name of its own
NO_ESSID = "Please enter the ESSID."
NO_KEY = "Please enter the Key."


def hosted(app, **group):
    """Both dialogs, opened with this network in the file."""
    settings = Settings(app, dhcp(host=1, **group))
    return settings, settings.open_group()


def warned(information, text):
    """OK is refused with this one warning; the dialog is there again afterwards."""
    information.press("gtk-ok")
    warning = information.app.dialog(text=text)
    window = warning.tree()
    assert [one["label"] for one in window.all(type="GtkButton")] == ["gtk-close"]
    properties = information.app.ask("props " + window["id"])["properties"]
    assert properties["message-type"] == "info"
    assert properties["transient-for"]["id"] == information.tree()["id"]
    warning.press("gtk-close")
    warning.wait_gone()


def accept(information):
    information.press("gtk-ok")
    information.wait_gone()


def stored(settings):
    """What the file holds after OK in the settings dialog."""
    settings.ok()
    return settings.device.file(CONF).decode()


def stacking(app):
    """(title, whether it is kept above the others) from the lowest to the highest window."""
    connection = xdisplay.Display(app.display.name)
    above = connection.intern_atom("_NET_WM_STATE_ABOVE")

    def property_of(window, name):
        found = window.get_full_property(connection.intern_atom(name), X.AnyPropertyType)
        return list(found.value) if found else []

    try:
        windows = [connection.create_resource_object("window", one) for one in
                   property_of(connection.screen().root, "_NET_CLIENT_LIST_STACKING")]
        return [(one.get_wm_name(), above in property_of(one, "_NET_WM_STATE")) for one in windows]
    finally:
        connection.close()


def test_window(app):
    settings, information = hosted(app, essid="board", key="secret", encryption="restricted")
    window = information.tree()
    properties = app.ask("props " + window["id"])["properties"]
    assert window["title"] == GROUP_TITLE
    # No parent; modal only while it runs, as every dialog is that is waited for.
    assert properties["transient-for"] is None
    assert [properties[name] for name in
            ("destroy-with-parent", "type-hint", "allow-shrink", "allow-grow", "resizable",
             "can-default", "has-default")] == [True, "dialog", False, False, False, True, True]
    buttons = {one["label"]: one for one in window.all(type="GtkButton")}
    assert set(buttons) == {"gtk-ok", "gtk-cancel"}
    assert buttons["gtk-ok"]["rect"][0] < buttons["gtk-cancel"]["rect"][0]
    assert not any(one["default"] for one in buttons.values())

    frame = window.find(type="GtkFrame")
    properties = information.props(frame)
    assert frame["label"] == "Ad-Hoc Information"
    assert [round(properties["properties"][name], 3) for name in
            ("label-xalign", "label-yalign")] == [0, 0.6]
    assert [properties["properties"][name] for name in ("shadow-type", "border-width")] == \
        ["etched-out", 10]
    assert [properties["packing"][name] for name in ("expand", "fill")] == [True, True]
    table = window.find(type="GtkTable")
    assert table.parent["id"] == frame["id"]
    properties = information.props(table)["properties"]
    assert [properties[name] for name in ("n-rows", "n-columns", "border-width")] == [8, 2, 5]

    # The ESSID row and nothing else.
    assert sorted(one["type"] for one in table["children"]) == ["GtkEntry", "GtkLabel"]
    label = table.find(type="GtkLabel")
    entry = table.find(ENTRY)
    assert (label["text"], entry["text"], entry["visibility"]) == ("ESSID", "board", True)
    places = [[information.props(one)["packing"][name] for name in
               ("left-attach", "right-attach", "top-attach", "bottom-attach", "x-options",
                "y-options", "x-padding", "y-padding")] for one in (label, entry)]
    assert places == [[0, 1, 0, 1, EXPAND | FILL, EXPAND | FILL, 5, 5],
                      [1, 2, 0, 1, FILL, FILL, 5, 5]]
    properties = information.props(label)["properties"]
    assert [properties["xalign"], properties["yalign"]] == [1, 0.5]
    assert information.props(entry)["properties"]["editable"]
    information.press("gtk-cancel")
    information.wait_gone()
    settings.cancel()


def test_stands_above_the_settings(app):
    settings, information = hosted(app, essid="board")
    wait_until(lambda: stacking(app)[-2:] == [("WLAN Setting", False), (GROUP_TITLE, True)],
               lambda: f"the order {stacking(app)}")
    # The dialog below is seen and not used.
    x, y, width, height = settings.widget("static")["rect"]
    app.display.click(x + width // 2, y + height // 2)
    information.type(ENTRY, "still here")
    assert settings.active("static") == [False]
    information.press("gtk-cancel")
    information.wait_gone()
    settings.cancel()


def test_empty_name_is_refused(app):
    settings, information = hosted(app)
    assert information.find(ENTRY)["text"] == ""
    for _ in range(2):
        warned(information, NO_ESSID)
    information.type(ENTRY, "mine")
    information.type(ENTRY, "")
    warned(information, NO_ESSID)
    information.type(ENTRY, "mine")
    accept(information)
    assert stored(settings) == dhcp(host=1, essid="mine")


def test_without_encryption_the_key_stays(app):
    settings, information = hosted(app, essid="board", key="secret")
    information.type(ENTRY, "other")
    out = len(app.stdout())
    accept(information)
    assert app.stdout()[out:] == "group_info->encmode=0\r\n"
    assert stored(settings) == dhcp(host=1, essid="other", key="secret")


@pytest.mark.parametrize("encryption, number", [("open", 1), ("restricted", 2)])
def test_encryption_and_key_pass_through(app, encryption, number):
    settings, information = hosted(app, essid="board", key="secret", encryption=encryption)
    information.type(ENTRY, "other")
    out = len(app.stdout())
    accept(information)
    assert app.stdout()[out:] == f"group_info->encmode={number}\r\n"
    assert stored(settings) == dhcp(host=1, essid="other", key="secret", encryption=encryption)


@pytest.mark.parametrize("encryption", ["open", "restricted"])
@pytest.mark.parametrize("way", ["cancel", "Escape", "close"])
def test_missing_key_is_refused_for_ever(app, encryption, way):
    """The key cannot be entered here, so only leaving helps; the name is taken all the same."""
    settings, information = hosted(app, essid="board", encryption=encryption)
    for name in ("first", "second", "third"):
        information.type(ENTRY, name)
        warned(information, NO_KEY)
    information.type(ENTRY, "not stored")
    if way == "cancel":
        information.press("gtk-cancel")
    elif way == "Escape":
        app.key("Escape")
    else:
        app.display.close_window(GROUP_TITLE)
    information.wait_gone()
    assert stored(settings) == dhcp(host=1, essid="third", encryption=encryption)


@pytest.mark.parametrize("way", ["cancel", "Escape", "close"])
def test_left_without_storing(app, way):
    settings, information = hosted(app, essid="board")
    information.type(ENTRY, "other")
    out = len(app.stdout())
    if way == "cancel":
        information.press("gtk-cancel")
    elif way == "Escape":
        app.key("Escape")
    else:
        app.display.close_window(GROUP_TITLE)
    information.wait_gone()
    assert app.stdout()[out:] == ""
    assert stored(settings) == dhcp(host=1, essid="board")


def test_enter_is_ok(app):
    settings, information = hosted(app, essid="board")
    information.type(ENTRY, "other")
    app.key("Return")
    information.wait_gone()
    assert stored(settings) == dhcp(host=1, essid="other")


def test_nothing_is_written_or_run_here(app):
    settings, information = hosted(app, essid="board")
    before = app.device.file(CONF)
    app.device.clear_commands()
    states = app.device.states()
    information.type(ENTRY, "other")
    accept(information)
    assert app.device.file(CONF) == before
    # It is in memory, until the file is read again.
    information = settings.open_group()
    assert information.find(ENTRY)["text"] == "other"
    information.press("gtk-cancel")
    information.wait_gone()
    settings.cancel()
    assert (app.device.commands(), app.device.states()) == ([], states)
    settings = Settings(app)
    information = settings.open_group()
    assert information.find(ENTRY)["text"] == "board"
    information.press("gtk-cancel")
    information.wait_gone()
    settings.cancel()


def test_blanks_are_cut_when_read_again(app):
    settings, information = hosted(app, essid="board")
    information.type(ENTRY, "two words")
    accept(information)
    assert stored(settings) == dhcp(host=1, essid="two words")
    settings = Settings(app)
    information = settings.open_group()
    assert information.find(ENTRY)["text"] == "two"
    information.press("gtk-cancel")
    information.wait_gone()
    settings.cancel()


def test_host_off_greys_the_way_in(app):
    settings = Settings(app, dhcp(host=1, essid="board"))
    settings.toggle("adhoc-host")
    assert not settings.preferences()["sensitive"]
    x, y, width, height = settings.preferences()["rect"]
    app.display.click(x + width // 2, y + height // 2)
    settings.toggle("adhoc-host")  # the dialog has seen the click before this one
    assert app.dialogs()[0][0] == "WLAN Setting" and len(app.dialogs()) == 1
    information = settings.open_group()
    information.press("gtk-cancel")
    information.wait_gone()
    settings.cancel()


def test_a_long_name_is_not_cut_in_silence(app):
    """127 bytes are taken, and no part of a character; the entry shows what is kept."""
    settings, information = hosted(app, essid="board")
    information.type(ENTRY, "x" * 126)
    information.type(ENTRY, "ü" + "y" * 50, replace=False)
    wait_until(lambda: information.find(ENTRY)["text"] == "x" * 126 + "y", "a full entry")
    accept(information)
    assert stored(settings) == dhcp(host=1, essid="x" * 126 + "y")


def test_bytes_that_are_no_text_stay(app):
    """The name is shown as well as it can be, and kept as it is unless it is changed."""
    content = dhcp(host=1, essid="NAME").encode().replace(b"NAME", b"caf\xe9\xff")
    settings = Settings(app, content)
    information = settings.open_group()
    assert information.find(ENTRY)["text"] == "caf\ufffd\ufffd"
    accept(information)
    settings.ok()
    assert app.device.file(CONF) == content
    wait_until(lambda: app.device.commands("iwset"), "iwset")
    assert app.device.commands("iwset")[-1].argv[3].encode("utf-8", "surrogateescape") == \
        b"caf\xe9\xff"


def test_opens_again_and_again(app):
    """The widgets that are never shown go with the dialog."""
    settings = Settings(app, dhcp(host=1, essid="board"))

    def once():
        information = settings.open_group()
        information.press("gtk-cancel")
        information.wait_gone()

    for _ in range(3):
        once()
    before = app.descriptors()
    for _ in range(10):
        once()
    assert app.descriptors() == before
    settings.cancel()
