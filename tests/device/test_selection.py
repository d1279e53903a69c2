# SPDX-License-Identifier: MIT
"""Selecting a network with the pointer."""

import re

from connecting import (CONNECTING, IDLE, address_of, arrive, connect, connected, idle, pass_time,
                        poll_link, refresh, settle, wait_commands)
from harness import wait_until
from support.grammar import scan_text


def presses(app):
    """Counts of cells, selected row and interfaces at each press, as it printed them."""
    return [tuple(map(int, found)) for found in re.findall(
        r"WIRELESS-LAN-DEBUG: Cell count (-?\d+) index (-?\d+) interface count (-?\d+)$",
        app.stderr(), re.M)]


def selections(app):
    """The connecting and the selected row after each press."""
    return [tuple(map(int, found)) for found in re.findall(
        r"WIRELESS-LAN-DEBUG: connect_index=(-?\d+),my_wifi->cell_index=\[(-?\d+)\]$",
        app.stderr(), re.M)]


def press_below(app):
    """A press in the list, below its last row."""
    app.click("view-press", at=(1 / 2, 0.95))


def wait_selections(app, count):
    wait_until(lambda: len(selections(app)) == count, lambda: f"press {count}\n{app.stderr()}")
    settle(app)


def test_presses_follow_the_pointer(device):
    d, app = idle(device, "one", "two", "three")
    d.associate(address_of(1))
    d.address("192.168.7.23")
    refresh(d, app)
    app.wait_state(1, connected("192.168.7.23"))
    assert app.selected("view-press") == []

    # Each press moves the selection, and the button says what it would do with that row.
    for count, (row, button, label) in enumerate([
            (0, 1, "gtk-connect"), (1, 1, "gtk-disconnect"), (2, 1, "gtk-connect"),
            (1, 3, "gtk-disconnect"), (1, 1, "gtk-disconnect"), (1, 1, "gtk-disconnect")], 1):
        # Elsewhere in the row each time: a press in the same place would be a double click.
        app.click_row("view-press", row, button=button, column=count % 2)
        wait_selections(app, count)
        assert selections(app)[-1] == (1, row)
        assert app.label("button-connect") == label
        assert app.selected("view-press") == [row]
    assert presses(app) == [(3, -1, 1), (3, 0, 1), (3, 1, 1), (3, 2, 1), (3, 1, 1), (3, 1, 1)]

    # Below the last row the selection stays, and so does what the button says.
    press_below(app)
    wait_selections(app, 7)
    assert selections(app)[-1] == (1, 1) and presses(app)[-1] == (3, 1, 1)
    assert app.label("button-connect") == "gtk-disconnect"

    # Nothing of all this told the device anything.
    assert d.commands("iwset", "lnk-ifup", "lnk-ifdown") == []
    assert "double click" not in app.stdout()

    # A double click on the connected row only says so.
    app.click_row("view-press", 1, count=2, column=3)
    wait_until(lambda: app.stdout().endswith("double click the button"), app.stdout)
    assert app.label("button-connect") == "gtk-disconnect"
    pass_time(d, app, 1000)
    assert app.dialogs() == [] and d.commands("iwset", "lnk-ifdown") == []
    assert "Choice to Connect" not in app.stderr()


def test_double_click_connects_unless_a_connect_runs(device):
    d, app = idle(device, "one", "two")
    app.click_row("view-press", 1, count=2)
    wait_commands(d, app)
    assert d.commands("iwset")[0].argv[1:4] == ["wlan0", "essid", "two"]
    assert "WIRELESS-LAN-DEBUG: Choice to Connect index[1],count[2]\n" in app.stderr()

    # While it runs a double click on another row does nothing, and that row is selected.
    app.click_row("view-press", 0, count=2)
    wait_until(lambda: app.stdout().count("double click the button") == 2, app.stdout)
    assert settle(app) == CONNECTING
    assert app.stderr().count("Choice to Connect") == 1
    assert app.selected("view-press") == [0]
    assert app.label("button-connect") == "gtk-connect"

    # After a success it may connect again. (In another column: a third press in the same place soon
    # after two others would be a triple click.)
    arrive(d, app, 1)
    app.click_row("view-press", 0, count=2, column=1)
    wait_commands(d, app, 2)
    assert d.commands("iwset")[1].argv[3] == "one"

    # After a failure only the button does.
    d.dissociate()
    poll_link(d, app, 21)
    app.wait_title(IDLE)
    app.wait_state(0, "Not Connect")
    app.click_row("view-press", 1, count=2)
    wait_until(lambda: app.stdout().count("double click the button") == 4, app.stdout)
    settle(app)
    assert app.stderr().count("Choice to Connect") == 2
    assert app.sensitive("button-connect")
    connect(app, 1)
    wait_commands(d, app, 3)


def test_a_press_while_a_busy_window_manager_has_not_shown_the_window(device):
    d = device("none", rate=50, scan=scan_text("one"))
    with d.display.window_manager_asleep() as wake_after:
        app = d.start()
        app.wait_listed()
        wake_after(1.5)
        app.click_row("view-press", 0)
        wait_selections(app, 1)
    assert app.selected("view-press") == [0]


def test_presses_that_cannot_select(device):
    d, app = idle(device, "one")
    d.expect(r"CRITICAL \*\*: .*cb_view_sel: assertion 'my_wifi->cell_index>-1' failed$")
    d.expect(r"CRITICAL \*\*: .*cb_view_sel: assertion "
             r"'my_wifi->cell_count>0&&my_wifi->interface_count>0' failed$")

    # Below the rows with nothing selected.
    press_below(app)
    app.wait_printed("cb_view_sel: assertion 'my_wifi->cell_index>-1' failed\n")
    assert presses(app) == [(1, -1, 1)] and selections(app) == []

    # On a list that a scan left empty.
    d.set_scan("wlan0     No scan results\n")
    refresh(d, app)
    app.dialog(text="No Network").press("gtk-close")
    app.wait_title(IDLE)
    press_below(app)
    app.wait_printed("cb_view_sel: assertion "
                     "'my_wifi->cell_count>0&&my_wifi->interface_count>0' failed\n")
    assert len(presses(app)) == 1

    # Once the interface is gone, too, although the list is filled.
    d.set_networks("one")
    refresh(d, app)
    app.wait_listed()
    d.set_interfaces()
    app.press("button-refresh")
    app.dialog(text="No Wireless Device").press("gtk-close")
    settle(app)
    app.click("view-press")
    app.wait_printed("'my_wifi->cell_count>0&&my_wifi->interface_count>0' failed\n", 2)
    assert app.running() and d.commands("iwset") == []
