# SPDX-License-Identifier: MIT
"""With ears instead of eyes and no pointer: everything is found by what a screen reader says, and
done with keys."""

import glob
import os

import pytest

from connecting import CONNECTING, ACQUIRING, COMMANDS, IDLE, address_of, connected, pass_time, \
    poll_address, poll_link
from preferred import FILE, Network, file_of
from settings_page import ADDRESSES, CONF, static
from support.grammar import scan_text

pytest.importorskip("gi", reason="python3-gi is missing")

BRIDGE = "/usr/lib/*/gtk-2.0/modules/libatk-bridge.so"
if not glob.glob(BRIDGE):
    pytest.skip("left out: libatk-adaptor has no bridge for GTK+ 2 here", allow_module_level=True)

from screen_reader import (  # pylint: disable=wrong-import-position
    Reader, row, selected, value, wait_heard, walk)

# "get_..." in place of "get_..._iface" finds nothing in the client of Debian 12.
pytestmark = pytest.mark.filterwarnings("ignore:Atspi:DeprecationWarning")

MAIN = "Wireless LAN"
STORED = (Network("one"), Network("two", "second"), Network("three", "third"))


@pytest.fixture(scope="module", name="reader")
def fixture_reader(shared_device):
    """The program with a reader beside it; time passes only when a test lets it."""
    if os.getuid() != 0:
        # On the device of an ordinary user the program has another user's number than the bus,
        # which refuses it.
        pytest.skip("needs root")
    d = shared_device("none", rate=50, files={FILE: file_of(*STORED)},
                      scan=scan_text("open net", ("home net", "on"), "other net"))
    for name in COMMANDS:
        d.command(name, hook=":")
    reader = Reader(d)
    try:
        app = d.start(environment=reader.environment)
        app.wait_listed()
        d.clock.rate = 0
        yield reader
    finally:
        reader.close()


@pytest.fixture(name="window")
def fixture_window(reader):
    return reader.window(MAIN)


def roles(window):
    return [one.get_role_name() for one in walk(window)]


def test_the_main_window(reader, window):
    assert reader.nameless(window) == []
    assert reader.find(window, IDLE, "status bar")
    networks = reader.find(window, "Wireless network selection", "table")
    assert row(networks, 1) == ["home net", "Master", "on", "70/100", "Disconnect"]
    # Every control can be had with Tab.
    for name in ("Refresh", "WLAN Setting", "Preferred Network", "Connect"):
        reader.go(window, name, "push button")
    reader.go(window, "Wireless network selection", "table")


def test_connect_with_a_key(reader, window):
    d, app = reader.device, reader.device.apps[-1]
    reader.go(window, "Wireless network selection", "table")
    networks = reader.find(window, "Wireless network selection", "table")
    for name in ("open net", "home net"):
        d.display.key("Down")
        wait_heard(lambda: [one[0] for one in selected(networks)] == [name],
                   lambda: f"{name} to be selected, which is {selected(networks)}")
    reader.heard.clear()
    d.display.key("Return")

    dialog = reader.window("Encrypted Network")
    assert dialog.get_description() == "home net"
    assert reader.nameless(dialog) == []
    assert "icon" not in roles(dialog) and "image" not in roles(dialog)
    wait_heard(lambda: reader.focus(dialog) == ("Key", "text"), "the key's entry")
    assert reader.find(dialog, "Key index:", "combo box")
    assert reader.find(dialog, "Preferred Network", "combo box")
    reader.enter(dialog, "Key", "secret77")
    authentication = reader.find(dialog, "Authentication", "combo box")
    assert value(authentication) == "WEP"
    reader.go(dialog, "Authentication", "combo box")
    d.display.key("Down")
    wait_heard(lambda: value(authentication) == "WPA-PSK/WPA2-PSK", "the other authentication")
    reader.press(dialog, "OK")

    offer = reader.window("Question")
    reader.enter(offer, "Alias:", "mine")
    d.display.key("Return")
    window = reader.window(MAIN)
    reader.find(window, CONNECTING, "status bar")
    pass_time(d, app, 100)
    command = d.wait_command("iwset")
    assert command.argv[1:4] == ["wpa", "wlan0", "essid"]
    d.associate(address_of(1))
    poll_link(d, app)
    d.address("192.168.7.23")
    poll_address(d, app)
    wait_heard(lambda: row(networks, 1)[-1] == connected("192.168.7.23"), "the address")
    assert reader.find(window, "Disconnect", "push button")
    reader.announced(CONNECTING, ACQUIRING, IDLE)
    assert b"ALIAS mine\nESSID home net\n" in d.file(FILE)


