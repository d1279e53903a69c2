# SPDX-License-Identifier: MIT
"""The network list: the refresh and its states, the match with the access point, the rows."""

import pytest

from harness import wait_until
from support.grammar import scan_text

CONTROLS = ["button-network-configure", "button-connect", "button-wifi-settings", "button-refresh",
            "view-press", "button-active-device"]
TITLE = "Wireless network selection"
HOSTING = (b"iface wlan0\naddrtype dhcp\ndns auto\nwifigroup 1\nESSID box\nMODE Ad-Hoc\nKEY \n"
           b"Encryption off\n")


def controls(app):
    """Which of the six can be used, as a row of + and -, and the title."""
    window = app.tree()
    return ("".join("+" if window.find(name)["sensitive"] else "-" for name in CONTROLS),
            window.find("title-label")["text"])


def wait_controls(app, *wanted):
    wait_until(lambda: controls(app) == wanted, lambda: f"{wanted}; they are {controls(app)}")


def states(app):
    return [row[4] for row in app.networks()]


def test_controls_during_a_refresh(device):
    d = device("street", rate=0)
    app = d.start()
    # No time passes: the scan, 100 ms away, does not come.
    wait_controls(app, "------", "Searching...")
    assert app.networks() == []
    assert d.commands("iwlist") == [] and d.states() == []
    d.clock.advance(99)
    wait_until(lambda: app.ask("registry view-press"), "the main loop")
    assert d.commands("iwlist") == []
    d.clock.advance(1)
    wait_controls(app, "+++++-", TITLE)
    assert len(app.networks()) == 8 and d.states() == [5]

    app.click_row("view-press", 2)
    wait_until(lambda: app.selected("view-press") == [2], "the selection")
    app.press("button-refresh")
    wait_controls(app, "------", "Searching...")
    assert app.networks() == []
    d.clock.advance(100)
    wait_controls(app, "+++++-", TITLE)
    assert app.selected("view-press") == []
    assert d.states() == [5, 5]

    # The selection is forgotten, not only undone.
    app.press("button-connect")
    app.dialog(text="Select a Network First").press("gtk-close")
    assert d.commands("iwset") == []
    assert app.quit() == 0


def test_no_interface_leaves_the_controls(device):
    d = device("street")
    app = d.start()
    app.wait_listed()
    d.set_interfaces()
    app.press("button-refresh")
    dialog = app.dialog(text="No Wireless Device")
    assert controls(app) == ("+++++-", "No Wireless Device")
    props = app.props(dialog.tree())["properties"]
    assert props["message-type"] == "info" and props["destroy-with-parent"]
    assert props["transient-for"]["id"] == app.tree()["id"]
    assert [one["label"] for one in dialog.all(type="GtkButton")] == ["gtk-close"]
    assert len(app.networks()) == 8, "the rows stay"
    assert "No interface" not in app.stderr()
    dialog.press("gtk-close")
    app.wait_printed("WIRELESS-LAN-DEBUG: No interface\n")
    assert controls(app) == ("+++++-", "No Wireless Device")
    assert len(d.commands("iwlist")) == 1 and d.states() == [5]
    d.set_interfaces("wlan0")
    app.refresh()
    assert app.quit() == 0


def test_no_network(device):
    d = device("none")
    app = d.start()
    dialog = app.dialog(text="No Network")
    assert controls(app) == ("+++++-", "No Network")
    assert app.props(dialog.tree())["properties"]["message-type"] == "info"
    dialog.press("gtk-close")
    wait_controls(app, "+++++-", TITLE)
    assert app.networks() == []
    assert d.commands("iwlist")[0].argv == ["iwlist", "wlan0", "scan"]
    # A press on the empty list is refused with the check's own words.
    d.expect(r"cb_view_sel: assertion .my_wifi->cell_count>0&&my_wifi->interface_count>0. failed")
    app.click("view-press")
    app.wait_printed("my_wifi->cell_count>0&&my_wifi->interface_count>0")
    assert app.quit() == 0


