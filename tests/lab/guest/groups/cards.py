# SPDX-License-Identifier: MIT
"""Radios that come and go, two of them, and some that can do less than others."""

import re

import air
import hwsim
import window as w
from air import FAR, network, run
from commands import addresses, iwset, joined, reason
from probe import wait_until
from steps import answer_encrypted, check, connected_to, host, linked, press_connect, same

KEY = "correct horse"
DEFAULTS = "/etc/default/wireless-lan"
# The numbers of the radios on this side: the first of the machine and what was plugged in since.
radio = {"wlan0": 0}


def prepare():
    air.radios(4)
    air.access_point(1, 1, [
        network(b"Market", net=1),
        {**network(b"Home Net", key=KEY, net=2), "more": ["ieee80211w=1"]},
        {**network(b"Strict", key=KEY, net=4), "more": ["ieee80211w=2"]}])
    air.addresses(1, 2, 3, 4)
    w.begin()
    w.idle()


def plug_in(card, **what):
    radio[card] = hwsim.add_radio(card, **what)


def unplug(card):
    hwsim.remove_radio(radio.pop(card), card)


def defaults(*lines):
    with open(DEFAULTS, "w") as file:
        file.writelines(f"{line}\n" for line in lines)


def the_radio_is_unplugged_while_connected():
    press_connect("Market")
    connected_to(1)
    unplug("wlan0")
    w.app.press("button-refresh")
    box = w.app.dialog(text="No Wireless Device")
    w.photograph("unplugged")
    box.press("gtk-close")
    box.wait_gone()
    same((w.title(), w.app.running()), ("No Wireless Device", True), "the title")


def plugged_in_again_it_is_back_in_its_network():
    plug_in("wlan0")
    w.refresh()
    w.refresh_until(lambda now: w.connected_row(1) is not None, "the network and its address")
    w.select(w.connected_row(1))
    connected_to(1)
    same(len(run("pidof", "wpa_supplicant").split()), 1, "the number of supplicants")


def routes():
    return sorted(re.findall(r"^default via 10\.9\.(\d+)\.1 dev (\S+)", run("ip", "route"), re.M))


def each_of_two_cards_has_its_network():
    plug_in("wlan1")
    same(iwset("Home Net", KEY, "open", card="wlan1"), (0, ""), "the answer of iwset")
    joined(2, card="wlan1")
    same((addresses("wlan0"), routes()), ([1], [("1", "wlan0"), ("2", "wlan1")]),
         "the first card's address and the routes")
    same(linked(), "02:00:00:00:01:00", "the first card's access point")
    run("/sbin/lnk-ifdown", "wlan1")
    same((addresses("wlan1"), addresses("wlan0"), routes()), ([], [1], [("1", "wlan0")]),
         "the addresses and routes after the second card has left")
    run("ping", "-c", "1", "-W", "10", "-I", "wlan0", "10.9.1.1")


def the_window_works_with_the_card_that_is_named():
    defaults("INTERFACE=wlan1")
    w.refresh()
    press_connect("Home Net")
    answer_encrypted(KEY, remember=False, index=1)
    connected_to(2, card="wlan1")
    same((addresses("wlan0"), linked()), ([1], "02:00:00:00:01:00"), "the first card")
    w.photograph("second-card")


def the_card_that_is_named_is_unplugged():
    unplug("wlan1")
    w.app.press("button-refresh")
    box = w.app.dialog(text="No Wireless Device")
    box.press("gtk-close")
    box.wait_gone()
    same((addresses("wlan0"), linked()), ([1], "02:00:00:00:01:00"), "the first card")
    defaults()
    w.refresh()
    wait_until(lambda: w.connected_row(1) is not None, "the first card's network in the list")


def country():
    return re.findall(r"^country (\w\w):", run("iw", "reg", "get"), re.M)[0]


def a_network_of_5_ghz_in_the_country_that_is_named():
    # Without a country nobody may be an access point there.
    same(country(), "00", "the country")
    defaults("COUNTRY=DE")
    w.refresh()
    wait_until(lambda: country() == "DE", "the country in the kernel")
    air.access_point(2, 36, [network(b"Fast", key=KEY, net=3, wpa3=True)])
    press_connect("Fast")
    answer_encrypted(KEY, remember=False, index=1)
    connected_to(3)
    check("freq: 5180" in run("iw", "dev", "wlan0", "link"), "the link is not at 5180 MHz")
    w.photograph("5-ghz")


def a_driver_that_protects_no_management_frames():
    """It can join where they may be protected, but not where they have to be."""
    unplug("wlan0")
    plug_in("wlan0", ciphers=(hwsim.WEP40, hwsim.WEP104, hwsim.TKIP, hwsim.CCMP))
    same(iwset("Home Net", KEY, "open"), (0, ""), "the answer of iwset")
    joined(2)
    status, _ = iwset("Strict", KEY, "open")
    check(reason() != "wrong-key\n", f"the right key is called wrong, iwset answers {status}")
    same(addresses(), [], "the address in a network that cannot be joined")


def a_driver_without_ad_hoc_hosts_as_an_access_point():
    run("/sbin/lnk-ifdown", "wlan0")
    unplug("wlan0")
    plug_in("wlan0", iftypes=hwsim.STATION | hwsim.ACCESS_POINT)
    check("IBSS" not in hwsim.modes("wlan0"), f"the driver can be {hwsim.modes('wlan0')}")
    host("Our own", "10.9.77.1", "255.255.255.0", "10.9.77.255", "10.9.77.1")
    wait_until(lambda: "type AP" in run("iw", "dev", "wlan0", "info"), "the access point")
    w.photograph("hosting")
    run("ip", "link", "set", "wlan3", "up", netns=FAR)
    wait_until(lambda: "SSID: Our own" in run("iw", "dev", "wlan3", "scan", netns=FAR,
                                              check=False), "a second station sees it", 90)
    run("iw", "dev", "wlan3", "connect", "Our own", netns=FAR)
    wait_until(lambda: "Connected to" in run("iw", "dev", "wlan3", "link", netns=FAR),
               "the second station is in")
    run("busybox", "udhcpc", "-i", "wlan3", "-n", "-q", "-f", netns=FAR)
    told = run("ip", "-4", "addr", "show", "dev", "wlan3", netns=FAR)
    check("inet 10.9.77.1" in told, f"the second station's address: {told}")
    run("ping", "-c", "1", "-W", "10", "10.9.77.1", netns=FAR)


SCENARIOS = [
    the_radio_is_unplugged_while_connected,
    plugged_in_again_it_is_back_in_its_network,
    each_of_two_cards_has_its_network,
    the_window_works_with_the_card_that_is_named,
    the_card_that_is_named_is_unplugged,
    a_network_of_5_ghz_in_the_country_that_is_named,
    a_driver_that_protects_no_management_frames,
    a_driver_without_ad_hoc_hosts_as_an_access_point,
]
