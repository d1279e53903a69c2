# SPDX-License-Identifier: MIT
"""The preferred networks joined in their order, without and against the user's hand.

The machine has no systemd: wireless-lan-auto is started as an init script or inittab does."""

import os
import re
import shutil
import signal
import time

import air
import hwsim
import window as w
from air import network, run
from probe import wait_until
from steps import (check, connected_to, linked, press_button, press_connect, same,
                   wanted_row, write_preferred)

# The window's file keeps the first word of a key, once it has been written again.
FIRST = network(b"First", key="the-first-key", net=1)
SECOND = network(b"Second", key="second-to-none", net=2)
THIRD = network(b"Third", net=3)
FOURTH = network(b"Fourth", net=4)
STATIONS = {"02:00:00:00:01:00": "First", "02:00:00:00:02:00": "Second",
            "02:00:00:00:03:00": "Third", "02:00:00:00:03:01": "Fourth"}
STATE = "/run/wireless-lan/wlan0"
LIST = "user_cell_list_front"


def prepare():
    air.radios(5)
    air.access_point(2, 6, [SECOND])
    air.access_point(3, 11, [THIRD, FOURTH])
    air.addresses(1, 2, 3, 4)
    write_preferred(FIRST, SECOND, THIRD)


def where():
    """The network that the kernel is associated with."""
    return STATIONS.get(linked())


def address():
    found = re.search(r"inet 10\.9\.(\d+)\.", run("ip", "-4", "addr", "show", "dev", "wlan0"))
    return int(found.group(1)) if found else None


def supplicant():
    """The number of the supplicant, and when it began, in seconds since the machine did."""
    with open(f"{STATE}/supplicant.pid") as file:
        number, ticks = file.read().split()
    return int(number), int(ticks) / os.sysconf("SC_CLK_TCK")


def uptime():
    """How long the machine has been on, in seconds."""
    with open("/proc/uptime") as file:
        return float(file.read().split()[0])


def start_of_the_machine(net, what, *tracer):
    """The automatic as the machine's start has it; tells how long an address takes."""
    begun = uptime()
    air.start(*tracer, "wireless-lan-auto", "--daemon", "wlan0")
    wait_until(lambda: address() == net, lambda: f"an address of {net}, there is {address()}", 300)
    now = uptime()
    print(f"auto: {what}: an address {now - begun:.1f} s after the start of the automatic, "
          f"{now - supplicant()[1]:.1f} s after that of the supplicant")


def end_of_the_machine():
    """What a machine that is switched off leaves of itself: nothing under /run."""
    # The automatic (auto.pid) first: it would see to the others' end.
    for entry in sorted(os.listdir(STATE)):
        if entry.endswith(".pid"):
            with open(f"{STATE}/{entry}") as file:
                try:
                    os.kill(int(file.read().split()[0]), signal.SIGKILL)
                except ProcessLookupError:
                    pass
    shutil.rmtree("/run/wireless-lan")
    run("ip", "link", "set", "wlan0", "down")
    run("ip", "addr", "flush", "dev", "wlan0")


def chosen_by():
    return run("wireless-lan-auto", "--status", "wlan0", check=False).split()[-1]


def the_second_is_joined_when_the_first_is_not_there():
    start_of_the_machine(2, "boot")
    same(where(), "Second", "the network")


def the_window_shows_it_connected():
    w.begin()
    w.idle()
    w.refresh_until(lambda now: any(one[0] == "Second" and one[4].startswith("Connected\n")
                                    for one in now), "the second is shown as connected")
    row = w.connected_row(2)
    same((w.rows()[row][0], address()), ("Second", 2), "the connected row and the address")
    w.select(row)
    wait_until(lambda: w.app.label("button-connect") == "gtk-disconnect", "the button")
    w.photograph("joined-by-itself")


def the_second_goes_away_and_the_third_is_joined():
    begun = time.monotonic()
    air.switch_off(2)
    wait_until(lambda: address() == 3, lambda: f"an address of 3, there is {address()}", 300)
    print(f"auto: loss: {time.monotonic() - begun:.1f} s until the next network's address")
    same(where(), "Third", "the network")


def the_first_appears_and_nothing_changes():
    air.access_point(1, 1, [FIRST])
    for _ in range(3):
        w.refresh_until(lambda now: "First" in [one[0] for one in now], "the first is listed")
        w.refresh()
        same(where(), "Third", "the network")


