"""A radio that appears after the program."""

import air
import window as w
from air import network, until
from steps import connected_to, press_connect, same


def prepare():
    w.begin()


def without_a_radio_it_says_so():
    box = w.dialog("No Wireless Device")
    w.photograph("no-device")
    w.press_in(box, "gtk-close")
    w.gone(box)
    same(w.title(), "No Wireless Device", "the title")
    same(w.rows(), [], "the list")


def an_absent_radio_is_waited_for_and_missed():
    # The marker of a built-in radio: the program switches it on and looks again 6 s later.
    open("/etc/build_in_wifi", "w").close()
    w.press(w.widget("button-active-device"))
    w.dialog("Checking,please wait...")
    box = w.dialog("Can not found any WIFI device.")
    w.press_in(box, "gtk-ok")
    w.gone(box)


def a_radio_that_appears_late_is_found():
    w.press(w.widget("button-active-device"))
    w.dialog("Checking,please wait...")
    air.radios(3)
    air.access_point(1, 1, [network(b"Market", net=1)])
    air.addresses(1)
    until(lambda: not any("Checking,please wait..." in w.texts(one) for one in w.windows()),
          "the checking window closes", 60)
    # The search began before the window closed.
    w.idle()
    press_connect("Market")
    connected_to(1)


SCENARIOS = [
    without_a_radio_it_says_so,
    an_absent_radio_is_waited_for_and_missed,
    a_radio_that_appears_late_is_found,
]
