# SPDX-License-Identifier: MIT
"""lnk-ifup: a static address, the settings that it reads, the DHCP clients and how they end."""

import os
import re

import pytest

import joining
import machine
from machine import (CLIENTS, GROUP, STATE, alive, calls, choose, clients, forget, ip_calls,
                     make_wlan0, note, read, run, settings, start, static, wait_for)

LEASE = "3: wlan0 inet 10.0.0.2/24"


@pytest.fixture(autouse=True)
def one_card():
    make_wlan0()


# ---- static


def test_static():
    choose("ip", "dhclient")
    static()
    assert run("lnk-ifup", "wlan0") == (0, b"", b"")
    assert ip_calls() == [
        b"-4 address flush dev wlan0", b"link set dev wlan0 up",
        b"-4 address add 10.1.2.3/24 broadcast 10.1.2.255 dev wlan0",
        b"-4 route replace default via 10.1.2.1 dev wlan0 metric 600"]


@pytest.mark.parametrize("options, wanted", [
    ({"netmask": "255.255.254.0"}, b"10.1.2.3/23 broadcast 10.1.2.255"),
    ({"netmask": "255.255.255.255"}, b"10.1.2.3/32 broadcast 10.1.2.255"),
    ({"netmask": "128.0.0.0"}, b"10.1.2.3/1 broadcast 10.1.2.255"),
    ({"netmask": "0.0.0.0", "broadcast": "0.0.0.0"}, b"10.1.2.3/8 broadcast +"),
    ({"address": "172.16.0.1", "netmask": "", "broadcast": ""}, b"172.16.0.1/16 broadcast +"),
    ({"address": "192.168.1.5", "netmask": ""}, b"192.168.1.5/24 broadcast 10.1.2.255")])
def test_static_netmasks(options, wanted):
    choose("ip", "dhclient")
    static(**options)
    assert run("lnk-ifup", "wlan0")[0] == 0
    assert b"-4 address add " + wanted + b" dev wlan0" in ip_calls()


def test_static_without_a_gateway():
    choose("ip", "dhclient")
    static(gateway="0.0.0.0")
    assert run("lnk-ifup", "wlan0")[0] == 0
    assert not any(b"route" in call for call in ip_calls())


@pytest.mark.parametrize("options", [
    {"address": "10.1.2"}, {"address": "10.1.2.256"}, {"address": "10.1.2.3.4"},
    {"address": "10.1.2.x"}, {"address": "10..2.3"}, {"address": "10.1.2.03"}, {"address": "$(id)"},
    {"address": "-4"}, {"address": "1.2.3.1000"}, {"address": "9" * 40 + ".1.1.1"},
    {"netmask": "255.0.255.0"}, {"netmask": "255.255.255.1"}, {"netmask": "24"},
    {"broadcast": "x"}, {"gateway": "10.1.2.256"}])
def test_static_refused(options):
    choose("ip", "dhclient")
    static(**options)
    status, _, err = run("lnk-ifup", "wlan0")
    assert status == 1
    assert err.startswith(b"lnk-ifup: not a") and err.count(b"\n") == 1
    assert not calls("dhclient")


# ---- the settings


def client_dns(text):
    """What lnk-ifup answers, and what the clients that it started are told of name servers."""
    choose("ip", "udhcpc")
    note("lease", LEASE)
    if text is not None:
        settings(text)
    status = run("lnk-ifup", "wlan0")[0]
    return status, [line.split(b" ", 1)[1] for line in read(f"{machine.LOG}/clients").splitlines()]


@pytest.mark.parametrize("text, dns", [
    (None, b"auto"), ("", b"auto"),
    ("iface wlan0\naddrtype dhcp\ndns auto\n" + GROUP, b"auto"),
    ("iface wlan0\naddrtype dhcp\ndns manual\n" + GROUP, b"manual"),
    ("  iface   wlan0  \n\taddrtype dhcp \n dns manual", b"manual"),
    # another interface's stanza, and ours as the second
    ("iface wlan1\naddrtype static \naddress 10.0.0.9\ndns manual\n" + GROUP, b"auto"),
    ("iface wlan1\naddrtype dhcp\ndns auto\niface wlan0\ndns manual\n", b"manual"),
    # static without an address, and neither of the two
    ("iface wlan0\naddrtype static \naddress \nnetmask \nbroadcast \ngateway \n" + GROUP, b"auto"),
    ("iface wlan0\naddrtype static\ndns manual\n" + GROUP, b"manual")])
def test_settings(text, dns):
    assert client_dns(text) == (0, [dns])


def test_first_settings_are_written():
    """What the settings dialog shows on a fresh board: its own first file would be refused."""
    assert client_dns(None) == (0, [b"auto"])
    assert read("/etc/wireless.conf") == (
        b"iface wlan0\naddrtype dhcp\ndns auto\nwifigroup 0\n"
        b"ESSID \nMODE Ad-Hoc\nKEY \nEncryption off\n")
    assert os.stat("/etc/wireless.conf").st_mode & 0o777 == 0o600
    settings("mine")
    client_dns("mine")
    assert read("/etc/wireless.conf") == b"mine"


@pytest.mark.parametrize("words, name", [
    ((), b"wlan0"), (("wlan7",), b"wlan7"), (("a/b",), None)])
def test_first_settings_of_an_installation(words, name):
    choose("ip", "iw", "udhcpc")
    assert run("lnk-ifup", "--settings", *words)[0] == (0 if name else 2)
    assert read("/etc/wireless.conf").split(b"\n")[0] == (b"iface " + name if name else b"")
    assert calls("udhcpc") == [] and calls("ip") == []