def a_network_joined_by_hand_stays():
    before = supplicant()[0]
    press_connect("Fourth")
    connected_to(4)
    same(chosen_by(), "hand", "who has chosen")
    check(supplicant()[0] != before, "the automatic's supplicant is still there")
    for _ in range(4):
        w.refresh()
        same((where(), address()), ("Fourth", 4), "the network and the address")
    same(len(run("pidof", "wpa_supplicant").split()), 1, "the number of supplicants")


def after_a_disconnect_nothing_is_joined():
    w.select(wanted_row("Fourth"))
    press_button("gtk-disconnect")
    wait_until(lambda: not linked(), "the interface to be left", 30)
    for _ in range(4):
        w.refresh()
        same((where(), address()), (None, None), "the network and the address")
    same(chosen_by(), "off", "who has chosen")


def a_new_start_of_the_machine_joins_the_second_again():
    air.switch_off(1)
    end_of_the_machine()
    air.access_point(2, 6, [SECOND])
    start_of_the_machine(2, "second boot")


def nothing_is_started_with_a_key():
    """No process list ever shows one, however short: every program is caught as it is started."""
    end_of_the_machine()
    tracer = ("strace", "-f", "-v", "-s", "4096", "-e", "trace=execve", "-o", "/tmp/started")
    start_of_the_machine(2, "traced boot", *tracer)
    run("pkill", "strace")
    with open("/tmp/started", "rb") as file:
        started = file.read()
    for name in (b"wpa_supplicant", b"wpa_cli", b"awk", b"udhcpc"):
        check(b'/' + name + b'", [' in started, f"{name} has not been seen")
    for one in (FIRST, SECOND):
        for key in (one["key"].encode(), one["key"].encode().hex().encode()):
            found = [line for line in started.splitlines() if key in line]
            same(found, [], f"what is started with the key of {one['name']}")


def a_card_that_is_pulled_and_put_in_again():
    hwsim.remove_radio(0, "wlan0")
    wait_until(lambda: not run("pidof", "wpa_supplicant", check=False), "the supplicant's end", 60)
    begun = time.monotonic()
    hwsim.add_radio("wlan0")
    wait_until(lambda: address() == 2, lambda: f"an address of 2, there is {address()}", 300)
    print(f"auto: card: {time.monotonic() - begun:.1f} s from the card to an address")


def the_order_of_the_window_is_taken_over():
    air.access_point(1, 1, [FIRST])
    before = supplicant()[0]
    w.app.press("button-network-configure")
    box = w.app.dialog("Preferred Network Setting")
    box.click_row(LIST, 2)
    wait_until(lambda: box.selected(LIST) == [2], "the third to be selected")
    for _ in range(2):
        box.press("gtk-go-up")
    wait_until(lambda: [row[0] for row in box.rows(LIST)][0] == "Third", "the third to be first")
    w.photograph("reordered")
    box.press("gtk-ok")
    box.wait_gone()
    wait_until(lambda: os.path.exists(f"{STATE}/next.conf"), "the list to be noticed", 60)
    w.refresh_until(lambda now: "First" in [one[0] for one in now], "the first is in reach")
    same((where(), address(), supplicant()[0]), ("Second", 2, before), "the connection")
    check(os.path.exists(f"{STATE}/next.conf"), "the list has been taken over at once")
    air.switch_off(2)
    wait_until(lambda: address() == 3, lambda: f"an address of 3, there is {address()}", 300)
    same(where(), "Third", "the network, with the first in reach,")


def an_address_comes_back_with_the_network():
    air.switch_off(3)
    air.switch_off(1)
    wait_until(lambda: address() is None, "the address to go", 60)
    air.access_point(3, 11, [THIRD, FOURTH])
    wait_until(lambda: address() == 3, lambda: f"an address of 3, there is {address()}", 300)


SCENARIOS = [
    the_second_is_joined_when_the_first_is_not_there,
    the_window_shows_it_connected,
    the_second_goes_away_and_the_third_is_joined,
    the_first_appears_and_nothing_changes,
    a_network_joined_by_hand_stays,
    after_a_disconnect_nothing_is_joined,
    a_new_start_of_the_machine_joins_the_second_again,
    nothing_is_started_with_a_key,
    a_card_that_is_pulled_and_put_in_again,
    the_order_of_the_window_is_taken_over,
    an_address_comes_back_with_the_network,
]
