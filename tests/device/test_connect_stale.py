# SPDX-License-Identifier: MIT
"""Records that change under an open dialog, a scheduled connect or a poller.

A dialog keeps the pointer away from the main window, not a screen reader's press on Refresh."""

import assistive
from connecting import (CONNECTING, HIDDEN, IDLE, LOCKED, OFFER, address_of, connect, connected,
                        idle, pass_time, poll_link, preferred, settle, type_answer, wait_commands)
from harness import wait_until

MARKER = {"/etc/build_in_wifi": b""}
CHECK_MS, SCAN_MS = 6050, 100
GONE = "WIRELESS-LAN-DEBUG: the chosen network is gone, it is not connected\n"


def chosen(device, *networks, select, **settings):
    """A device with these networks, and Connect pressed on the row `select`."""
    d, app = idle(device, *networks, **assistive.settings(**settings))
    connect(app, select)
    return d, app


def scan_again(d, app, milliseconds=SCAN_MS):
    """A refresh, whatever is open in front; `milliseconds`: the part of its delay that passes."""
    assistive.press(d, "button-refresh")
    app.wait_title("Searching...")
    pass_time(d, app, milliseconds)
    if milliseconds == SCAN_MS:
        d.wait_command("iwlist")
        settle(app)


def assert_gone(d, app, times=1):
    """The one line of a network that is gone; nothing told, nothing open, everything usable."""
    settle(app)
    pass_time(d, app, 60000)
    assert app.stderr().count(GONE) == times
    assert app.dialogs() == [] and d.commands("iwset", "lnk-ifup") == []
    assert settle(app) == IDLE
    for name in LOCKED:
        assert app.sensitive(name), name


def test_a_refresh_while_the_key_is_typed(device):
    d, app = chosen(device, "cafe", ("home net", "on"), ("neighbour", "on"), select=1,
                       files=preferred(("", "neighbour", 1, 0, "their-key"),
                                       ("", "home net", 1, 0, "home-key"),
                                       ("", "neighbour", 1, 0, "their-other-key"),
                                       ("", "home net", 1, 0, "home-key-2")))
    dialog = app.dialog("Encrypted Network")
    # Another order: where "home net" was stands "neighbour" now, and the device is with it.
    d.associate(address_of(2))
    d.set_networks("cafe", ("neighbour", "on", "7", "Master", address_of(2)), "new",
                   ("home net", "on", "7", "Master", address_of(1)))
    scan_again(d, app)
    assert [row[0] for row in app.networks()] == ["cafe", "neighbour", "new", "home net"]
    # The dialog still speaks of the network that it was opened for.
    assert dialog.text("connect_key") == "home-key"
    dialog.choose("GtkComboBox", 1)
    assert dialog.text("connect_key") == "home-key-2"
    dialog.press("gtk-ok")
    wait_commands(d, app)
    assert d.commands("iwset")[0].argv == [
        "/sbin/iwset", "wpa", "wlan0", "essid", "home net", "mode", "Managed", "key", "home-key-2",
        "enc", "open"]
    assert [row[4] for row in app.networks()] == ["Disconnect", "Disconnect", "Disconnect",
                                                  CONNECTING]


def test_a_network_that_is_gone_gets_no_key(device):
    d, app = chosen(device, "cafe", ("home net", "on"), select=1)
    dialog = app.dialog("Encrypted Network")
    # The list is shorter; a namesake, and the access point under another name, are no home net.
    d.set_networks(("home net", "on", "7", "Master", address_of(8)),
                   ("other", "on", "7", "Master", address_of(1)))
    scan_again(d, app)
    dialog.type("connect_key", "secret77")
    dialog.press("gtk-ok")
    dialog.wait_gone()
    assert_gone(d, app)
    connect(app, 0)
    dialog = app.dialog("Encrypted Network")
    assert dialog.text("connect_key") == ""
    dialog.type("connect_key", "secret77")
    dialog.press("gtk-ok")

    # While the offer stands: what is kept is what was chosen; nobody gets the key.
    offer = app.dialog(text=OFFER)
    d.set_networks(("neighbour", "on", "7", "Master", address_of(2)), "cafe", "")
    scan_again(d, app)
    offer.press("gtk-yes")
    offer.wait_gone()
    settle(app)
    rows = app.registered_rows("user_cell_list_backend")
    assert [row[1:5] for row in rows] == [["home net", "Managed", "ENC_OPEN", "secret77"]]
    assert_gone(d, app, 2)

    # While the name of a hidden network is asked.
    connect(app, 2)
    question = app.dialog(text=HIDDEN)
    d.set_networks("cafe")
    scan_again(d, app)
    question.press("gtk-yes")
    question.wait_gone()
    assert_gone(d, app, 3)


