# SPDX-License-Identifier: MIT
"""What the desktop reads on the root window."""

STRING, BYTES, REPLACE = 31, 8, 0


def test_the_bytes_on_the_root_window(device):
    d = device("connected")
    app = d.start()
    app.wait_listed()
    changes = [one for one in d.display.root_changes() if one[0].startswith("_NET_WIFI")]
    process = str(app.inner_pid).encode()
    assert changes == [("_NET_WIFI_STOP_CHECK", STRING, BYTES, REPLACE, process),
                       ("_NET_WIFI_CHANGE_STATUS", STRING, BYTES, REPLACE, b"5")]
    debug = "WIRELESS-LAN-DEBUG: send_atom_to_desktop [{}]\n"
    printed = app.stderr()
    assert printed.count("send_atom_to_desktop") == 2
    assert printed.index(debug.format("_NET_WIFI_STOP_CHECK")) < \
        printed.index(debug.format("_NET_WIFI_CHANGE_STATUS"))

    # Disconnecting sends 2; only the last value stays.
    app.click_row("view-press", 1)
    app.press("button-connect")
    d.wait_states(5, 2)
    assert d.display.root_property("_NET_WIFI_CHANGE_STATUS") == b"2"
    assert app.quit() == 0
    assert d.display.root_property("_NET_WIFI_CHANGE_STATUS") == b"2"
    assert d.display.root_property("_NET_WIFI_STOP_CHECK") == process


def test_scanning_is_told_before_the_scan_ends(device):
    d = device("street")
    d.command("iwlist", hook="while [ ! -e /device/state/go ]; do sleep 0.01; done")
    app = d.start()
    d.wait_states(5)
    assert d.display.root_property("_NET_WIFI_CHANGE_STATUS") == b"5"
    d.sh(": >/device/state/go")
    app.wait_listed()
    assert app.quit() == 0