def test_hosting_neither_scans_nor_notifies(device):
    d = device("street", files={"/etc/wireless.conf": HOSTING})
    app = d.start()
    wait_controls(app, "+-+--+", "Ad-Hoc Host Mode")
    wait_until(lambda: d.notices(), "the first notice")
    app.press("button-active-device")
    app.wait_printed("WIRELESS-LAN-DEBUG: Searching...\n", 2)
    assert controls(app) == ("+-+--+", "Ad-Hoc Host Mode")
    assert d.commands("iwlist") == [] and d.states() == []
    assert app.stdout() == "buffer=wifigroup 1\r\n"
    assert app.quit() == 0


def test_what_a_refresh_prints(device):
    d = device("street")
    d.set_networks(("one", "off", "70/100"), ("two", "on", "3/100", "Ad-Hoc"), ("", "any"))
    d.associate("02:00:00:00:00:02")
    d.address("192.168.7.23")
    app = d.start()
    app.wait_listed()
    debug = "WIRELESS-LAN-DEBUG: "
    printed = app.stderr()
    assert printed[printed.index(debug + "get cell start"):] == "".join([
        debug, "get cell start...\n",
        debug, "FIND CELL[0]\n", debug, "Address:02:00:00:00:00:01\n", debug, "ESSID:one\n",
        debug, "Mode:Master\n", debug, "Frequency:2.437\n", debug, "quality:70/100\n",
        debug, "key:0\n",
        debug, "FIND CELL[1]\n", debug, "Address:02:00:00:00:00:02\n", debug, "ESSID:two\n",
        debug, "Mode:Ad-Hoc\n", debug, "Frequency:2.437\n", debug, "quality:3/100\n",
        debug, "key:1\n",
        debug, "FIND CELL[2]\n", debug, "Address:02:00:00:00:00:03\n", debug, "ESSID:\n",
        debug, "Mode:Master\n", debug, "Frequency:2.437\n", debug, "quality:70/100\n",
        debug, "key:2\n",
        debug, "Detect Linked Acess Pointer:02:00:00:00:00:02\n",
        debug, "address:192.168.7.23\n",
        debug, "Match_AP_MAC:02:00:00:00:00:02,address:02:00:00:00:00:02\n",
        debug, "connect_index[1] BUFFER:Connected\nIP Address:192.168.7.23\n",
        debug, "matched connect info:state [1],essid:[two]"])
    assert printed.count(debug + "Searching...\n") == 1
    assert app.stdout() == "my_wifi->interface_count = 1\n"
    assert app.networks() == [
        ["one", "Master", "off", "70/100", "Disconnect"],
        ["two", "Ad-Hoc", "on", "3/100", "Connected\nIP Address:192.168.7.23"],
        ["", "Master", "any", "70/100", "Disconnect"]]
    assert app.quit() == 0


def test_match_with_the_access_point(device):
    d = device("street")
    app = d.start()
    app.wait_listed()
    assert states(app) == ["Disconnect"] * 8, "nobody"

    d.associate("02:00:00:00:00:03")
    app.refresh()
    assert states(app) == (["Disconnect"] * 2 + ["Connected\nIP address invalid"] +
                           ["Disconnect"] * 5)
    d.address("10.11.12.13")
    app.refresh()
    assert states(app)[2] == "Connected\nIP Address:10.11.12.13"

    # An access point that the scan does not name.
    d.associate("02:00:00:00:00:99")
    app.refresh()
    assert states(app) == ["Disconnect"] * 8

    # The same address twice: the last one. In small letters: another one.
    d.associate("02:00:00:00:0A:01")
    d.set_networks(*[(name, "off", "70/100", "Master", mac) for name, mac in (
        ("first", "02:00:00:00:0A:01"), ("last", "02:00:00:00:0A:01"),
        ("small", "02:00:00:00:0a:01"))])
    app.refresh()
    assert states(app) == ["Disconnect", "Connected\nIP Address:10.11.12.13", "Disconnect"]
    app.click_row("view-press", 1)
    wait_until(lambda: app.label("button-connect") == "gtk-disconnect", "the button to follow")
    app.click_row("view-press", 0)
    wait_until(lambda: app.label("button-connect") == "gtk-connect", "the button to follow")
    assert app.quit() == 0


