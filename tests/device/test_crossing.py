# SPDX-License-Identifier: MIT
"""What is pending when something else is pressed, and how both end.

The sources that can be pending, and what a person can press while each is. Start-up jobs run before
a press is heard; rows connect nothing during a check, and Active WIFI does nothing then:

| Source                           | begun by                        | can be pressed meanwhile   |
|----------------------------------|---------------------------------|----------------------------|
| start-up jobs (idle)             | the first sight of the window   | nothing                    |
| scan, 100 ms                     | Refresh, start-up, Active WIFI  | nothing                    |
| check, 6050 ms                   | Active WIFI without a device    | rows, Active WIFI          |
| connect, 100 ms                  | Connect, a double click         | rows; Active WIFI when     |
|                                  |                                 | the device has gone        |
| link poller, 2000 ms             | the connect                     | the same                   |
| address poller, 2000 ms          | the link poller                 | the same                   |
| disconnect, 100 ms               | Connect on the connected row    | everything                 |
| follower of the settings, 4000 ms| OK in the settings              | everything                 |

Every press is tried on every source. Where it can be made it comes twice: so that what it begins
ends first, and so that the pending source does. After both, when nothing is pending any more,
rows, title, controls and commands must agree."""

import pytest

from connecting import (CONNECTING, IDLE, LOCKED, address_of, connected, idle, pass_time, poll_link,
                        preferred, settle, wait_commands)
from harness import wait_until
from harness.device import scan_text
from settings_page import CONF, Settings, dhcp

IP = "10.0.0.5"
HOST = "Ad-Hoc Host Mode"
NETWORKS = ("cafe", ("home net", "on"), "bar")
KEYS = {"cafe": "off", "home net": "home-key", "bar": "off", "board": "off"}
# The device joins what iwset asks for.
JOIN = 'case "$*" in *Ad-Hoc*) dissociate ;;\n' + "".join(
    f'*"{name}"*) associate {address_of(row)} ;;\n'
    for row, name in enumerate(("cafe", "home net", "bar"))) + "esac"
LIST = ("view-press", "button-connect", "button-refresh")
ALL = LOCKED + ("view-press",)


def living(device, **settings):
    """A device that joins what iwset asks for, connected with the first network."""
    files = {**preferred(("", "home net", 0, 0, "home-key")),
             CONF: dhcp(essid="board").encode(), **settings.pop("files", {})}
    d, app = idle(device, *NETWORKS, files=files, **settings)
    d.command("iwset", hook=JOIN)
    d.command("lnk-ifup", hook=f"address {IP} wlan0")
    d.command("lnk-ifdown", hook="dissociate; no-address wlan0")
    fresh(d, app)
    return d, app


def fresh(d, app):
    """Connected with the first network, nothing pending."""
    if settle(app) == HOST:
        settings = Settings(app)
        settings.toggle("adhoc-host")
        settings.ok()
        run_out(d, app)
    d.associate(address_of(0))
    d.address(IP)
    press(app, "button-refresh")
    pass_time(d, app, 100)
    app.wait_state(0, connected(IP))
    d.clear_commands()


def run_out(d, app):
    """Lets the time pass until nothing is pending."""
    for _ in range(4):
        pass_time(d, app, 50)
    quiet = 0
    while quiet < 2:
        before = len(app.stderr())
        pass_time(d, app, 4000)
        quiet = quiet + 1 if len(app.stderr()) == before else 0


HEARD = {"button-refresh": "Searching...", "button-connect": "Choice to Connect index["}


def heard(app, line, hand):
    """Does what makes the program print the line, and waits for that."""
    count = (app.stdout() + app.stderr()).count(line)
    hand()
    app.wait_printed(line, count + 1)
    settle(app)


def press(app, name):
    heard(app, HEARD[name], lambda: app.press(name))


# What begins a source; each gives the time that is left until it fires.
def scan(d, app):
    press(app, "button-refresh")
    return 100


