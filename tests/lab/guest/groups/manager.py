# SPDX-License-Identifier: MIT
"""A machine whose wireless cards NetworkManager looks after: it lets go of one, keeps the other and
gets the first back."""

import os
import re

import air
import hwsim
from air import network, run, start
from commands import addresses, iwset, joined
from probe import wait_until
from steps import check, linked, same

PACKAGES = "network-manager udev dbus"
KEY = "correct horse"


def prepare():
    air.radios(3)
    hwsim.add_radio("wlan1")
    air.access_point(1, 1, [network(b"Market", net=1), network(b"Home Net", key=KEY, net=2)])
    air.addresses(1, 2)
    # What systemd and the installation scripts would have done.
    with open("/etc/passwd", "a") as file:
        file.write("messagebus:x:100:100::/nonexistent:/usr/sbin/nologin\n")
    with open("/etc/group", "a") as file:
        file.write("messagebus:x:100:\n")
    os.makedirs("/run/dbus", exist_ok=True)
    run("dbus-uuidgen", "--ensure")
    run("dbus-daemon", "--system", "--fork")
    run("/lib/systemd/systemd-udevd", "--daemon")
    run("udevadm", "trigger", "--action=add")
    run("udevadm", "settle", "--timeout=60")
    start("wpa_supplicant", "-u", "-O", "DIR=/run/wpa_supplicant GROUP=netdev",
          log="supplicant.log")
    start("NetworkManager", "--no-daemon", log="NetworkManager.log")
    wait_until(lambda: managed("wlan0") and managed("wlan1"), told, 120)


def state(card):
    """The number of NetworkManager's state of a card: 10 is unmanaged, 100 connected."""
    answer = run("nmcli", "-g", "GENERAL.STATE", "device", "show", card, check=False)
    return int(re.match(r"(\d*)", answer).group(1) or 0)


def managed(card):
    return state(card) >= 30


def told():
    return run("nmcli", "device", check=False)


def network_manager_joins_with_both_cards():
    for card in ("wlan0", "wlan1"):
        run("nmcli", "device", "wifi", "rescan", "ifname", card, check=False)
        wait_until(lambda: "Market" in run("nmcli", "-f", "SSID", "device", "wifi", "list",
                                           "ifname", card, check=False), "the network", 120)
        run("nmcli", "--wait", "90", "device", "wifi", "connect", "Market", "ifname", card,
            "name", f"Market with {card}")
        same(addresses(card), [1], f"the network of the address of {card}")


def a_join_takes_one_card_from_it():
    status, said = iwset("Home Net", KEY, "open")
    same((status, said), (0, "iwset: wlan0 is no longer managed by NetworkManager\n"),
         "the answer of iwset")
    joined(2)
    same((state("wlan0"), state("wlan1")), (10, 100), "NetworkManager's states of the cards")
    same((addresses("wlan1"), linked("wlan1")), ([1], "02:00:00:00:01:00"), "the other card")
    run("ping", "-c", "1", "-W", "10", "-I", "wlan1", "10.9.1.1")


def it_does_not_come_back_by_itself():
    run("nmcli", "device", "wifi", "rescan", "ifname", "wlan1", check=False)
    run("/sbin/lnk-ifdown", "wlan0")
    same((state("wlan0"), addresses("wlan0"), linked()), (10, [], None), "the card that was taken")
    same((state("wlan1"), addresses("wlan1")), (100, [1]), "the other card")


def released_it_is_network_managers_again():
    said = run("/sbin/lnk-ifdown", "--release", "wlan0")
    same(said, "lnk-ifdown: wlan0 is given back to NetworkManager\n", "the answer of lnk-ifdown")
    wait_until(lambda: managed("wlan0"), told, 60)
    run("nmcli", "--wait", "90", "connection", "up", "Market with wlan0")
    same(addresses("wlan0"), [1], "the network of the address")
    check(state("wlan0") == 100, told())


SCENARIOS = [
    network_manager_joins_with_both_cards,
    a_join_takes_one_card_from_it,
    it_does_not_come_back_by_itself,
    released_it_is_network_managers_again,
]