def test_a_connect_that_fails(reader, window):
    d, app = reader.device, reader.device.apps[-1]
    reader.go(window, "Wireless network selection", "table")
    networks = reader.find(window, "Wireless network selection", "table")
    # After Tab alone the row of the cursor is not selected, and a move to it does nothing.
    for key, name in (("End", "other net"), ("Home", "open net"), ("End", "other net")):
        d.display.key(key)
        wait_heard(lambda name=name: [one[0] for one in selected(networks)] == [name], name)
    d.dissociate()
    d.clear_commands()
    reader.heard.clear()
    d.display.key("Return")
    reader.find(window, CONNECTING, "status bar")
    pass_time(d, app, 100)
    d.wait_command("iwset")
    poll_link(d, app, 21)
    wait_heard(lambda: row(networks, 2)[-1] == "Not Connect", "the end of it")
    reader.announced(CONNECTING, IDLE)


def test_edit_the_preferred_list(reader, window):
    d = reader.device
    reader.press(window, "Preferred Network")
    dialog = reader.window("Preferred Network Setting")
    assert reader.nameless(dialog) == []
    reader.go(dialog, "Preferred Network", "table")
    names = reader.find(dialog, "Preferred Network", "table")
    count = names.get_table_iface().get_n_rows()
    d.display.key("Home")
    d.display.key("Down")
    wait_heard(lambda: selected(names) == [["second"]], lambda: f"selected: {selected(names)}")
    d.display.key("alt+Up")
    wait_heard(lambda: row(names, 0) == ["second"], "the row to move up")
    d.display.key("Return")

    form = reader.window("Properties")
    assert reader.nameless(form) == []
    for name in ("Encryption: WEP", "Encryption: WPA", "Mode: Managed", "Mode: Ad-Hoc",
                 "Key state: off", "Key state: open", "Key state: restricted"):
        assert reader.find(form, name, "radio button")
    reader.enter(form, "Alias", "first")
    d.display.key("Return")
    reader.window("Preferred Network Setting")
    wait_heard(lambda: row(names, 0) == ["first"], "the new alias")

    reader.press(dialog, "Add")
    form = reader.window("Add WiFi Network")
    assert reader.nameless(form) == []
    reader.enter(form, "ESSID", "attic")
    reader.go(form, "Encryption: WEP", "radio button")
    d.display.key("Right")
    wait_heard(lambda: reader.focus(form) == ("Encryption: WPA", "radio button"), "WPA")
    reader.enter(form, "Key", "secret88", "password text")
    reader.press(form, "OK")
    reader.window("Preferred Network Setting")
    wait_heard(lambda: names.get_table_iface().get_n_rows() == count + 1, "the added row")
    reader.press(dialog, "OK")
    reader.wait_gone("Preferred Network Setting")
    assert d.file(FILE).startswith(file_of(STORED[1]._replace(alias="first"), STORED[0]))
    assert b"ESSID attic\nMODE Managed\nKMGMT 1\n" in d.file(FILE)


def test_change_the_settings(reader, window):
    d = reader.device
    reader.press(window, "WLAN Setting")
    dialog = reader.window("WLAN Setting")
    assert reader.nameless(dialog) == []
    reader.go(dialog, "dhcp", "radio button")
    d.display.key("Down")
    wait_heard(lambda: reader.focus(dialog) == ("static", "radio button"), "static")
    for name, text in zip(("Address", "Netmask", "Broadcast", "Gateway"), ADDRESSES):
        reader.enter(dialog, name, text)
    reader.press(dialog, "OK")
    reader.wait_gone("WLAN Setting")
    assert d.file(CONF) == static().encode()


def test_host_a_network(reader, window):
    d = reader.device
    reader.press(window, "WLAN Setting")
    settings = reader.window("WLAN Setting")
    reader.go(settings, "Ad-Hoc Host", "check box")
    d.display.key("space")
    reader.press(settings, "Preferences")
    dialog = reader.window("Ad-Hoc Information")
    assert reader.nameless(dialog) == []
    reader.enter(dialog, "ESSID", "den")
    d.display.key("Return")
    reader.wait_gone("Ad-Hoc Information")
    reader.press(reader.window("WLAN Setting"), "OK")
    reader.wait_gone("WLAN Setting")
    assert reader.find(window, "Ad-Hoc Host Mode", "status bar")