def connect(d, app, row=2):
    app.click_row("view-press", row)
    press(app, "button-connect")
    return 100


def connect_with_key(d, app):
    connect(d, app, 1)
    dialog = app.dialog("Encrypted Network")
    dialog.press("gtk-ok")
    dialog.wait_gone()
    return 100


def link(d, app):
    d.command("iwset", hook="dissociate")  # as long as it takes
    connect(d, app)
    wait_commands(d, app)
    return 2000


def address(d, app):
    link(d, app)
    d.associate(address_of(2))
    poll_link(d, app)
    return 2000


def disconnect(d, app):
    return connect(d, app, 0)


def follow(d, app):
    Settings(app).ok()
    settle(app)
    return 4000


def host(d, app):
    settings = Settings(app)
    settings.toggle("adhoc-host")
    settings.ok()
    settle(app)
    return 4000


PRESSES = {"button-refresh": [scan], "button-connect": [connect, connect_with_key, disconnect],
           "button-wifi-settings": [follow, host]}


def agree(d, app, what):
    """What must hold when nothing is pending."""
    title, rows = settle(app), app.networks()
    states = [row[4] for row in rows]
    assert app.dialogs() == [], what
    assert [row[0] for row in rows] == ["cafe", "home net", "bar"], what
    hosting = b"wifigroup 1\n" in d.file(CONF)
    assert title == (HOST if hosting else IDLE), what
    for name in ALL:
        assert app.sensitive(name) is not (hosting and name in LIST), (what, name)
    if not hosting:
        # Only the network of the access point is shown as connected, and the record is the row's.
        shown = [row for row, state in enumerate(states) if state.startswith("Connected")]
        assert all(d.state_file("ap").split()[:1] == [address_of(row).encode()] for row in shown), \
            (what, states, d.state_file("ap"))
        assert len(shown) <= 1 and "Connect network..." not in states, (what, states)
        heard(app, "connect_index=", lambda: app.click_row("view-press", 0))
        index = int(app.stderr().rpartition("connect_index=")[2].split(",")[0])
        assert shown in ([], [index]), (what, shown, index)
    for one in d.commands("iwset"):
        essid, key = (one.argv[one.argv.index(word) + 1] for word in ("essid", "key"))
        assert key == KEYS[essid], (what, one.argv)


def test_presses_while_something_is_pending(device):
    d, app = living(device)
    # None of these leaves anything to press but rows.
    for source in (scan, connect, link, address):
        fresh(d, app)
        source(d, app)
        for name in LOCKED + ("button-active-device",):
            assert not app.sensitive(name), (source.__name__, name)
        if source is not scan:
            # Nor does a double click connect.
            heard(app, "double click the button", lambda: app.click_row("view-press", 1, count=2))
            assert app.dialogs() == []
        run_out(d, app)
        d.command("iwset", hook=JOIN)
        agree(d, app, source.__name__)
    for source in (disconnect, follow):
        for name, others in PRESSES.items():
            for other in others:
                for source_first in (False, True):
                    what = (source.__name__, other.__name__, source_first)
                    fresh(d, app)
                    left = source(d, app)
                    assert app.sensitive(name), what
                    if source_first and left > 100:
                        pass_time(d, app, left - 50)
                    elif source_first:
                        pass_time(d, app, left - 1)
                    other(d, app)
                    run_out(d, app)
                    agree(d, app, what)
    # The desktop's last word fits.
    assert d.states()[-1] in (2, 3, 4, 5)


def test_a_poller_that_ends_during_a_refresh(device):
    """It leaves list, title and controls to the refresh."""
    d, app = living(device)
    follow(d, app)
    pass_time(d, app, 3950)
    d.set_scan(scan_text())
    press(app, "button-refresh")
    assert app.networks() == []
    pass_time(d, app, 50)
    app.wait_printed("acquire address successed.")
    assert settle(app) == "Searching..." and app.networks() == []
    for name in ALL + ("button-active-device",):
        assert not app.sensitive(name), name
    pass_time(d, app, 50)
    box = app.dialog(text="No Network")
    assert app.networks() == []
    box.press("gtk-close")
    box.wait_gone()
    assert settle(app) == IDLE and app.networks() == []
    for name in ALL:
        assert app.sensitive(name), name
    assert d.states()[-2:] == [4, 5]


