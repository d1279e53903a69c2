# SPDX-License-Identifier: MIT
"""Simulated radios that come and go: the requests for them are sent to mac80211_hwsim over generic
netlink (linux/drivers/net/wireless/virtual/mac80211_hwsim.h)."""

import os
import socket
import struct

from air import run
from probe import wait_until

# linux/netlink.h, linux/genetlink.h
REQUEST, ACK = 1, 4
ERROR = 2
CONTROLLER, GET_FAMILY = 16, 3
FAMILY_ID, FAMILY_NAME = 1, 2
# mac80211_hwsim.h
NEW_RADIO, DEL_RADIO = 4, 5
RADIO_ID, IFTYPE_SUPPORT, CIPHER_SUPPORT = 10, 23, 24
# linux/nl80211.h: the bits of what an interface can be.
STATION, ACCESS_POINT = 1 << 2, 1 << 3
# What linux/ieee80211.h calls WLAN_CIPHER_SUITE_...: without those that protect management frames.
WEP40, TKIP, CCMP, WEP104 = 0x000FAC01, 0x000FAC02, 0x000FAC04, 0x000FAC05


def _attribute(kind, value):
    body = struct.pack("HH", 4 + len(value), kind) + value
    return body + bytes(-len(body) % 4)


def _ask(family, command, *attributes):
    """Sends one request and returns the body of the answer; an error of the kernel is an OSError
    (one that is positive is the number of the new radio)."""
    body = struct.pack("BBH", command, 1, 0) + b"".join(attributes)
    with socket.socket(socket.AF_NETLINK, socket.SOCK_RAW, 16) as channel:  # 16: generic netlink
        channel.settimeout(60)
        channel.send(struct.pack("IHHII", 16 + len(body), family, REQUEST | ACK, 1, 0) + body)
        answer = b""
        while True:
            data = channel.recv(65536)
            length, kind = struct.unpack("IH", data[:6])
            if kind == ERROR:
                error, = struct.unpack("i", data[16:20])
                if error < 0:
                    raise OSError(-error, os.strerror(-error))
                return answer or error
            answer = data[20:length]


def _family():
    answer = _ask(CONTROLLER, GET_FAMILY, _attribute(FAMILY_NAME, b"MAC80211_HWSIM\0"))
    while answer:
        length, kind = struct.unpack("HH", answer[:4])
        if kind == FAMILY_ID:
            return struct.unpack("H", answer[4:6])[0]
        answer = answer[length + -length % 4:]
    raise RuntimeError("mac80211_hwsim is not there")


def add_radio(name, iftypes=None, ciphers=None):
    """Plugs a radio in, whose interface will be NAME; returns its number. IFTYPES are the bits of
    what it can be, CIPHERS those that its driver knows; by default everything."""
    more = []
    if iftypes:
        more.append(_attribute(IFTYPE_SUPPORT, struct.pack("I", iftypes)))
    if ciphers:
        more.append(_attribute(CIPHER_SUPPORT, struct.pack(f"{len(ciphers)}I", *ciphers)))
    number = _ask(_family(), NEW_RADIO, *more)
    wait_until(lambda: os.path.exists(f"/sys/class/net/{name}"), f"the radio of {name}")
    return number


def remove_radio(number, name):
    """Unplugs the radio of this number, whose interface is NAME."""
    _ask(_family(), DEL_RADIO, _attribute(RADIO_ID, struct.pack("I", number)))
    wait_until(lambda: not os.path.exists(f"/sys/class/net/{name}"), f"{name} to be gone")


def modes(name):
    """What the driver of an interface says that it can be."""
    with open(f"/sys/class/net/{name}/phy80211/name") as file:
        told = run("iw", "phy", file.read().strip(), "info")
    told = told.split("Supported interface modes:\n")[1]
    found = []
    for line in told.splitlines():
        if not line.startswith("\t\t *"):
            break
        found.append(line.split()[1])
    return found
