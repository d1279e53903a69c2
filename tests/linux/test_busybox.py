# SPDX-License-Identifier: MIT
"""Every command with busybox as the only userland, beside the tools of the network itself."""

import board
import joining
from machine import (GROUP, alive, calls, clients, in_busybox, ip_calls, note, run, settings,
                     static)
from scans import answer, numbered

PLAIN = b"wlan0: 0000    0     0     0"


def test_an_address_of_ones_own():
    joining.set_up()
    static()
    assert run("lnk-ifup", "wlan0", wrap=in_busybox()) == (0, b"", b"")
    assert b"-4 address add 10.1.2.3/24 broadcast 10.1.2.255 dev wlan0" in ip_calls()


def test_a_lease():
    joining.set_up("udhcpc")
    settings("iface wlan0\naddrtype dhcp\ndns auto\n" + GROUP)
    note("lease", "3: wlan0 inet 10.0.0.2/24")
    assert run("lnk-ifup", "wlan0", wrap=in_busybox()) == (0, b"", b"")
    assert len(calls("udhcpc")) == 1
    assert run("lnk-ifdown", "wlan0", wrap=in_busybox()) == (0, b"", b"")
    assert not any(alive(pid) for pid in clients())


def test_the_list_of_interfaces():
    joining.set_up()
    status, out, _ = run("cat", "/proc/net/wireless", wrap=in_busybox())
    assert (status, board.interfaces(out)) == (0, [b"wlan0"])
    assert PLAIN in out


def test_the_list_of_networks():
    joining.set_up("iwlist")
    names = ["Käse".encode(), b"a\"b$(id)", b"\xff\xfe"]
    note("scan", answer(numbered(names)))
    status, out, err = run("iwlist", "wlan0", "scan", wrap=in_busybox())
    assert (status, err) == (0, b"")
    assert [board.name_bytes(cell["essid"]) for cell in board.networks(out)] == names
