# SPDX-License-Identifier: MIT
"""What a person does where the kernel has no wireless extensions for the card, so that nothing but
its newer interface (nl80211) answers: shared by the groups in which that is so."""

import fcntl
import re
import socket

import air
import window as w
from air import network, run
from probe import wait_until
from steps import (answer_encrypted, check, connected_to, followed, linked, press_button,
                   press_connect, same, wanted_row, write_preferred)

SIOCGIWAP = 0x8B15
COMMANDS = "/usr/lib/wireless-lan/device"
KEYS = {"Market": "off", "Home Net": "on", "New Home": "on", "Old School": "on"}


def start():
    """An open network, one of WPA2, one of WPA3 and one of WEP, and the program."""
    air.access_point(1, 1, [network(b"Market", net=1),
                            network(b"Home Net", key="correct horse", net=2)], beacon=200)
    air.access_point(2, 6, [network(b"New Home", key="battery staple", net=3, wpa3=True),
                            network(b"Old School", wep="0102030405", net=4)], beacon=200)
    air.addresses(1, 2, 3, 4)
    w.begin()
    w.idle()


def refused(error):
    """The kernel refuses the older interface with this error, and everything that uses it fails."""
    with socket.socket(socket.AF_INET, socket.SOCK_DGRAM) as channel:
        try:
            fcntl.ioctl(channel, SIOCGIWAP, b"wlan0".ljust(32, b"\0"))
            found = 0
        except OSError as reason:
            found = reason.errno
    same(found, error, "the error of SIOCGIWAP")
    check("support scanning" in run("iwlist", "wlan0", "scan", check=False),
          "iwlist finds networks")
    check("wlan0" not in run("cat", "/proc/net/wireless", check=False), "wlan0 is in the list")


def address_is_told():
    """The command tells the access point that the scan lists."""
    told = run(f"{COMMANDS}/ap-address", "wlan0")
    same(told, linked() + "\n", "what ap-address prints")
    check(f"Address: {told.strip().upper()}\n" in run(f"{COMMANDS}/iwlist", "wlan0", "scan"),
          "the scan does not list it")


def the_interface_is_listed():
    same(re.findall(r"^ *(\w+):", run(f"{COMMANDS}/cat", "/proc/net/wireless"), re.M), ["wlan0"],
         "the interfaces")


def the_list_shows_every_network():
    rows = w.refresh_until(lambda now: {one[0] for one in now} == set(KEYS), "four networks")
    for name, mode, key, quality, state in rows:
        same((mode, key, state), ("Master", KEYS[name], "Disconnect"), f"the row of {name!r}")
        check(re.fullmatch(r"\d+/100", quality), f"the quality of {name!r} is {quality!r}")
    w.photograph("list")


def an_open_network():
    same(press_connect("Market"), connected_to(1), "the connected row")
    followed("2", "3", "4")
    address_is_told()


def a_refresh_finds_the_connected_network_again():
    w.refresh()
    row = wait_until(lambda: [one[0] for one in w.rows() if one[4].startswith("Connected\n")],
                     "a connected row")
    same(row, ["Market"], "the connected network")


def disconnect():
    w.select(wanted_row("Market"))
    press_button("gtk-disconnect")
    wait_until(lambda: all(one[4] == "Disconnect" for one in w.rows()), "no connected row")
    wait_until(lambda: not linked(), "the interface not associated")
    same(run(f"{COMMANDS}/ap-address", "wlan0"), "", "what ap-address prints")


def wpa2():
    press_connect("Home Net")
    answer_encrypted("correct horse", remember=False, index=1)
    connected_to(2)
    address_is_told()


def wpa3():
    press_connect("New Home")
    check(w.app.dialog("Encrypted Network").find("Authentication_ComboBox")["active"] == 1,
          "the dialog does not begin with WPA")
    answer_encrypted("battery staple", remember=False, index=1)
    connected_to(3)
    address_is_told()
    w.photograph("wpa3")


def wep():
    press_connect("Old School")
    check(w.app.dialog("Encrypted Network").find("Authentication_ComboBox")["active"] == 0,
          "the dialog does not begin with WEP")
    answer_encrypted("0102030405", remember=False)
    connected_to(4)
    address_is_told()


def the_second_of_the_preferred_networks_by_itself():
    run("/sbin/lnk-ifdown", "wlan0")
    write_preferred(network(b"Elsewhere", key="never heard of"),
                    network(b"Home Net", key="correct horse"), network(b"Market"))
    run("wireless-lan-auto", "--daemon", "wlan0")
    wait_until(lambda: "is looked after" in run("wireless-lan-auto", "--status", "wlan0",
                                                check=False), "the automatic", 60)
    # The user has left the last network by hand.
    run("wireless-lan-auto", "--now", "wlan0")
    wait_until(lambda: "inet 10.9.2." in run("ip", "-4", "addr", "show", "dev", "wlan0"),
               "an address of its network", 300)
    w.refresh_until(lambda now: w.connected_row(2) is not None, "a connected row")
    w.select(w.connected_row(2))
    wait_until(lambda: w.app.label("button-connect") == "gtk-disconnect", "the button")
    same(w.rows()[connected_to(2)][0], "Home Net", "the connected network")
    address_is_told()
    w.photograph("joined-by-itself")
    run("wireless-lan-auto", "--stop", "wlan0")


def the_window_closes_with_status_0():
    same(w.app.quit(), 0, "the status")


SCENARIOS = [
    the_interface_is_listed,
    the_list_shows_every_network,
    an_open_network,
    a_refresh_finds_the_connected_network_again,
    disconnect,
    wpa2,
    wpa3,
    wep,
    the_second_of_the_preferred_networks_by_itself,
    the_window_closes_with_status_0,
]