def test_a_refresh_between_ok_and_the_command(device):
    d, app = idle(device, "cafe", ("home net", "on"), ("neighbour", "on"), **assistive.settings())
    moved = ["cafe", ("neighbour", "on", "7", "Master", address_of(2)),
             ("home net", "on", "7", "Master", address_of(1))]
    for row, networks, told in ((1, moved, True), (2, moved[:2], False)):
        connect(app, row)
        dialog = app.dialog("Encrypted Network")
        dialog.type("connect_key", "secret77")
        scan_again(d, app, SCAN_MS - 20)
        d.set_networks(*networks)
        dialog.press("gtk-ok")
        app.dialog(text=OFFER).press("gtk-no")
        app.wait_title(CONNECTING)
        assert app.networks() == []  # still the refresh's
        pass_time(d, app, 20)
        d.wait_command("iwlist")
        settle(app)
        pass_time(d, app, 80)
        if told:
            # It is found where it went, and the window is that of a connect again.
            argv = d.wait_command("iwset").argv
            assert argv[1:8] == ["wlan0", "essid", "home net", "mode", "Managed", "key", "secret77"]
            assert settle(app) == CONNECTING
            assert [one[4] for one in app.networks()] == ["Disconnect", "Disconnect", CONNECTING]
            assert not any(app.sensitive(name) for name in LOCKED)
            poll_link(d, app, 21)
            app.wait_state(2, "Not Connect")
            d.clear_commands()
        else:
            assert_gone(d, app)
    # A double click may connect again.
    app.click_row("view-press", 0, count=2, column=1)
    wait_commands(d, app)
    assert d.commands("iwset")[0].argv[3] == "cafe"


def test_a_hidden_network_keeps_its_typed_name(device):
    hidden = ("", "on", "7", "Master", address_of(1))
    d, app = chosen(device, "cafe", hidden, select=1)
    type_answer(app, app.dialog(text=HIDDEN), "attic")
    app.key("Return")
    # While the key is asked for: the list shows no name, OK connects all the same.
    dialog = app.dialog("Encrypted Network")
    d.set_networks(hidden, "cafe")
    scan_again(d, app)
    assert [row[0] for row in app.networks()] == ["", "cafe"]
    dialog.type("connect_key", "secret77")
    dialog.press("gtk-ok")
    # While the offer stands, and between Yes and the command.
    offer = app.dialog(text=OFFER)
    d.set_networks("cafe", hidden)
    scan_again(d, app)
    d.clear_commands()
    scan_again(d, app, SCAN_MS - 20)
    d.set_networks(hidden, "cafe", "new")
    offer.press("gtk-yes")
    app.wait_title(CONNECTING)
    pass_time(d, app, 20)
    d.wait_command("iwlist")
    settle(app)
    pass_time(d, app, 80)
    argv = d.wait_command("iwset").argv
    assert argv[1:8] == ["wlan0", "essid", "attic", "mode", "Managed", "key", "secret77"]
    assert (d.file("/tmp/essid_tmp"), d.file("/tmp/key_tmp")) == (b"attic\n", b"secret77\n")
    # The row has the name for the connect in hand.
    assert [(row[0], row[4]) for row in app.networks()] == [
        ("attic", CONNECTING), ("cafe", "Disconnect"), ("new", "Disconnect")]
    assert b"ESSID attic\n" in d.file("/etc/wireless-user.conf")
    assert GONE not in app.stderr()


def test_a_shorter_list_under_the_pollers(device):
    d, app = chosen(device, "cafe", "bar", ("zoo", "on"), select=2, files=MARKER)
    # The interface goes while the key is typed, so that "Active WIFI" can be pressed in the middle
    # of the connect.
    dialog = app.dialog("Encrypted Network")
    d.set_interfaces()
    dialog.type("connect_key", "secret77")
    dialog.press("gtk-ok")
    app.dialog(text=OFFER).press("gtk-no")
    app.wait_title(CONNECTING)
    app.press("button-active-device")
    wait_until(lambda: app.registry("window-proc-win"), "the checking window")
    d.set_interfaces("wlan0")
    d.set_networks("bar")
    pass_time(d, app, CHECK_MS)
    app.wait_title("Searching...")
    pass_time(d, app, SCAN_MS)
    d.wait_command("iwlist")
    settle(app)
    assert [row[4] for row in app.networks()] == ["Disconnect"]
    # The texts and controls follow as always, no row is anybody's.
    for _ in range(22):
        if "Not connect,return." not in app.stderr():
            pass_time(d, app, 2000)
    assert app.stderr().count("AP MAC[") == 21
    assert [row[4] for row in app.networks()] == ["Disconnect"]
    assert settle(app) == IDLE
    # The same with an access point that the list does not have.
    connect(app, 0)
    wait_commands(d, app)
    d.associate(address_of(7))
    d.address("10.0.0.5")
    poll_link(d, app)
    d.address("10.0.0.5")
    pass_time(d, app, 2000)
    app.wait_state(0, connected("10.0.0.5"))
