"""Records that change under an open dialog, a scheduled connect or a poller.

Pressing "Active WIFI" makes that happen without a hand on the main window, which an open dialog
keeps away: 6 s later the list is filled anew."""

from connecting import (CONNECTING, HIDDEN, IDLE, LOCKED, OFFER, address_of,
                        connect, connected, idle, pass_time, poll_link, preferred, settle,
                        wait_commands)
from harness import wait_until

MARKER = {"/etc/build_in_wifi": b""}
CHECK_MS, SCAN_MS = 6050, 100
GONE = "WIRELESS-LAN-DEBUG: the chosen network is gone, it is not connected\n"


def activated(device, *networks, select, **settings):
    """A device that lost its interface and looks for it again; the list is still the old one, and
    the row `select` the selected one."""
    settings["files"] = {**MARKER, **settings.get("files", {})}
    d, app = idle(device, *networks, **settings)
    # The end of a connect finds no interface, so that "Active WIFI" can be pressed.
    open_row = next(row for row, network in enumerate(networks) if isinstance(network, str))
    connect(app, open_row)
    wait_commands(d, app)
    app.click_row("view-press", select, column=1)
    lose_interface(d, app, open_row)
    return d, app


def lose_interface(d, app, row):
    """Ends the connect of a row without an interface, and looks for one again."""
    d.set_interfaces()
    poll_link(d, app, 21)
    app.wait_state(row, "Not Connect")
    app.press("button-active-device")
    wait_until(lambda: app.registry("window-proc-win"), "the checking window")
    d.set_interfaces("wlan0")
    d.clear_commands()


def scan_again(d, app, milliseconds=CHECK_MS):
    """The rest of the wait, and the refresh behind it."""
    pass_time(d, app, milliseconds)
    app.wait_title("Searching...")
    pass_time(d, app, SCAN_MS)
    d.wait_command("iwlist")
    settle(app)


def test_a_refresh_while_the_key_is_typed(device):
    d, app = activated(device, "cafe", ("home net", "on"), ("neighbour", "on"), select=1,
                       files=preferred(("", "neighbour", 1, 0, "their-key"),
                                       ("", "home net", 1, 0, "home-key"),
                                       ("", "neighbour", 1, 0, "their-other-key"),
                                       ("", "home net", 1, 0, "home-key-2")))
    app.press("button-connect")
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
    d, app = activated(device, "cafe", ("home net", "on"), select=1)
    app.press("button-connect")
    dialog = app.dialog("Encrypted Network")
    # The list is shorter; a namesake, and the access point under another name, are no home net.
    d.set_networks(("home net", "on", "7", "Master", address_of(8)))
    scan_again(d, app)
    dialog.type("connect_key", "secret77")
    dialog.press("gtk-ok")
    dialog.wait_gone()
    settle(app)
    pass_time(d, app, 60000)
    # The attempt is over: nothing told, nothing offered, everything usable.
    assert app.dialogs() == [] and d.commands("iwset", "lnk-ifup") == []
    assert settle(app) == IDLE
    for name in LOCKED:
        assert app.sensitive(name)
    connect(app, 0)
    assert app.dialog("Encrypted Network").text("connect_key") == ""


def test_a_refresh_while_the_offer_stands(device):
    d, app = activated(device, "cafe", ("home net", "on"), ("neighbour", "on"), select=1)
    app.press("button-connect")
    dialog = app.dialog("Encrypted Network")
    dialog.type("connect_key", "secret77")
    dialog.press("gtk-ok")
    offer = app.dialog(text=OFFER)
    d.set_networks(("neighbour", "on", "7", "Master", address_of(2)), "cafe")
    scan_again(d, app)
    offer.press("gtk-yes")
    offer.wait_gone()
    settle(app)
    # What is kept is what was chosen; nobody gets the key.
    rows = app.registered_rows("user_cell_list_backend")
    assert [row[1:5] for row in rows] == [["home net", "Managed", "ENC_OPEN", "secret77"]]
    pass_time(d, app, 60000)
    assert d.commands("iwset") == []
    assert settle(app) == IDLE


def test_a_refresh_while_the_name_is_asked(device):
    d, app = activated(device, "cafe", "", select=1)
    app.press("button-connect")
    question = app.dialog(text=HIDDEN)
    d.set_networks("cafe")
    scan_again(d, app)
    question.press("gtk-yes")
    question.wait_gone()
    settle(app)
    pass_time(d, app, 60000)
    assert d.commands("iwset") == [] and app.networks() == [
        ["cafe", "Master", "off", "70/100", "Disconnect"]]
    assert settle(app) == IDLE


def test_a_refresh_between_ok_and_the_command(device):
    d, app = activated(device, "cafe", ("home net", "on"), ("neighbour", "on"), select=1)
    for networks, told in (
            # Moved: it is found where it went. Gone: the controls come back.
            (["cafe", ("neighbour", "on", "7", "Master", address_of(2)),
              ("home net", "on", "7", "Master", address_of(1))], True),
            (["cafe", ("neighbour", "on", "7", "Master", address_of(2))], False)):
        app.press("button-connect")
        dialog = app.dialog("Encrypted Network")
        dialog.type("connect_key", "secret77")
        pass_time(d, app, CHECK_MS)
        app.wait_title("Searching...")
        d.set_networks(*networks)
        pass_time(d, app, SCAN_MS - 20)
        dialog.press("gtk-ok")
        app.dialog(text=OFFER).press("gtk-no")
        app.wait_title(CONNECTING)
        pass_time(d, app, 20)
        d.wait_command("iwlist")
        settle(app)
        pass_time(d, app, 80)
        if told:
            argv = d.wait_command("iwset").argv
            assert argv[1:8] == ["wlan0", "essid", "home net", "mode", "Managed", "key", "secret77"]
            app.click_row("view-press", 2, column=1)
            lose_interface(d, app, 2)
        else:
            app.wait_printed(GONE)
            assert settle(app) == IDLE
            for name in LOCKED:
                assert app.sensitive(name)
            pass_time(d, app, 60000)
            assert d.commands("iwset") == []
            # A double click may connect again.
            app.click_row("view-press", 0, count=2, column=1)
            wait_commands(d, app)
            assert d.commands("iwset")[0].argv[3] == "cafe"


def test_a_shorter_list_under_the_pollers(device):
    d, app = activated(device, "cafe", "bar", "zoo", select=2)
    app.press("button-connect")
    wait_commands(d, app)
    d.set_networks("bar")
    scan_again(d, app, CHECK_MS - 100)
    assert [row[4] for row in app.networks()] == ["Disconnect"]
    # The texts and controls follow as always, no row is anybody's.
    for _ in range(22):
        if app.stderr().count("Not connect,return.") < 2:
            pass_time(d, app, 2000)
    assert app.stderr().count("AP MAC[") == 42
    assert [row[4] for row in app.networks()] == ["Disconnect"]
    assert settle(app) == IDLE
    # The same with an access point that the list does not have.
    connect(app, 0)
    wait_commands(d, app, 2)
    d.associate(address_of(7))
    d.address("10.0.0.5")
    poll_link(d, app)
    d.address("10.0.0.5")
    pass_time(d, app, 2000)
    app.wait_state(0, connected("10.0.0.5"))
