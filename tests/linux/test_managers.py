# SPDX-License-Identifier: MIT
"""Other programs that hold the interface: each command takes it over from them."""

import os
import socket

import pytest

import joining
from machine import calls, install, note, run, static

COMMANDS = pytest.mark.parametrize("command, words", [
    ("iwset", joining.arguments("x")), ("lnk-ifup", ["wlan0"]), ("lnk-ifdown", ["wlan0"])])


@pytest.fixture(autouse=True)
def every_command_succeeds():
    static()
    joining.set_up("nmcli")


@pytest.fixture
def other_supplicant():
    """The control socket of another supplicant."""
    os.makedirs("/run/wpa_supplicant", exist_ok=True)
    with socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM) as other:
        other.bind("/run/wpa_supplicant/wlan0")
        note("other-supplicant")
        yield


@COMMANDS
def test_network_manager_lets_go(command, words):
    note("managed", "100 (connected)\n")
    assert run(command, *words)[::2] == (
        0, f"{command}: wlan0 is no longer managed by NetworkManager\n".encode())
    assert [b"nmcli", b"device", b"set", b"wlan0", b"managed", b"no"] in calls("nmcli")
    assert run(command, *words)[2] == b"", "once is enough"


@COMMANDS
def test_network_manager_that_does_not_run(command, words):
    assert run(command, *words)[::2] == (0, b"")


@COMMANDS
def test_another_supplicant_is_ended(command, words, other_supplicant):
    assert run(command, *words)[::2] == (
        0, f"{command}: another wpa_supplicant on wlan0 has been ended\n".encode())
    assert run(command, *words)[::2] == (0, b""), "the socket that it left"


@COMMANDS
def test_connmans_supplicant(command, words, other_supplicant):
    install("connmanctl")
    note("connman")
    status, _, err = run(command, *words)
    assert (status, err.splitlines()[1:]) == (
        0, [f"{command}: NetworkInterfaceBlacklist=wlan0 in /etc/connman/main.conf keeps ConnMan "
            "off it".encode()])
    assert calls("connmanctl") == [[b"connmanctl", b"state"]], "it is only asked"