def test_no_card_no_first_settings():
    machine.make_interfaces()
    assert run("lnk-ifup", "--settings") == (0, b"", b"")
    assert not os.path.exists("/etc/wireless.conf")


def test_value_that_is_a_command_is_not_run():
    assert client_dns("iface wlan0\naddrtype $(touch /run/bad)\ndns `x`\n") == (0, [b"`x`"])
    assert not os.path.exists("/run/bad")


# ---- clients


FORMS = {
    "dhcpcd": [b"--ipv4only", b"--noipv4ll", b"--nobackground", b"--quiet", b"--metric", b"600",
               b"--timeout", b"0", b"--nohook", b"resolv.conf", b"--env", b"wireless_lan_dns=auto",
               b"--script", f"{machine.DEVICE}/dhcpcd-script".encode(), b"wlan0"],
    "udhcpc": [b"-f", b"-t", b"5", b"-T", b"3", b"-A", b"5", b"-i", b"wlan0", b"-s",
               f"{machine.DEVICE}/udhcpc-script".encode()],
    "dhclient": [b"-4", b"-d", b"-cf", f"{STATE}/dhclient.conf".encode(), b"-lf",
                 f"{STATE}/dhclient.leases".encode(), b"-pf", f"{STATE}/dhclient.pid".encode(),
                 b"-e", b"IF_METRIC=600", b"-e", b"wireless_lan_dns=auto", b"-e",
                 f"wireless_lan_names={machine.DEVICE}/name-servers".encode(), b"wlan0"]}


@pytest.mark.parametrize("name", CLIENTS)
def test_client(name):
    settings("iface wlan0\naddrtype dhcp\ndns auto\n" + GROUP)
    choose("ip", name)
    note("lease", LEASE)
    assert run("lnk-ifup", "wlan0") == (0, b"", b"")
    assert calls(name) == [[name.encode(), *FORMS[name]]]
    assert [alive(pid) for pid in clients()] == [True]
    forget("addresses")
    assert run("lnk-ifup", "wlan0")[0] == 0
    assert [alive(pid) for pid in clients()] == [False, True], "a second start replaces the first"
    assert run("lnk-ifdown", "wlan0") == (0, b"", b"")
    assert [alive(pid) for pid in clients()] == [False, False]
    assert b"address flush dev wlan0 scope global" in ip_calls()


@pytest.mark.parametrize("name, told", [("dhcpcd", b"wireless_lan_dns=manual"),
                                        ("dhclient", b"wireless_lan_dns=manual")])
def test_client_is_told_to_leave_the_name_servers(name, told):
    settings("iface wlan0\naddrtype dhcp\ndns manual\n" + GROUP)
    choose("ip", name)
    note("lease", LEASE)
    run("lnk-ifup", "wlan0")
    assert told in b" ".join(calls(name)[0])


def test_first_of_the_installed_clients():
    choose("ip", *CLIENTS)
    note("lease", LEASE)
    run("lnk-ifup", "wlan0")
    assert [len(calls(name)) for name in CLIENTS] == [1, 0, 0]


def test_no_client_at_all():
    choose("ip")
    status, _, err = run("lnk-ifup", "wlan0")
    assert status == 1
    assert b"no DHCP client" in err


# ---- how it ends


def start_waiting():
    """lnk-ifup with a client that runs."""
    known = len(clients())
    process = start("lnk-ifup", "wlan0")
    assert wait_for(lambda: len(clients()) > known)
    return process


def test_client_that_gives_up():
    choose("ip", "udhcpc")
    note("client-fails")
    assert run("lnk-ifup", "wlan0") == (1, b"", b"lnk-ifup: no address for wlan0 yet\n")


def test_client_that_hands_over_to_its_daemon():
    choose("ip", "dhcpcd")
    note("lease", LEASE)
    note("hands-over")
    waiting = start_waiting()
    assert wait_for(lambda: not alive(clients()[-1]))
    polls = len(calls("ip"))
    assert wait_for(lambda: len(calls("ip")) > polls + 2), "its daemon is waited for"
    forget("hands-over")
    assert waiting.wait(60) == 0


@pytest.mark.parametrize("command, words", [
    ("lnk-ifup", ["wlan0"]), ("lnk-ifdown", ["wlan0"]), ("iwset", joining.arguments("x"))])
def test_one_that_waits_is_replaced_client_and_all(command, words):
    choose("ip", "udhcpc", "wpa_supplicant", "wpa_cli")
    waiting = start_waiting()
    first = clients()[-1]
    if command == "lnk-ifup":
        static()  # with a lease, the one that waits might still be content
    assert run(command, *words)[0] == 0
    assert waiting.wait(30) != 0
    assert not alive(first)


def test_lease_that_comes_late():
    """The command gives up, its client does not."""
    choose("ip", "udhcpc")
    waiting = start_waiting()
    client = clients()[-1]
    assert waiting.wait(120) == 1
    assert read("/run/wireless-lan/reason") == b"no-lease\n"
    assert alive(client)
    assert run("lnk-ifdown", "wlan0")[0] == 0
    assert not alive(client)
    assert sorted(os.listdir(STATE)) == ["choice", "lock"], "no note of a process stays"


def test_the_reason_is_there_when_the_window_looks_for_it():
    """It looks for an address 21 times, every two seconds; then it shows the reason."""
    patience = re.search(rb"^patience=(\d+)$", read(f"{machine.DEVICE}/lnk-ifup"), re.M)
    assert int(patience.group(1)) + 10 < 21 * 2


@pytest.mark.parametrize("words", [(), ("wlan0", "x"), ("",), ("a/b",), ("-a",)])
def test_refused_words(words):
    assert run("lnk-ifup", *words)[0] == 2


def test_no_such_interface():
    assert run("lnk-ifup", "wlan9")[0] == 1
