# SPDX-License-Identifier: MIT
"""Other programs that hold the interface: each command takes it over from them."""

import os
import socket
import subprocess

import pytest

import joining
import machine
from machine import calls, install, note, read, run, static, wait_for, write

COMMANDS = pytest.mark.parametrize("command, words", [
    ("iwset", joining.arguments("x")), ("lnk-ifup", ["wlan0"]), ("lnk-ifdown", ["wlan0"])])


@pytest.fixture(autouse=True)
def every_command_succeeds():
    static()
    joining.set_up("nmcli", "iw")


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


def test_supplicant_that_serves_another_card_too_keeps_that(other_supplicant):
    with socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM) as both:
        both.bind("/run/wpa_supplicant/global")
        assert run("lnk-ifup", "wlan0")[::2] == (
            0, b"lnk-ifup: another wpa_supplicant has let go of wlan0\n")
    asked = [b" ".join(call) for call in calls("wpa_cli")]
    assert b"wpa_cli -g /run/wpa_supplicant/global interface_remove wlan0" in asked
    assert not any(b"terminate" in one for one in asked)


def test_supplicant_of_two_cards_that_cannot_be_asked(other_supplicant):
    note("second-card")
    with socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM) as second:
        second.bind("/run/wpa_supplicant/wlan1")
        status, _, err = run("lnk-ifup", "wlan0")
    assert status == 1
    assert err.startswith(b"lnk-ifup: a wpa_supplicant holds wlan0 and wlan1") and \
        err.count(b"\n") == 1
    assert not any(b"terminate" in call for call in calls("wpa_cli"))


def begin(name, *words):
    install(name)
    holder = subprocess.Popen([f"{machine.CHOSEN}/{name}", *words], env=machine.environment())
    assert wait_for(lambda: calls(name))
    return holder


@pytest.mark.parametrize("words, status", [
    ((), 1), (("-i", "wlan0"), 1), (("-i", "wlan1"), 0), (("-I", "wlan0"), 0)])
def test_iwd(words, status):
    begin("iwd", *words)
    done = run("lnk-ifup", "wlan0")
    assert done[::2] == (status, b"lnk-ifup: iwd holds wlan0: stop it, or start it with -I wlan0\n"
                         if status else b"")


@pytest.mark.parametrize("find", ["look_around; echo $others",
                                  "for pid in $(processes iwd wlan0); do echo iwd:$pid; done"])
def test_found_without_the_right_to_trace(find):
    """The systemd unit has fewer rights than those who hold the interface."""
    holder = begin("iwd", "-i", "wlan0")
    text = f'set -u; library={machine.DEVICE}/wireless-lan.sh; . "$library"; {find}'
    found = subprocess.run(["setpriv", "--bounding-set=-sys_ptrace", "sh", "-c", text],
                           stdout=subprocess.PIPE, env=machine.environment(), check=True).stdout
    assert found == b"iwd:%d\n" % holder.pid


def test_iwd_does_not_keep_ours_on_the_interface():
    begin("iwd")
    assert run("lnk-ifdown", "wlan0")[0] == 0
    assert [b"iw", b"dev", b"wlan0", b"disconnect"] in calls("iw")
    assert not os.path.exists("/run/wireless-lan/reason")


def test_hostapd():
    begin("hostapd")
    assert run("lnk-ifup", "wlan0")[0] == 0, "one of another interface"
    os.makedirs("/run/hostapd")
    with socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM) as access_point:
        access_point.bind("/run/hostapd/wlan0")
        assert run("lnk-ifup", "wlan0")[::2] == (
            1, b"lnk-ifup: hostapd holds wlan0: it has to be stopped first\n")


def test_networkd_lets_go_and_gets_it_back():
    begin("systemd-network")
    install("networkctl")
    os.makedirs("/run/systemd/netif/links")
    link, file = "/run/systemd/netif/links/3", "/run/systemd/network/00-wireless-lan-wlan0.network"
    write(link, "ADMIN_STATE=configured\nOPER_STATE=routable\n")
    assert run("lnk-ifup", "wlan0")[::2] == (
        0, b"lnk-ifup: wlan0 is no longer managed by systemd-networkd\n")
    assert read(file) == b"[Match]\nName=wlan0\n[Link]\nUnmanaged=yes\n"
    assert [b"networkctl", b"reload"] in calls("networkctl")
    write(link, "ADMIN_STATE=unmanaged\n")
    assert run("lnk-ifup", "wlan0")[::2] == (0, b""), "once is enough"
    assert run("lnk-ifdown", "--release", "wlan0")[::2] == (
        0, b"lnk-ifdown: wlan0 is given back to systemd-networkd\n")
    assert not os.path.exists(file)


def test_ifupdown_brings_it_down():
    """Its client would set the address again."""
    for name in ("ifquery", "ifdown"):
        install(name)
    note("ifstate", "wlan0=home\n")
    write(f"{machine.ROOT}/udhcpc", "#!/bin/sh\nsleep 600\n")
    os.chmod(f"{machine.ROOT}/udhcpc", 0o755)
    client = subprocess.Popen([f"{machine.ROOT}/udhcpc", "-i", "wlan0"])
    assert wait_for(lambda: read(f"/proc/{client.pid}/comm") == b"udhcpc\n")
    note("ifupdown-client", str(client.pid))
    status, _, err = run("lnk-ifup", "wlan0")
    assert (status, err) == (0, b"lnk-ifup: ifupdown has brought wlan0 down; its stanza in "
                                b"/etc/network/interfaces should go\n")
    assert [b"ifdown", b"wlan0"] in calls("ifdown")
    assert client.wait(20) != 0


def test_given_back_to_network_manager():
    note("managed", "100 (connected)\n")
    assert run("lnk-ifup", "wlan0")[0] == 0
    assert run("lnk-ifdown", "--release", "wlan0")[::2] == (
        0, b"lnk-ifdown: wlan0 is given back to NetworkManager\n")
    assert calls("nmcli")[-1] == [b"nmcli", b"device", b"set", b"wlan0", b"managed", b"yes"]
    assert run("lnk-ifdown", "--release", "wlan0")[::2] == (0, b""), "what was not taken"


@COMMANDS
def test_manager_that_hangs_is_given_up(command, words):
    note("hangs")
    assert run(command, *words)[0] == 0