@pytest.mark.parametrize("scenario, kept", [("128", 128), ("129", 128)])
def test_as_many_as_there_is_room_for(device, scenario, kept):
    d = device(scenario)
    app = d.start()
    rows = app.wait_listed()
    assert [row[0] for row in rows] == [f"network {number:03}" for number in range(1, kept + 1)]
    app.click_row("view-press", kept - 1)
    wait_until(lambda: app.selected("view-press") == [kept - 1], "the last row")
    assert app.quit() == 0


HOSTILE = [
    "<b>&amp;</b>", "%s%n%p%d", "$(touch /tmp/run)`touch /tmp/run`", '"; touch /tmp/run; "',
    "back\\slash 'quote' \\n", "\ufffd\ufffd\ufffd\ufffd broken \ufffd",
    "\u202e right to left \u0631\u0627", "\U0001f98a\U0001f3f3\ufe0f\u200d\U0001f308",
    "ü" * 63, "tab\there \x01\x1b[31m red", "_mnemonic _File", "-n --help", "one",
    "\\x00\\x00\\x00\\x00", "", ""]


def test_hostile_names(device):
    d = device("hostile-names")
    app = d.start()
    rows = app.wait_listed()
    assert [row[0] for row in rows] == HOSTILE
    for number in range(len(HOSTILE)):
        app.click_row("view-press", number)
        wait_until(lambda: app.selected("view-press") == [number], f"row {number}")
    assert d.file("/tmp/run") is None
    assert app.quit() == 0


def test_any_scan_text(device):
    """What the tool prints is whatever it is: garbage, nothing, too much."""
    d = device("street")
    app = d.start()
    app.wait_listed()
    network = scan_text(("home", "on"))

    for garbage in (b"", bytes(range(256)) * 64, b"Cell" * 100_000, b"\0" * 5000 + b"\n",
                    b"Cell\0Address:x\n" * 3):
        d.set_scan(garbage)
        scans = len(d.commands("iwlist"))
        app.press("button-refresh")
        d.wait_command("iwlist", scans + 1)
        wait_until(lambda: app.dialogs() or app.sensitive("button-refresh") and app.networks(),
                   "an outcome")
        if app.dialogs():
            app.dialog(text="No Network").press("gtk-close")
        assert len(app.networks()) <= 3
        app.wait_title(TITLE)

    d.set_scan(b"x" * 1_000_000 + b"\n" + network)
    assert [row[0] for row in app.refresh()] == ["home"]
    d.set_scan(scan_text(*[f"net {number}" for number in range(10_000)]))
    assert len(app.refresh()) == 128
    d.set_scan(network.replace(b"\n", b"\r\n"))
    assert [row[:4] for row in app.refresh()] == [["home", "Master", "on", "70/100"]]
    assert app.quit() == 0


def test_commands_that_fail(device):
    d = device("street")
    app = d.start()
    app.wait_listed()

    def no_network():
        app.press("button-refresh")
        app.dialog(text="No Network").press("gtk-close")
        app.wait_title(TITLE)
        assert app.networks() == []

    d.command("iwlist", missing=True)
    no_network()
    d.command("iwlist", status=1, stdout="", stderr="wlan0  Network is down\n")
    no_network()
    # A status that tells of failure does not matter when there is text.
    d.command("iwlist", status=3)
    d.command("ifconfig", missing=True)
    assert len(app.refresh()) == 8
    d.command("ifconfig")
    d.command("cat", missing=True)
    app.press("button-refresh")
    app.dialog(text="No Wireless Device").press("gtk-close")
    assert app.stdout().endswith("my_wifi->interface_count = -1\n")
    d.command("cat")
    # A scan that takes its time.
    d.command("iwlist", delay=0.7)
    assert len(app.refresh()) == 8
    assert app.quit() == 0


