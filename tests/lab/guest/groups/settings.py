# SPDX-License-Identifier: MIT
"""Addresses by hand, a network of one's own."""

import air
import window as w
from air import FAR, network, run
from probe import wait_until
from steps import (check, connected_to, followed, host, open_settings, press_button, press_connect,
                   same, second_station, tick, wanted_row, write_addresses)


def prepare():
    air.radios(3)
    air.access_point(1, 1, [network(b"Market", net=1), network(b"Silence", net=9)])
    air.addresses(1)
    w.begin()
    w.idle()


def static_addresses_reach_beyond_the_gateway():
    press_connect("Market")
    connected_to(1)
    box = open_settings()
    write_addresses(box, "10.9.1.77", "255.255.255.0", "10.9.1.255", "10.9.1.1")
    w.photograph("settings")
    w.notices()
    box.press("gtk-ok")
    box.wait_gone()
    wait_until(lambda: "inet 10.9.1.77/24 brd 10.9.1.255" in
               run("ip", "-4", "addr", "show", "dev", "wlan0"), "the address")
    wait_until(lambda: "default via 10.9.1.1" in run("ip", "route"), "the gateway", 30)
    run("ping", "-c", "1", "-W", "10", air.BEYOND)
    followed("2", "4")
    w.idle()


def static_addresses_serve_a_network_without_any():
    # The same addresses for the next network: nobody there gives any.
    box = open_settings()
    write_addresses(box, "10.9.9.77", "255.255.255.0", "10.9.9.255", "10.9.9.1")
    w.notices()
    box.press("gtk-ok")
    box.wait_gone()
    followed("2", "4")
    press_connect("Silence")
    wait_until(lambda: ["Silence", "Connected\nIP Address:10.9.9.77"] in
               [[one[0], one[4]] for one in w.rows()], "the address", 90)
    wait_until(lambda: "default via 10.9.9.1" in run("ip", "route"), "the gateway", 30)
    run("ping", "-c", "1", "-W", "10", air.BEYOND)
    followed("2", "3", "4")
    w.idle()


def dhcp_again():
    w.select(wanted_row("Silence"))
    press_button("gtk-disconnect")
    wait_until(lambda: all(one[4] == "Disconnect" for one in w.rows()), "no row is connected")
    box = open_settings()
    tick(box, "dhcpwlan0")
    box.press("gtk-ok")
    box.wait_gone()
    press_connect("Market")
    connected_to(1)


def an_invalid_address_is_refused():
    before = open("/etc/wireless.conf").read()
    box = open_settings()
    write_addresses(box, "10.9.1.300", "255.255.255.0", "10.9.1.255", "10.9.1.1")
    box.press("gtk-ok")
    message = w.app.dialog(text="Settings invalid")
    message.press("gtk-ok")
    message.wait_gone()
    box.press("gtk-cancel")
    box.wait_gone()
    same(open("/etc/wireless.conf").read(), before, "/etc/wireless.conf")


def a_hosted_network_is_seen_and_joined_by_a_second_station():
    host("Our own", "10.9.77.1", "255.255.255.0", "10.9.77.255", "10.9.77.1")
    followed("3")
    check(not w.app.find("button-connect")["usable"], "Connect is sensitive")
    w.photograph("hosting")
    second_station("wlan2", "Our own", 77)


def from_hosting_back_to_a_network():
    run("iw", "dev", "wlan2", "ibss", "leave", netns=FAR)
    box = open_settings()
    tick(box, "adhoc-hostwlan0", False)
    tick(box, "dhcpwlan0")
    box.press("gtk-ok")
    box.wait_gone()
    wait_until(lambda: w.app.find("button-refresh")["usable"], "the window is idle", 90)
    w.refresh()
    press_connect("Market")
    connected_to(1)


SCENARIOS = [
    static_addresses_reach_beyond_the_gateway,
    static_addresses_serve_a_network_without_any,
    dhcp_again,
    an_invalid_address_is_refused,
    a_hosted_network_is_seen_and_joined_by_a_second_station,
    from_hosting_back_to_a_network,
]
