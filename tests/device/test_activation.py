# SPDX-License-Identifier: MIT
"""Switching the built-in module on: the checking window, the wait, the second look."""

import re

from connecting import LOCKED
from harness import wait_until

MARKER = {"/etc/build_in_wifi": b""}
MISSING = ("Can not found any WIFI device.\nPlease confim that you have a WIFI device (either "
           "built-in or USB WIFI).")
CHECKING = "Checking,please wait..."


def checking(app):
    return [one for one in app.windows() if one["name"] == "window-proc-win"]


def wait_checking(app):
    wait_until(lambda: checking(app) and checking(app)[0]["mapped"], "the checking window")


def test_without_the_marker_the_refresh_starts_at_once(device):
    d = device("street", rate=0)
    app = d.start()
    app.wait_title("Searching...")
    assert d.file("/proc/kv/iwifi") == b""
    # Discovery of the loading and of the refresh, none of the activation.
    assert [one.name for one in d.commands()] == ["cat", "ifconfig", "cat"]
    assert app.quit() == 0


def test_an_interface_that_is_there_needs_no_switch(device):
    d = device("street", files=MARKER)
    app = d.start()
    app.wait_listed()
    assert d.file("/proc/kv/iwifi") == b""
    assert checking(app) == []
    assert [one.name for one in d.commands()] == ["cat", "ifconfig", "cat", "cat", "ifconfig",
                                                  "iwlist"]
    assert app.quit() == 0


def test_switching_on(device):
    d = device("powered-off", rate=0)
    app = d.start()
    wait_checking(app)
    window, = checking(app)
    assert app.props(window)["properties"]["type"] == "popup"
    assert app.props(window)["properties"]["window-position"] == "center"
    assert window.texts() == [CHECKING]
    assert app.props(window.find(type="GtkLabel"))["properties"]["justify"] == "center"
    assert app.props(window.find(type="GtkLabel"))["packing"]["expand"] is False
    box = app.props(window.find(type="GtkVBox"))["properties"]
    assert box["homogeneous"] is False and box["spacing"] == 0
    x, y, width, height = window["rect"]
    assert abs(2 * x + width - app.display.width) <= 1
    assert abs(2 * y + height - app.display.height) <= 1
    assert app.registry("window-proc-win")["id"] == window["id"]
    assert d.file("/proc/kv/iwifi") == b"1\n"
    assert app.exists() and app.sensitive("button-active-device"), "the window stays alive"
    looks = len(d.commands("cat"))
    # Nothing else can be started meanwhile.
    assert not any(app.sensitive(name) for name in LOCKED)

    # A second press during the wait does nothing.
    app.press("button-active-device")
    d.clock.advance(6049)
    app.click("view-press")  # heard after both
    d.expect("cb_view_sel: assertion")
    app.wait_printed("cb_view_sel: assertion")
    assert len(checking(app)) == 1 and len(d.commands("cat")) == looks
    assert app.stdout() == ""

    d.clock.advance(1)
    app.wait_title("Searching...")
    assert checking(app) == []
    assert re.fullmatch(r"proc_win=0x[0-9a-f]+\nmy_wifi->interface_count = 1\n", app.stdout())
    assert not app.sensitive("button-active-device")
    d.clock.advance(100)
    assert len(app.wait_listed()) == 3
    assert not app.sensitive("button-active-device")
    assert d.notices() == [("_NET_WIFI_STOP_CHECK", str(app.inner_pid)),
                           ("_NET_WIFI_CHANGE_STATUS", "5")]
    d.clock.advance(60_000)  # one attempt, no second timer
    assert app.quit() == 0
    assert app.stdout().count("proc_win") == 1


def test_no_module(device):
    d = device("no-interface", rate=100, files=MARKER)
    app = d.start()
    for attempt in (1, 2):
        box = app.dialog(text=MISSING)
        # The answer gives the controls back.
        assert all(app.sensitive(name) for name in LOCKED)
        props = app.props(box.tree())["properties"]
        assert props["message-type"] == "info" and props["modal"] and props["transient-for"] is None
        assert [one["label"] for one in box.all(type="GtkButton")] == ["gtk-ok"]
        assert app.stdout().count("proc_win=0x") == attempt
        assert checking(app) == []
        box.press("gtk-ok")
        box.wait_gone()
        assert d.commands("iwlist", "ifconfig") == [] and d.states() == []
        assert app.networks() == []
        assert app.text("title-label") == "Wireless network selection"
        if attempt == 1:
            app.press("button-active-device")

    # A device that is plugged in later.
    d.set_interfaces("wlan0")
    d.set_networks("late")
    d.sh("add-interface wlan0")
    app.press("button-active-device")
    assert app.wait_listed()[0][0] == "late"
    assert not app.sensitive("button-active-device")
    assert app.quit() == 0


def test_a_switch_that_cannot_be_written_to(device):
    d = device("no-interface", rate=100, files=MARKER)
    d.sh("rm /proc/kv/iwifi && rmdir /proc/kv")
    app = d.start()
    app.dialog(text=MISSING).press("gtk-ok")
    assert app.quit() == 0


def test_closing_during_the_wait(device):
    d = device("powered-off", rate=0)
    app = d.start()
    wait_checking(app)
    assert app.quit() == 0