def test_the_scan_cannot_be_started(device):
    d = device("connected")
    app = d.start()
    before = app.wait_listed()
    in_use = max(app.descriptors())
    d.set_networks("another")
    limit = ["prlimit", "--pid", str(app.inner_pid)]
    d.sh(" ".join(limit + [f"--nofile={in_use + 1}:"]))
    app.press("button-refresh")
    d.wait_states(5, 5)
    assert app.wait_listed() == [row[:4] + ["Disconnect"] for row in before]
    assert app.stderr().count("\npipe: Too many open files\n") == 2, "discovery and scan"
    d.sh(" ".join(limit + ["--nofile=1024:"]))
    assert [row[0] for row in app.refresh()] == ["another"]
    assert app.quit() == 0


def test_the_interface_vanishes_before_the_scan(device):
    d = device("street", rate=0)
    app = d.start()
    wait_controls(app, "------", "Searching...")
    d.sh("ip link delete wlan0")
    d.clock.advance(100)
    app.dialog(text="No Network").press("gtk-close")
    wait_controls(app, "+++++-", TITLE)
    assert app.quit() == 0


def test_kernel_list(device):
    """The kernel's list in all its forms; the first interface is the one in use."""
    d = device("17-interfaces")
    app = d.start()
    app.wait_listed()
    assert app.stdout() == "my_wifi->interface_count = 16\n"
    assert d.commands("iwlist")[-1].argv == ["iwlist", "wlan0", "scan"]

    header = "Inter-| sta-\n face | tus\n"
    for text, count in (("", -1), ("no header\n", -1), (header, 0), (header[:-1], 0)):
        d.set_wireless(text)
        app.press("button-refresh")
        app.dialog(text="No Wireless Device").press("gtk-close")
        app.wait_printed("WIRELESS-LAN-DEBUG: No interface\n")
        wait_until(lambda: app.stdout().endswith(f"\nmy_wifi->interface_count = {count}\n"), count)
    # The last line without its end, a name of 15, one of nobody's.
    for line, name in (("wlan3: 0000", "wlan3"), ("  wlan4: 0\n", "wlan4"),
                       ("\t wlan5 :x\n\n", "wlan5"), ("a23456789012345: 0\n", "a23456789012345")):
        d.set_wireless(header + line)
        scans = len(d.commands("iwlist"))
        app.press("button-refresh")
        assert d.wait_command("iwlist", scans + 1).argv == ["iwlist", name, "scan"]
        if name[0] == "a":
            app.dialog(text="No Network").press("gtk-close")
        app.wait_title(TITLE)
    assert app.quit() == 0


def test_names_that_no_interface_has(device):
    """Nothing is run for a name that the kernel cannot give, or that a shell would read."""
    d = device("street")
    app = d.start()
    app.wait_listed()
    for name in ("a;touch /tmp/run", "$(id)", "`id`", "a b", "a'b", "-x", "..", "a/b", "a|b", ""):
        d.clear_commands()
        d.set_wireless(f"Inter-| sta-\n face | tus\n {name}: 0000\n")
        app.press("button-refresh")
        app.dialog(text="No Network").press("gtk-close")
        app.wait_title(TITLE)
        assert [one.argv for one in d.commands()] == [["cat", "/proc/net/wireless"]], name
    skipped = "WIRELESS-LAN-DEBUG: no usable interface name, skipping the scan\n"
    assert app.stderr().count(skipped) == 10
    assert d.file("/tmp/run") is None
    assert app.quit() == 0
