# SPDX-License-Identifier: MIT
"""Every kind of network."""

import os
import re

import air
import window as w
from air import network, run
from probe import wait_until
from steps import (answer_encrypted, check, connected_to, followed, linked, press_button,
                   press_connect, same, wanted_row)

# A name that would do harm if a shell read it, as long as a name can be less one byte.
SHELL_NAME = b"$(touch /tmp/x)\"\\';&|<`>/tmp/y`"
SHELL_KEY = "it's `id` \"$HOME\" \\ ; & #"
UTF8_NAME = "Café Zürich Москва"


def prepare():
    air.radios(5)
    air.access_point(1, 1, [
        network(b"Market", net=1),
        network(b"Home Net", key="correct horse", net=2),
        network(UTF8_NAME.encode(), net=3),
        network(SHELL_NAME, key=SHELL_KEY, net=4),
        network(b"Cellar", key="hidden treasure", hidden=True, net=5),
    ])
    air.access_point(2, 6, [network(b"Twins", net=6)])
    air.access_point(3, 11, [network(b"Twins", net=7),
                             network(b"Old School", wep="0102030405", net=8)])
    air.addresses(*range(1, 9))
    w.begin()
    w.idle()


def the_list_shows_every_network():
    wanted = {"Market": "off", "Home Net": "on", UTF8_NAME: "off", SHELL_NAME.decode(): "on",
              "": "on", "Twins": "off", "Old School": "on"}
    rows = w.refresh_until(
        lambda now: {one[0] for one in now} == set(wanted)
        and [one[0] for one in now].count("Twins") == 2 and len(now) == 8, "eight networks")
    w.photograph("list")
    for name, mode, key, quality, state in rows:
        same(key, wanted[name], f"the key of {name!r}")
        check(mode in ("Master", "Managed"), f"the mode of {name!r} is {mode!r}")
        check(re.fullmatch(r"\d+/\d+", quality), f"the quality of {name!r} is {quality!r}")
        same(state, "Disconnect", f"the state of {name!r}")
    w.notices()
    w.refresh()
    followed("5")


def an_open_network_gives_an_address():
    row = press_connect("Market")
    same(connected_to(1), row, "the connected row")
    followed("2", "3", "4")
    w.photograph("open")


def a_refresh_finds_the_connected_network_again():
    w.refresh()
    wait_until(lambda: w.connected_row(1) is not None, "the connected row", 10)
    same(w.rows()[w.connected_row(1)][0], "Market", "the connected network")


def disconnect_leaves_the_network():
    w.select(wanted_row("Market"))
    w.notices()
    press_button("gtk-disconnect")
    wait_until(lambda: all(one[4] == "Disconnect" for one in w.rows()), "no row is connected")
    followed("2")
    wait_until(lambda: w.app.label("button-connect") == "gtk-connect", "the button")
    wait_until(lambda: not linked(), "the interface is not associated", 20)
    same(run("ip", "-4", "-o", "addr", "show", "dev", "wlan0"), "", "the address")
    check(run("pidof", "wpa_supplicant", check=False) == "", "the supplicant still runs")


def wpa2_with_a_blank_in_its_name():
    row = press_connect("Home Net")
    answer_encrypted("correct horse", remember=True, index=1, alias="At home")
    same(connected_to(2), row, "the connected row")
    followed("2", "3", "4")
    same(linked(), "02:00:00:00:01:01", "the access point")
    with open("/etc/wireless-user.conf") as file:
        check("correct horse" in file.read(), "the preferred network's key was not kept")
    w.refresh()
    w.photograph("wpa2")


def its_key_is_for_root_alone():
    for pid in filter(str.isdigit, os.listdir("/proc")):
        try:
            with open(f"/proc/{pid}/cmdline", "rb") as file:
                check(b"correct horse" not in file.read(), f"process {pid} was given the key")
        except FileNotFoundError:
            pass
    for top in ("/etc", "/run", "/tmp", "/var"):
        found = run("grep", "-rlsI", "correct horse", top, check=False).split()
        for path in found:
            if path.startswith(("/tmp/hostapd", "/tmp/screen")):
                continue
            hidden = os.stat(path).st_mode & 0o077 == 0
            check(hidden, f"{path}, which holds the key, has mode {os.stat(path).st_mode:o}")
            check(not path.startswith("/var/log"), f"{path} holds the key")


