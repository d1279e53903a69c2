# SPDX-License-Identifier: MIT
"""iwset called as the program calls it, and what its supplicant is given."""

import re

import machine
from machine import choose, make_wlan0, note, read, run

CONNECTED = "wpa_state=COMPLETED\n"
HANDSHAKE = "bssid=02:00:00:00:00:01\nssid=x\nwpa_state=4WAY_HANDSHAKE\n"
LISTED = "network id / ssid / bssid / flags\n0\tx\tany\t[CURRENT]\n"
DISABLED = "network id / ssid / bssid / flags\n0\tx\tany\t[CURRENT][TEMP-DISABLED]\n"


def arguments(name, key="off", enc="off", mode="Managed", index="[1]", wpa=False):
    words = ["wlan0", "essid", name, "mode", mode, "key", key, "enc", enc]
    return ["wpa", *words] if wpa else [*words, *([index] if index else [])]


def iwset(name, *words, shell=None, wrap=(), **more):
    return run("iwset", *arguments(name, *words, **more), shell=shell, wrap=wrap)


def iwset_wpa(name, key, enc="open", **more):
    return iwset(name, key, enc, wpa=True, **more)


def set_up(*more):
    """A card, and tools with which every join succeeds."""
    choose("wpa_supplicant", "wpa_cli", "ip", *more)
    make_wlan0()
    note("status", CONNECTED)
    note("networks", LISTED)


def configuration():
    """The network block that the supplicant was given."""
    text = read(f"{machine.LOG}/conf")
    match = re.fullmatch(rb"ctrl_interface=(.*)\nnetwork=\{\n((?:[a-z0-9_]+=.*\n)*)\}\n", text)
    assert match and match[1] == machine.STATE.encode() + b"/control", text
    return dict(line.split(b"=", 1) for line in match[2].splitlines())
