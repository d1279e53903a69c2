# SPDX-License-Identifier: MIT
"""lnk-ifdown: what it leaves, and what it forgets."""

import os

import pytest

import joining
from joining import iwset, iwset_wpa
from machine import STATE, alive, calls, make_interfaces, run, supplicants


@pytest.fixture(autouse=True)
def every_join_succeeds():
    joining.set_up("iw")


def test_network_is_left_and_its_key_forgotten():
    iwset_wpa("home net", "12345678")
    assert run("lnk-ifdown", "wlan0") == (0, b"", b"")
    assert not alive(supplicants()[-1])
    assert [b" ".join(call) for call in calls("iw")] == [b"iw dev wlan0 disconnect",
                                                         b"iw dev wlan0 ibss leave"]
    assert sorted(os.listdir(STATE)) == ["choice", "lock"]
    assert run("lnk-ifdown", "wlan0") == (0, b"", b""), "twice"


def test_interface_that_has_gone():
    iwset("home net")
    make_interfaces()
    assert run("lnk-ifdown", "wlan0")[0] == 0
    assert not alive(supplicants()[-1])


@pytest.mark.parametrize("words", [(), ("wlan0", "x"), ("",), ("a/b",), ("-a",)])
def test_refused_words(words):
    assert run("lnk-ifdown", *words)[0] == 2
