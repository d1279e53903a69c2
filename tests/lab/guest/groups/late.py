# SPDX-License-Identifier: MIT
"""A radio that appears after the program."""

import air
import window as w
from air import network
from steps import connected_to, press_connect, same

NOT_FOUND = ("Can not found any WIFI device.\n"
             "Please confim that you have a WIFI device (either built-in or USB WIFI).")


def prepare():
    w.begin()


def without_a_radio_it_says_so():
    box = w.app.dialog(text="No Wireless Device")
    w.photograph("no-device")
    box.press("gtk-close")
    box.wait_gone()
    same(w.title(), "No Wireless Device", "the title")
    same(w.rows(), [], "the list")


def an_absent_radio_is_waited_for_and_missed():
    # The marker of a built-in radio: the program switches it on and looks again 6 s later.
    open("/etc/build_in_wifi", "w").close()
    w.app.press("button-active-device")
    w.app.dialog(text="Checking,please wait...")
    box = w.app.dialog(text=NOT_FOUND)
    box.press("gtk-ok")
    box.wait_gone()


def a_radio_that_appears_late_is_found():
    w.app.press("button-active-device")
    checking = w.app.dialog(text="Checking,please wait...")
    air.radios(3)
    air.access_point(1, 1, [network(b"Market", net=1)])
    air.addresses(1)
    checking.wait_gone(60)
    # The search began before the window closed.
    w.idle()
    press_connect("Market")
    connected_to(1)


SCENARIOS = [
    without_a_radio_it_says_so,
    an_absent_radio_is_waited_for_and_missed,
    a_radio_that_appears_late_is_found,
]
