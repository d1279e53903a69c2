# SPDX-License-Identifier: MIT
"""With ears instead of eyes: the window is found by what a screen reader says, and used with keys
or through the actions that it offers. Nothing is asked of the probe once the window is there."""

import glob
import types

import air
import window as w
from air import network, run
from commands import addresses
from probe import Screen, wait_until
from probe.program import IDLE
from screen_reader import Reader, row, selected, value
from steps import linked, same

PACKAGES = "dbus-daemon at-spi2-core libatk-adaptor libgail-common gir1.2-atspi-2.0 python3-gi"
MAIN = "Wireless LAN"
KEY = "correct horse"
SEARCHING = "Searching..."
CONNECTING = "Connect network..."
ACQUIRING = "Connected\nAcquire IP address..."

reader = None


def prepare():
    global reader
    air.radios(3)
    air.access_point(1, 1, [network(b"Market", net=1), network(b"Home Net", key=KEY, net=2)])
    air.addresses(1, 2)
    # What the installation scripts would have done.
    run("dbus-uuidgen", "--ensure")
    compiler, = glob.glob("/usr/lib/*/glib-2.0/glib-compile-schemas")
    run(compiler, "/usr/share/glib-2.0/schemas")
    w.screen = Screen(":0")
    reader = Reader(types.SimpleNamespace(state="/lab", display=w.screen))
    # All goes over the bus, since the program can open no socket of its own there. Where it has
    # one, the client of Debian 12 (libatspi) asks a question from within an answer, and hangs.
    w.begin({**reader.environment, "XDG_RUNTIME_DIR": "/proc"})
    w.idle()


def networks():
    """The list of networks, and its rows by their names."""
    found = reader.find(reader.window(MAIN), IDLE, "table")
    count = found.get_table_iface().get_n_rows()
    return found, {one[0]: one for one in (row(found, number) for number in range(count))}


def press(name):
    """Presses a button of the main window without a key."""
    reader.heard.clear()
    button = reader.find(reader.window(MAIN), name, "push button")
    same(button.get_action_iface().do_action(0), True, f"the answer of {name}")


def choose(name):
    """Goes through the list until the network of this name is the selected one."""
    reader.go(reader.window(MAIN), IDLE, "table")
    found, rows = networks()
    if not selected(found):
        w.screen.key("Down")
        wait_until(lambda: selected(found), "a selected row")
    w.screen.key("Home")
    for wanted in rows:
        wait_until(lambda: [one[0] for one in selected(found)] == [wanted],
                   lambda: f"{wanted} to be selected: {selected(found)}")
        if wanted == name:
            return
        w.screen.key("Down")
    raise AssertionError(f"{name} is not in {rows}")


def connected(name, net):
    wait_until(lambda: networks()[1][name][4].startswith(f"Connected\nIP Address:10.9.{net}."),
               lambda: f"{name} to be connected: {networks()[1]}", 120)
    same(addresses(), [net], "the network of the address")
    run("ping", "-c", "1", "-W", "10", f"10.9.{net}.1")


def every_control_has_a_name():
    window = reader.window(MAIN)
    same(reader.nameless(window), [], "the controls without a name")
    for name in ("Refresh", "WLAN Setting", "Preferred Network", "Connect"):
        reader.go(window, name, "push button")


def refresh_by_its_action():
    def both():
        press("Refresh")
        reader.announced(SEARCHING, IDLE)
        return {"Market", "Home Net"} == set(networks()[1])
    wait_until(both, lambda: f"two networks, not {networks()[1]}", 120)
    same([networks()[1][name][2] for name in ("Market", "Home Net")], ["off", "on"], "their keys")


def connect_with_a_key_typed():
    choose("Home Net")
    reader.heard.clear()
    w.screen.key("Return")
    dialog = reader.window("Encrypted Network")
    same((dialog.get_description(), reader.nameless(dialog), reader.focus(dialog)),
         ("Home Net", [], ("Key", "text")), "the dialog's network, what has no name, the focus")
    reader.enter(dialog, "Key", KEY)
    same(value(reader.find(dialog, "Authentication", "combo box")), "WPA-PSK/WPA2-PSK",
         "the authentication")
    w.photograph("key")
    reader.press(dialog, "OK")
    offer = reader.window("Question")
    reader.enter(offer, "Alias:", "mine")
    w.screen.key("Return")
    reader.announced(CONNECTING, ACQUIRING, IDLE)
    connected("Home Net", 2)
    with open("/etc/wireless-user.conf") as file:
        same("ALIAS mine\nESSID Home Net\n" in file.read(), True, "the network in the list")


def disconnect_by_its_action():
    press("Disconnect")
    wait_until(lambda: not linked() and not addresses(), "the network to be left")
    wait_until(lambda: networks()[1]["Home Net"][4] == "Disconnect", "its row")


def connect_by_its_action():
    choose("Market")
    press("Connect")
    reader.announced(CONNECTING, ACQUIRING, IDLE)
    connected("Market", 1)
    w.photograph("connected")


SCENARIOS = [
    every_control_has_a_name,
    refresh_by_its_action,
    connect_with_a_key_typed,
    disconnect_by_its_action,
    connect_by_its_action,
]
