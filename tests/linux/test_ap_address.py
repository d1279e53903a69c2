# SPDX-License-Identifier: MIT
"""ap-address: the access point that an interface has joined, as a scan lists it."""

import os
import signal
import subprocess

import pytest

import machine
from machine import calls, choose, hide, note, run

JOINED = b"""Connected to 02:00:00:00:0a:00 (on wlan0)
\tSSID: cafe
\tfreq: 2412
\tRX: 11104 bytes (203 packets)
\tsignal: -30 dBm
\trx bitrate: 54.0 MBit/s
"""
LINKS = b"""Connected to 02:00:00:00:0a:ff (on wlan0)
\tLink 0 BSSID 02:00:00:00:0a:00
\tLink 1 BSSID 02:00:00:00:0a:01
\tSSID: cafe
"""


@pytest.fixture(autouse=True)
def iw_is_a_stub():
    choose("iw", "wpa_cli")
    machine.make_wlan0()


@pytest.mark.parametrize("shell", machine.SHELLS)
@pytest.mark.parametrize("link, address", [
    (JOINED, b"02:00:00:00:0a:00\n"),
    # A multi-link connection: the address of a link, which the scan lists, not that of its own.
    (LINKS, b"02:00:00:00:0a:00\n"),
    (b"Joined IBSS 02:00:00:00:0b:00 (on wlan0)\n\tSSID: ours\n", b"02:00:00:00:0b:00\n"),
    (b"Not connected.\n", b""), (b"", b""),
    (b"Connected to $(id) (on wlan0)\n", b""), (b"Connected to 02:00:00:00:0a:00:00\n", b""),
    (b"Not connected.\n\tSSID: Connected to 02:00:00:00:0a:00\n", b"")])
def test_of_iw(link, address, shell):
    note("iw-link", link)
    assert run("ap-address", "wlan0", shell=shell) == (0, address, b"")
    assert calls("iw") == [[b"iw", b"dev", b"wlan0", b"link"]]


@pytest.mark.parametrize("status, address", [
    (b"bssid=02:00:00:00:0a:00\nfreq=2412\nssid=bssid=02:00:00:00:0a:ff\nwpa_state=COMPLETED\n",
     b"02:00:00:00:0a:00\n"),
    (b"wpa_state=DISCONNECTED\naddress=02:00:00:00:00:00\n", b"")])
def test_of_the_supplicant_without_iw(status, address):
    hide("iw")
    choose("wpa_cli")
    note("status", status)
    assert run("ap-address", "wlan0") == (0, address, b"")
    assert calls("wpa_cli")[0][1:] == [b"-p", b"/run/wireless-lan/wlan0/control", b"-i", b"wlan0",
                                       b"status"]


def test_failure_is_told():
    note("iw-link-error", "command failed: No such device (-19)\n")
    assert run("ap-address", "wlan9") == (
        1, b"", b"ap-address: wlan9: command failed: No such device (-19)\n")


def test_nothing_outlives_it():
    """The window ends a command that takes too long, and its group."""
    note("iw-hangs")
    process = subprocess.Popen([f"{machine.DEVICE}/ap-address", "wlan0"], start_new_session=True,
                               env=machine.environment())
    assert machine.wait_for(lambda: machine.running("sleep"))
    os.killpg(process.pid, signal.SIGKILL)
    process.wait(20)
    assert machine.wait_for(lambda: not machine.running("sleep"))


@pytest.mark.parametrize("arguments", [(), ("",), ("-x",), ("wlan0", "wlan1")])
def test_not_an_interface(arguments):
    status, out, _ = run("ap-address", *arguments)
    assert (status, out) == (2, b"")
    assert calls("iw") == []
