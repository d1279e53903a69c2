# SPDX-License-Identifier: MIT
"""More networks than the list holds."""

import re

import air
import window as w
from air import network, run
from probe import wait_until
from steps import check, connected_to, press_connect, same


def prepare():
    air.radios(7)
    number = 0
    # As much as real beacons hold, of which iwlist has no more than 64 KiB from the kernel.
    elements = (bytes([221, 198]) + b"\2\0\0" + bytes(195)) * 2
    for radio, channel, count in ((1, 1, 33), (2, 4, 33), (3, 6, 33), (4, 9, 33), (5, 11, 31)):
        names = [b"Network %03d" % (number + one) for one in range(count)]
        number += count
        air.access_point(radio, channel, [network(name, net=1 if name.endswith(b"000") else None)
                                          for name in names], beacon=200, elements=elements,
                         power=5 if radio == 5 else 20)
    air.addresses(1)
    w.begin()
    w.idle()


def of_163_networks_128_are_listed():
    wait_until(lambda: run("iw", "dev", "wlan0", "scan", check=False).count("\tSSID:") >= 163,
               "163 networks on the air")
    check("Argument list too long" in run("iwlist", "wlan0", "scan", "last", check=False),
          "the older interface holds them all")
    rows = w.refresh_until(lambda now: len(now) == 128, "a full list")
    levels = [int(one[3].split("/")[0]) for one in rows]
    same(levels, sorted(levels, reverse=True), "the order of the signals")
    listed = [one[0] for one in rows]
    same(len(listed), 128, "the number of rows")
    same(len(set(listed)), 128, "the number of different rows")
    check(all(re.fullmatch(r"Network \d{3}", one) for one in listed), f"the rows are {listed}")
    # All of them can be scrolled to: the list measures its rows little by little.
    wait_until(lambda: w.app.find(w.LIST)["rect"][3] > 128 * 12, "a list as high as its rows")
    w.photograph("crowd")


def one_of_them_is_joined():
    press_connect("Network 000")
    connected_to(1)


SCENARIOS = [
    of_163_networks_128_are_listed,
    one_of_them_is_joined,
]