def a_remembered_network_by_double_click():
    w.select(wanted_row("Home Net"))
    press_button("gtk-disconnect")
    wait_until(lambda: all(one[4] == "Disconnect" for one in w.rows()), "no row is connected")
    w.notices()
    w.app.click_row(w.LIST, wanted_row("Home Net"), count=2)
    answer_encrypted(None, index=1)
    connected_to(2)
    followed("2", "3", "4")


def from_one_network_straight_to_another():
    row = press_connect("Market")
    same(connected_to(1), row, "the connected row")
    followed("2", "3", "4")


def wep_with_the_first_key():
    press_connect("Old School")
    answer_encrypted("0102030405", remember=False)
    connected_to(8)
    followed("2", "3", "4")


def a_hidden_network_by_the_name_typed():
    press_connect("")
    box = w.app.dialog(text="The essid is empty,Please input the Essid: ")
    box.type("GtkEntry", "Cellar")
    box.press("gtk-yes")
    answer_encrypted("hidden treasure", remember=False, index=1)
    connected_to(5)
    followed("2", "3", "4")
    same(linked(), "02:00:00:00:01:04", "the access point")


def a_utf8_name():
    press_connect(UTF8_NAME)
    connected_to(3)
    same(linked(), "02:00:00:00:01:02", "the access point")
    w.photograph("utf8")


def a_name_and_a_key_of_shell_characters():
    press_connect(SHELL_NAME.decode())
    answer_encrypted(SHELL_KEY, remember=True, index=1, alias="`id`")
    connected_to(4)
    same(linked(), "02:00:00:00:01:03", "the access point")
    for name in ("x", "y"):
        check(not os.path.exists(f"/tmp/{name}"), "the name was run as a command")
    with open("/tmp/essid_tmp", "rb") as file:
        same(file.read(), SHELL_NAME + b"\n", "/tmp/essid_tmp")
    with open("/tmp/key_tmp") as file:
        same(file.read(), SHELL_KEY + "\n", "/tmp/key_tmp")
    same(os.stat("/tmp/key_tmp").st_mode & 0o777, 0o600, "the mode of /tmp/key_tmp")


def two_access_points_of_one_name():
    w.refresh_until(lambda now: [one[0] for one in now].count("Twins") == 2, "both are listed")
    press_connect("Twins")
    wait_until(lambda: any(one[4].startswith("Connected\nIP Address:10.9.") and one[0] == "Twins"
                           for one in w.rows()), "one of them to give an address", 90)
    w.idle()
    w.refresh_until(lambda now: [one[0] for one in now].count("Twins") == 2, "both are listed")
    state = [one[4] for one in w.rows() if one[0] == "Twins"]
    # The address tells which of the two it is.
    net = {"02:00:00:00:02:00": 6, "02:00:00:00:03:00": 7}[linked()]
    check(sorted(one.startswith(f"Connected\nIP Address:10.9.{net}.") for one in state)
          == [False, True], f"their states are {state}")


def the_window_closes_with_status_0():
    same(w.app.quit(), 0, "the status")


SCENARIOS = [
    the_list_shows_every_network,
    an_open_network_gives_an_address,
    a_refresh_finds_the_connected_network_again,
    disconnect_leaves_the_network,
    wpa2_with_a_blank_in_its_name,
    its_key_is_for_root_alone,
    a_remembered_network_by_double_click,
    from_one_network_straight_to_another,
    wep_with_the_first_key,
    a_hidden_network_by_the_name_typed,
    a_utf8_name,
    a_name_and_a_key_of_shell_characters,
    two_access_points_of_one_name,
    the_window_closes_with_status_0,
]
