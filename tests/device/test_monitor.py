# SPDX-License-Identifier: MIT
"""The pollers of a connect: their limits, texts, notices, and the controls they give back."""

import subprocess

from connecting import (ACQUIRING, CONNECTING, IDLE, INVALID, LOCKED, address_of, connect,
                        connected, idle, pass_time, poll_address, poll_link, settle, wait_commands)
from harness import CATALOGUES

ZEROS = "00:00:00:00:00:00"


def link_polls(printed):
    return printed.count("WIRELESS-LAN-DEBUG: AP MAC[")


def address_polls(printed):
    return printed.count("WIRELESS-LAN-DEBUG: detect_network_interface_state ...\n")


def poll_until(d, app, line, start=0):
    """Lets 2 s pass again and again until the line is printed after `start`. Returns what was
    printed before it, and the place after it."""
    for _ in range(60):
        before, found, _ = app.stderr()[start:].partition(line)
        if found:
            return before, start + len(before) + len(line)
        pass_time(d, app, 2000)
    raise AssertionError(f"no {line!r} in two minutes\n{app.stderr()[start:]}")


def assert_locked(app, locked=True):
    for name in LOCKED:
        assert app.sensitive(name) is not locked, name
    assert not app.sensitive("button-active-device")


def test_no_access_point_within_21_polls(device):
    d, app = idle(device, "one", "two")
    connect(app, 0)
    wait_commands(d, app)
    poll_link(d, app, 20)
    assert settle(app) == CONNECTING
    assert [row[4] for row in app.networks()] == [CONNECTING, "Disconnect"]
    assert_locked(app)
    assert d.states() == [5, 2]
    assert app.stderr().count(f"WIRELESS-LAN-DEBUG: AP MAC[{ZEROS}]:Disconnected\n") == 20

    poll_link(d, app)
    assert settle(app) == IDLE
    assert [row[4] for row in app.networks()] == ["Not Connect", "Disconnect"]
    assert_locked(app, False)
    d.wait_states(5, 2, 2)
    assert app.stderr().count("WIRELESS-LAN-DEBUG: Not connect,return.\n") == 1
    assert app.label("button-connect") == "gtk-connect"
    pass_time(d, app, 60000)
    assert link_polls(app.stderr()) == 21
    assert d.commands("lnk-ifup") == []

    # The row counts as not connected, so the button connects again; the count starts anew.
    connect(app, 0)
    wait_commands(d, app, 2)
    poll_link(d, app, 20)
    assert settle(app) == CONNECTING
    poll_link(d, app)
    assert settle(app) == IDLE


def test_last_polls_that_succeed(device):
    d, app = idle(device, "one")
    connect(app, 0)
    wait_commands(d, app)
    d.associate(address_of(0), after=20)
    poll_link(d, app, 20)
    assert settle(app) == CONNECTING and link_polls(app.stderr()) == 20
    poll_link(d, app)
    assert settle(app) == ACQUIRING
    d.wait_states(5, 2, 3)
    d.wait_command("lnk-ifup")

    # The association may go again: from here on only the address counts.
    d.dissociate()
    poll_address(d, app, 20)
    assert settle(app) == ACQUIRING
    assert_locked(app)
    app.wait_state(0, ACQUIRING)
    d.address("10.1.2.3")
    poll_address(d, app)
    app.wait_state(0, connected("10.1.2.3"))
    assert settle(app) == IDLE
    d.wait_states(5, 2, 3, 4)
    assert_locked(app, False)
    assert app.label("button-connect") == "gtk-disconnect"
    assert address_polls(app.stderr()) == 21
    assert len(d.commands("lnk-ifup")) == 1


def test_no_address_within_21_polls(device):
    d, app = idle(device, "one", ("two", "off", "7", "Master", ZEROS))
    d.associate(address_of(0))
    for row, label in ((0, "gtk-disconnect"), (1, "gtk-connect")):
        connect(app, row)
        wait_commands(d, app, row + 1)
        poll_link(d, app)
        poll_address(d, app, 20)
        assert settle(app) == ACQUIRING
        assert_locked(app)
        poll_address(d, app)
        app.wait_state(row, INVALID)
        assert settle(app) == IDLE
        assert_locked(app, False)
        # The button takes the network down; not where its access point has no address.
        assert app.label("button-connect") == label
        assert app.stderr().count("WIRELESS-LAN-DEBUG: acquire address failed.\n") == row + 1
        assert address_polls(app.stderr()) == 21 * (row + 1)
    d.wait_states(5, 2, 3, 2, 3)
    pass_time(d, app, 60000)
    assert address_polls(app.stderr()) == 42
    # A double click may connect again.
    app.click_row("view-press", 0, count=2, column=1)
    app.wait_title(CONNECTING)


def test_interface_that_goes_during_a_connect(device):
    d, app = idle(device, "one")
    connect(app, 0)
    wait_commands(d, app)
    d.sh("ip link del wlan0")
    d.set_interfaces()
    poll_link(d, app, 21)
    assert app.stderr().count("WIRELESS-LAN-DEBUG: AP MAC[]:Disconnected\n") == 21
    app.wait_state(0, "Not Connect")
    assert settle(app) == IDLE
    # The buttons come back; now there is a device to look for as well.
    for name in LOCKED + ("button-active-device",):
        assert app.sensitive(name)

    # It comes back during the next connect, and is gone again when the address is looked for.
    d.sh("add-interface wlan0")
    d.set_interfaces("wlan0")
    connect(app, 0)
    wait_commands(d, app, 2)
    d.associate(address_of(0))
    poll_link(d, app)
    d.sh("ip link del wlan0")
    poll_address(d, app, 21)
    app.wait_state(0, INVALID)
    assert settle(app) == IDLE


