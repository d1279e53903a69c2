# SPDX-License-Identifier: MIT
"""iwset called as the program calls it, and what its supplicant is given."""

import re

import machine
from machine import choose, make_wlan0, note, read, run

CONNECTED = "wpa_state=COMPLETED\n"
HANDSHAKE = "bssid=02:00:00:00:00:01\nssid=x\nwpa_state=4WAY_HANDSHAKE\n"
LISTED = "network id / ssid / bssid / flags\n0\tx\tany\t[CURRENT]\n"
DISABLED = "network id / ssid / bssid / flags\n0\tx\tany\t[CURRENT][TEMP-DISABLED]\n"


# What Debian's wpa_supplicant answers with a card of today.
EVERYTHING = ("NONE IEEE8021X WPA-EAP WPA-PSK WPA-EAP-SUITE-B WPA-EAP-SUITE-B-192 OWE DPP "
              "FILS-SHA256 FILS-SHA384 FT-FILS-SHA256 FT-FILS-SHA384 FT-PSK FT-EAP SAE\n")


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
    note("capability-key_mgmt", EVERYTHING)
    note("capability-modes", "IBSS AP MESH\n")
    note("events")


def event(text):
    """The supplicant tells this from now on."""
    with open(f"{machine.LOG}/events", "ab") as file:
        file.write(b"\r<3>" + text.encode() + b"\n> ")


def whole_configuration():
    """What the supplicant was given: the lines before the networks, and each network, as
    dictionaries."""
    text = read(f"{machine.LOG}/conf")
    match = re.fullmatch(
        rb"((?:[a-z0-9_]+=.*\n)*)((?:network=\{\n(?:[a-z0-9_]+=.*\n)*\}\n)+)", text)
    assert match, text

    def values(lines):
        return dict(line.split(b"=", 1) for line in lines.splitlines())
    common = values(match[1])
    assert common.pop(b"ctrl_interface") == machine.STATE.encode() + b"/control"
    return common, [values(block[len(b"network={\n"):]) for block in match[2].split(b"}\n")[:-1]]


def configuration():
    """The last (as a rule the only) network block that the supplicant was given."""
    return whole_configuration()[1][-1]
