# SPDX-License-Identifier: MIT
"""Every kind of access point by the commands alone: what iwset and lnk-ifup make of each."""

import os
import re

import air
import commands
from air import network, run
from commands import iwset, reason, supplicant
from probe import wait_until
from steps import check, same

KEY = "correct horse"
# 32 bytes, none of which is ASCII and most of which are no text at all.
ODD_NAME = b"\xff\xfe" * 16


def kind(name, net, *lines, key=None):
    """A network with further lines of hostapd.conf."""
    return {**network(name, net=net, key=key), "more": lines}


def wpa3(*lines):
    return ("wpa=2", "rsn_pairwise=CCMP", "ieee80211w=2", f"sae_password={KEY}", *lines)


NETWORKS = {
    1: [kind(b"WPA3", 1, *wpa3("wpa_key_mgmt=SAE")),
        kind(b"Mixed", 2, "wpa_key_mgmt=WPA-PSK SAE", "ieee80211w=1", "sae_require_mfp=1",
             f"sae_password={KEY}", key=KEY),
        kind(b"H2E", 3, *wpa3("wpa_key_mgmt=SAE", "sae_pwe=1")),
        kind(b"PMF", 4, "wpa_key_mgmt=WPA-PSK-SHA256", "ieee80211w=2", key=KEY)],
    2: [kind(b"OWE", 5, "wpa=2", "rsn_pairwise=CCMP", "wpa_key_mgmt=OWE", "ieee80211w=2"),
        kind(b"FT", 6, "wpa_key_mgmt=FT-PSK", "mobility_domain=a1b2", "nas_identifier=one",
             "ft_psk_generate_local=1", "ieee80211w=1", key=KEY),
        kind(ODD_NAME, 7),
        kind(b"Old", 8, "wpa_key_mgmt=WPA-PSK", key=KEY)],
}


def prepare():
    air.radios(4)
    for radio, networks in NETWORKS.items():
        air.access_point(radio, 1 + 5 * radio, networks)
    air.addresses(*range(1, 9))


def joined(net, management):
    commands.joined(net)
    same(re.findall(r"^key_mgmt=(.*)$", supplicant("status"), re.M), [management], "the management")


def join(name, net, management):
    same(iwset(name, KEY, "open"), (0, ""), "the answer of iwset")
    joined(net, management)


def wpa2():
    join("Old", 8, "WPA2-PSK")


def wpa3_alone():
    join("WPA3", 1, "SAE")
    print(supplicant("get_capability", "key_mgmt"), supplicant("get_capability", "modes"))


def wpa2_and_wpa3():
    join("Mixed", 2, "SAE")


def hash_to_element_alone():
    join("H2E", 3, "SAE")


def protected_management_frames_required():
    join("PMF", 4, "WPA2-PSK-SHA256")


def open_but_encrypted():
    same(iwset("OWE"), (0, ""), "the answer of iwset")
    joined(5, "OWE")


def fast_transition():
    join("FT", 6, "FT-PSK")


def the_listed_text_of_a_name_of_32_odd_bytes_joins_it():
    def listed():
        out = run("/usr/lib/wireless-lan/device/iwlist", "wlan0", "scan", check=False)
        found = re.findall(r'Address: 02:00:00:00:02:02\n +ESSID:"(.*)"\n', out)
        return found[0] if found else None
    run("/sbin/lnk-ifdown", "wlan0")
    run("ip", "link", "set", "wlan0", "up")
    wait_until(listed, "the odd name in the list", 60)
    text = listed()
    check(len(text) <= 127, f"the program keeps 127 bytes of {text!r}")
    same(iwset(text), (0, ""), "the answer of iwset")
    joined(7, "NONE")


def wrong_key(name):
    """A slow machine may find it only after iwset has returned."""
    status, said = iwset(name, "wrong horse", "open")
    check((status, said) in ((0, ""), (1, "iwset: the access point refuses the key\n")),
          f"iwset answers {status}, {said!r}")
    told = []

    def refused():
        if os.path.exists("/run/wireless-lan/wlan0/events"):
            with open("/run/wireless-lan/wlan0/events") as file:
                told[:] = [file.read()]
        return reason() == "wrong-key\n"
    wait_until(refused, lambda: f"the refusal in {reason()!r}, {told}", 90)
    wait_until(lambda: not run("pidof", "wpa_supplicant", check=False), "the supplicant's end", 20)


def a_wrong_key_of_wpa3():
    wrong_key("WPA3")


def a_wrong_key_of_wpa2():
    wrong_key("Old")


def a_wrong_key_of_both():
    wrong_key("Mixed")


def a_network_that_is_not_there():
    same(iwset("Nowhere", KEY, "open"), (0, ""), "the answer of iwset")
    same(reason(), "not-found\n", "the reason")


def a_soft_block_is_lifted():
    run("/sbin/lnk-ifdown", "wlan0")
    directory = "/sys/class/net/wlan0/phy80211"
    radio = next(name for name in os.listdir(directory) if name.startswith("rfkill"))
    with open(f"{directory}/{radio}/soft", "w") as file:
        file.write("1")
    join("Old", 8, "WPA2-PSK")


def a_disconnect_leaves_nothing():
    run("/sbin/lnk-ifdown", "wlan0")
    check(not run("pidof", "wpa_supplicant", check=False), "the supplicant still runs")
    check("Not connected" in run("iw", "dev", "wlan0", "link"), "the link is still there")


SCENARIOS = [
    wpa2,
    wpa3_alone,
    wpa2_and_wpa3,
    hash_to_element_alone,
    protected_management_frames_required,
    open_but_encrypted,
    fast_transition,
    the_listed_text_of_a_name_of_32_odd_bytes_joins_it,
    a_wrong_key_of_wpa3,
    a_wrong_key_of_wpa2,
    a_wrong_key_of_both,
    a_network_that_is_not_there,
    a_soft_block_is_lifted,
    a_disconnect_leaves_nothing,
]