def confirm_settings(app, host=False):
    app.press("button-wifi-settings")
    dialog = app.dialog("WLAN Setting")
    dialog.click("dhcpwlan0")
    if host:
        dialog.click("adhoc-hostwlan0")
    dialog.press("gtk-ok")
    dialog.wait_gone()
    settle(app)


def test_two_chains_share_their_counts(device):
    d, app = idle(device, "one", "two", "three")
    # The settings start an address poller of their own, every 4 s.
    d.associate(address_of(0))
    confirm_settings(app)
    connect(app, 1)
    wait_commands(d, app)
    poll_link(d, app)
    failed = "WIRELESS-LAN-DEBUG: acquire address failed.\n"
    before, place = poll_until(d, app, failed)
    assert address_polls(before) == 21
    # The other chain goes on alone, from nothing.
    before, _ = poll_until(d, app, failed, place)
    assert address_polls(before) == 21

    # Two link pollers: the address of the first chain gives the buttons back too early.
    confirm_settings(app)
    d.dissociate()
    connect(app, 0)
    wait_commands(d, app, 2)
    start = len(app.stderr())
    d.address("192.168.7.23")
    pass_time(d, app, 4000)
    app.wait_state(0, connected("192.168.7.23"))
    assert_locked(app, False)
    connect(app, 2)
    wait_commands(d, app, 3)
    failed = "WIRELESS-LAN-DEBUG: Not connect,return.\n"
    before, place = poll_until(d, app, failed, start)
    assert link_polls(before) == 21
    before, _ = poll_until(d, app, failed, place)
    assert link_polls(before) == 21
    assert settle(app) == IDLE
    pass_time(d, app, 60000)
    assert app.stderr().count("Not connect,return.") == 2


def test_hosting_needs_no_address(device):
    d, app = idle(device, "one")
    d.associate(address_of(0))
    confirm_settings(app)
    confirm_settings(app, host=True)
    assert settle(app) == "Ad-Hoc Host Mode"
    states, rows = d.states(), app.networks()
    for _ in range(30):
        pass_time(d, app, 4000)
    assert address_polls(app.stderr()) == 21
    # Nothing is shown, nobody told, nothing given back.
    assert settle(app) == "Ad-Hoc Host Mode"
    assert app.networks() == rows and d.states() == states
    assert "acquire address failed" not in app.stderr()
    for name in ("button-connect", "button-refresh", "view-press"):
        assert not app.sensitive(name)


def catalogue(directory):
    """Every text of the program with a mark before it, as a message catalogue."""
    texts = ["Wireless network selection", "Connect network...",
             "Connected\\nAcquire IP address...", "Connected\\nIP Address",
             "Connected\\nIP address invalid", "Not Connect", "Disconnect"]
    source = 'msgid ""\nmsgstr "Content-Type: text/plain; charset=UTF-8\\n"\n\n'
    source += "".join(f'msgid "{text}"\nmsgstr "· {text}"\n\n' for text in texts)
    done = subprocess.run(["msgfmt", "-o", "-", "-"], input=source.encode(), cwd=directory,
                          check=True,
                          stdout=subprocess.PIPE)
    return {f"{CATALOGUES}/de/LC_MESSAGES/wireless-lan.mo": done.stdout}


def test_texts_are_translated_but_for_one(device, german, tmp_path):
    d = device("none", rate=50, scan=None, files=catalogue(tmp_path))
    for name in ("iwset", "lnk-ifup", "lnk-ifdown"):
        d.command(name, hook=":")
    d.set_networks("one", "two")
    app = d.start(environment=german)
    app.wait_title("· " + IDLE)
    app.wait_state(1, "· Disconnect")
    d.clock.rate = 0

    def join(row, count):
        connect(app, row)
        app.wait_title("· " + CONNECTING)
        app.wait_state(row, "· " + CONNECTING)
        pass_time(d, app, 100)
        d.wait_command("iwset", count)

    # The title after a connect that found nobody is the one text in English.
    join(0, 1)
    poll_link(d, app, 21)
    app.wait_state(0, "· Not Connect")
    assert settle(app) == IDLE

    join(1, 2)
    d.associate(address_of(1))
    poll_link(d, app)
    app.wait_state(1, "· " + ACQUIRING)
    assert settle(app) == "· " + ACQUIRING
    d.address("192.168.7.23")
    poll_address(d, app)
    app.wait_state(1, "· " + connected("192.168.7.23"))
    assert settle(app) == "· " + IDLE

    d.address(None)
    join(0, 3)
    poll_link(d, app)
    poll_address(d, app, 21)
    app.wait_state(0, "· " + INVALID)
    assert settle(app) == "· " + IDLE
    connect(app, 0)
    app.wait_printed("now is link down.")
    pass_time(d, app, 100)
    app.wait_state(0, "· Disconnect")
