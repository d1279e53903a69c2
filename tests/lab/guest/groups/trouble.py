# SPDX-License-Identifier: MIT
"""What goes wrong in the air."""

import air
import window as w
from air import network
from steps import (answer_encrypted, check, connected_to, followed, press_button, press_connect,
                   same, wanted_row)

def prepare():
    air.radios(5)
    air.access_point(1, 1, [network(b"Home Net", key="correct horse", net=2),
                            network(b"Silence")])
    air.access_point(2, 6, [network(b"Goer", net=3)])
    air.addresses(2, 3)
    w.begin()
    w.idle()


def explained(reason, picture):
    """The window says why; it is closed."""
    box = w.app.dialog(text=reason)
    w.photograph(picture)
    box.press("gtk-close")
    box.wait_gone()


def a_wrong_key_is_not_connected():
    row = press_connect("Home Net")
    answer_encrypted("wrong horse", remember=False, index=1)
    w.app.wait_state(row, "Not Connect", 120)
    followed("2", "2")
    explained("The access point refuses the key.", "wrong-key")
    w.idle()


def the_right_key_after_it():
    press_connect("Home Net")
    answer_encrypted("correct horse", remember=False, index=1)
    connected_to(2)
    followed("2", "3", "4")


def without_addresses_the_address_is_invalid():
    row = press_connect("Silence")
    w.app.wait_state(row, "Connected\nAcquire IP address...")
    w.app.wait_state(row, "Connected\nIP address invalid", 120)
    followed("2", "3")
    explained("No DHCP server has given an address.", "no-address")
    w.idle()
    same(w.app.label("button-connect"), "gtk-disconnect", "the button")


def an_access_point_that_goes_away():
    press_connect("Goer")
    connected_to(3)
    air.switch_off(2)
    # Its last beacons are remembered for half a minute.
    w.refresh_until(lambda now: "Goer" not in [one[0] for one in now], "it leaves the list")
    check(all(not one[4].startswith("Connected") for one in w.rows()), "a row is called connected")
    check(w.app.running(), "the program ended")


def an_access_point_that_comes_back():
    # The supplicant goes on looking for its network; a refresh finds it joined again.
    air.access_point(2, 6, [network(b"Goer", net=3)])
    w.refresh_until(lambda now: any(one[0] == "Goer" and one[4].startswith("Connected\n")
                                    for one in now), "it is joined again")


def an_access_point_that_is_gone_before_the_press():
    air.access_point(3, 11, [network(b"Passer", net=4)])
    row = wanted_row("Passer")
    air.switch_off(3)
    w.select(row)
    w.notices()
    press_button("gtk-connect")
    w.app.wait_state(row, "Not Connect", 120)
    followed("2", "2")
    explained("The network is out of reach.", "out-of-reach")
    w.idle()


SCENARIOS = [
    a_wrong_key_is_not_connected,
    the_right_key_after_it,
    without_addresses_the_address_is_invalid,
    an_access_point_that_goes_away,
    an_access_point_that_comes_back,
    an_access_point_that_is_gone_before_the_press,
]