def test_nothing_begins_while_the_device_is_looked_for(device):
    """The controls come back with the answer, not with a chain that ends meanwhile."""
    d, app = living(device, files={"/etc/build_in_wifi": b""})
    # The interface goes while the key is typed, so that "Active WIFI" can be pressed.
    d.command("iwset", hook=":")
    d.dissociate()
    app.click_row("view-press", 1)
    press(app, "button-connect")
    dialog = app.dialog("Encrypted Network")
    d.set_interfaces()
    dialog.press("gtk-ok")
    app.wait_title(CONNECTING)
    pass_time(d, app, 100)
    poll_link(d, app, 18)
    app.press("button-active-device")
    wait_until(lambda: app.registry("window-proc-win"), "the checking window")
    d.set_interfaces("wlan0")
    # The connect ends 6 s later, and the answer comes 50 ms behind that.
    poll_link(d, app, 3)
    app.wait_state(1, "Not Connect")
    assert settle(app) == IDLE
    for name in LOCKED:
        assert not app.sensitive(name), name
    d.clear_commands()
    # Nor does a double click connect (after a connect that failed none does; the next one may).
    heard(app, "double click the button", lambda: app.click_row("view-press", 2, count=2))
    assert app.dialogs() == [(None, ["Checking,please wait..."])] and d.commands("iwset") == []
    pass_time(d, app, 49)
    assert not any(app.sensitive(name) for name in LOCKED)
    pass_time(d, app, 1)
    app.wait_title("Searching...")
    pass_time(d, app, 100)
    app.wait_listed()
    run_out(d, app)
    agree(d, app, "check")


def give_the_group(d, app, route):
    """Makes the record say that a network is hosted, in a window that selects networks."""
    if route == "changed from outside":
        d.write(CONF, dhcp(host=1, essid="board"))
    elif route == "not written":
        # Off again in the window, while the file still says on.
        host(d, app)
        settings = Settings(app)
        settings.toggle("adhoc-host")
        d.sh("mount --bind /etc /etc && mount -o remount,ro,bind /etc")
        settings.pane.press("gtk-ok")
        app.dialog(text="The settings could not be saved.").press("gtk-ok")
        settings.pane.wait_gone()
        d.sh("umount /etc")
    Settings(app).cancel()
    assert settle(app) == IDLE


@pytest.mark.parametrize("route", ["came after the start", "changed from outside", "not written"])
def test_a_connect_that_gets_no_address_gives_the_controls_back(device, route):
    """Also when the settings were looked at, and speak of a hosted network."""
    if route == "came after the start":
        d = device("none", rate=50, scan=scan_text(*NETWORKS),
                   files={CONF: dhcp(host=1, essid="board").encode()})
        d.set_interfaces()
        app = d.start()
        app.dialog(text="No Wireless Device").press("gtk-close")
        d.set_interfaces("wlan0")
        app.press("button-refresh")
        app.wait_listed()
        d.clock.rate = 0
    else:
        d, app = living(device)
        d.dissociate()
        d.address(None)
    give_the_group(d, app, route)
    d.command("iwset", hook=f"associate {address_of(2)}")
    d.command("lnk-ifup", hook=":")
    d.clear_commands()
    connect(d, app)
    wait_commands(d, app)
    poll_link(d, app)
    for _ in range(22):
        pass_time(d, app, 2000)
    app.wait_printed("WIRELESS-LAN-DEBUG: acquire address failed.\n")
    app.wait_state(2, "Connected\nIP address invalid")
    assert settle(app) == IDLE
    for name in ALL:
        assert app.sensitive(name), name
