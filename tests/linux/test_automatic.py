# SPDX-License-Identifier: MIT
"""wireless-lan-auto: the preferred networks in their order, and who has the interface when."""

import os
import re
import subprocess

import pytest

import joining
import machine
from joining import CONNECTED, arguments
from machine import (STATE, alive, calls, clients, environment, make_interfaces, numbers, read, run,
                     settings, start, supplicants, wait_for, write)

LIST = "/etc/wireless-user.conf"
SEARCHING = "wpa_state=SCANNING\n"


def record(name, key="off", enc="off", management=0, mode="Master", index=0, alias=None):
    return (f"USERCELL 0\nALIAS {alias or name}\nESSID {name}\nMODE {mode}\nKMGMT {management}\n"
            f"KINDEX {index}\nEncryption {enc}\nKEY {key}\n")


HOME = record("Home", "correct horse", "open", 1, alias="At home")
MARKET = record("Market")
OLD = record("Old School", "abcde", "open")


def save(*records):
    """As the window saves the list: whole, by a rename."""
    write(f"{LIST}.new", "".join(records))
    os.rename(f"{LIST}.new", LIST)


def given():
    return read(f"{machine.LOG}/conf")


def names():
    """The networks that the supplicant has been given, in the order of their priority."""
    found = re.findall(rb"ssid=([0-9a-f]+)\nscan_ssid=1\npriority=(\d+)\n", given())
    return [bytes.fromhex(name.decode()).decode() for name, _ in
            sorted(found, key=lambda one: -int(one[1]))]


def running():
    """The supplicants that have been given their networks."""
    return [pid for pid in supplicants() if alive(pid) and b"network=" in given()]


def reconfigured():
    """How often a supplicant has been given other networks than its first."""
    told = [call for call in calls("wpa_cli") if call[-1] == b"reconfigure"]
    return told[len(supplicants()):]


def ticks(process, count=3):
    """Waits until the automatic has looked around so many times more."""
    def sleeper():
        for child in read(f"/proc/{process.pid}/task/{process.pid}/children").split():
            if machine.command_line(child.decode()).startswith(b"sleep\0"):
                return child
        return None
    seen = set()

    def looked():
        seen.add(sleeper())
        return len(seen - {None}) > count
    assert wait_for(looked)


def begin(*records):
    """The automatic at work on these networks, searching."""
    save(*records)
    joining.note("status", SEARCHING)
    process = start("wireless-lan-auto", "wlan0")
    if records:
        assert wait_for(lambda: running() and numbers("followers") and b"network=" in given())
    return process


def joined(number=0):
    """The supplicant has joined the network of this number, and says so."""
    joining.note("status", f"{CONNECTED}id={number}\n")
    action("CONNECTED")


def at_work(command):
    """Whether a process has this among its words."""
    return any(command in line for line in machine.command_lines().values())


def action(event, *moment, supplicant=None):
    """What wpa_cli runs at an event; returns when its work in the background has begun to follow
    from it, a lease aside. MOMENT is that of the event, in hundredths of a second."""
    variables = dict(environment(), wireless_lan_supplicant=str(supplicant or supplicants()[-1]))
    subprocess.run([os.path.join(machine.DEVICE, "wpa-action"), "wlan0", event, *moment],
                   env=variables, check=True)
    assert wait_for(lambda: not at_work(b"/wpa-action"))


@pytest.fixture(autouse=True)
def one_card():
    joining.set_up("iw", "udhcpc", "nmcli")
    joining.note("lease", "3: wlan0 inet 10.0.0.2/24")
    joining.note("capability-key_mgmt", "NONE WPA-PSK SAE\n")  # one block for each network
    write("/etc/default/wireless-lan", "AUTO_PAUSE=1\nAUTO_PATIENCE=3\n")
    yield
    for path in (LIST, "/etc/default/wireless-lan"):
        if os.path.exists(path):
            os.remove(path)


# ---- joining


def test_the_list_in_its_order():
    begin(HOME, MARKET, OLD)
    assert names() == ["Home", "Market", "Old School"]
    assert len(running()) == 1
    supplicant = b" ".join(calls("wpa_supplicant")[0])
    assert b" -i wlan0 " in supplicant
    followed = f"{numbers('followers')[0]} {running()[0]}\n"
    assert followed.encode() == read(f"{machine.LOG}/followers")


def test_wep_in_a_build_without_it():
    """The others are joined all the same."""
    save(OLD, HOME)
    joining.note("status", SEARCHING)
    joining.note("refused-words", "wep_key\n")
    errors = f"{machine.ROOT}/errors"
    with open(errors, "wb") as file:
        subprocess.Popen([f"{machine.DEVICE}/wireless-lan-auto", "wlan0"], env=environment(),
                         stderr=file)
    assert wait_for(lambda: b"knows no WEP\n" in read(errors) and names() == ["Home"])
    assert b"wireless-lan-auto: Old School is left out: this wpa_supplicant knows no WEP\n" in \
        read(errors)
    save(OLD, MARKET)
    assert wait_for(lambda: names() == ["Market"])
    assert len(supplicants()) == 1


def test_an_address_comes_with_the_network_and_goes_with_it():
    begin(HOME)
    joined()
    assert wait_for(lambda: clients() and alive(clients()[-1]))
    joining.note("status", SEARCHING)
    action("DISCONNECTED")
    assert wait_for(lambda: not alive(clients()[-1]))
    joined()
    assert wait_for(lambda: len(clients()) == 2 and alive(clients()[-1]))


def test_an_address_that_was_asked_for_since_the_event_is_kept():
    """The window asks as soon as it sees the network; the event may take its turn later."""
    joining.note("status", CONNECTED)
    assert joining.iwset("Home")[0] == 0
    event = read("/proc/uptime").split()[0].replace(b".", b"").decode()
    assert run("lnk-ifup", "wlan0") == (0, b"", b"")
    action("CONNECTED", event)
    assert wait_for(lambda: not at_work(b"/lnk-ifup"))
    assert len(clients()) == 1 and alive(clients()[0])
    action("CONNECTED")
    assert wait_for(lambda: len(clients()) == 2)


def test_busybox_is_enough():
    """No other tool than its own, the supplicant's, ip and a DHCP client."""
    wrap = machine.in_busybox()
    save(HOME, MARKET)
    joining.note("status", SEARCHING)
    subprocess.Popen([*wrap, f"{machine.DEVICE}/wireless-lan-auto", "wlan0"], env=environment())
    assert wait_for(lambda: running() and numbers("followers"))
    assert names() == ["Home", "Market"]
    save(MARKET, HOME)
    assert wait_for(reconfigured)
    joining.note("status", f"{CONNECTED}id=0\n")
    subprocess.run([*wrap, f"{machine.DEVICE}/wpa-action", "wlan0", "CONNECTED"], check=True,
                   env=dict(environment(), wireless_lan_supplicant=str(supplicants()[-1])))
    assert wait_for(lambda: clients() and alive(clients()[-1]))
    assert run("lnk-ifdown", "wlan0", wrap=wrap) == (0, b"", b"")
    assert not alive(clients()[-1]) and running() == []
    assert run("wireless-lan-auto", "--now", "wlan0", wrap=wrap) == (0, b"", b"")
    assert wait_for(running)
    assert run("wireless-lan-auto", "--stop", "wlan0", wrap=wrap) == (0, b"", b"")
    assert running() == []


def test_events_that_come_late_do_nothing():
    """The supplicant is asked, not the event; and one of a supplicant that has gone is nobody's."""
    begin(HOME)
    known = machine.ip_calls()
    joining.note("status", CONNECTED)
    action("CONNECTED", supplicant=1)
    action("DISCONNECTED", supplicant=1)
    action("DISCONNECTED")
    joining.note("status", SEARCHING)
    action("CONNECTED")
    assert (clients(), machine.ip_calls()) == ([], known)


def test_a_supplicant_that_answers_late_is_asked_again():
    begin(HOME)
    known = machine.ip_calls()
    joining.note("status", CONNECTED)
    joining.note("late-status")
    action("DISCONNECTED")
    assert machine.ip_calls() == known
    joining.note("late-status")
    action("CONNECTED")
    assert wait_for(clients)


def test_a_supplicant_that_dies_is_started_again():
    process = begin(HOME)
    os.kill(running()[0], 9)
    assert wait_for(lambda: len(supplicants()) == 2)
    process.kill()
    process.wait()
    assert run("wireless-lan-auto", "--stop", "wlan0")[0] == 0
    assert running() == []


def test_one_automatic_for_a_card():
    begin(HOME)
    status, _, err = run("wireless-lan-auto", "wlan0")
    assert (status, err) == (1, b"wireless-lan-auto: it already looks after wlan0\n")


@pytest.mark.parametrize("content", [
    None, "", "USERCELL", "\n" * 100, "\0" * 100, record("home", mode="Ad-Hoc"),
    record("x", "short", "open", 1)])
def test_a_list_without_a_network_leaves_the_card_alone(content):
    if content is not None:
        save(content)
    process = start("wireless-lan-auto", "wlan0")
    ticks(process)
    assert [call for call in calls() if call[0] != b"logger"] == []


def test_two_cards_have_nothing_in_common():
    make_interfaces(("wlan0", 3, 1, "phy80211"), ("wlan1", 4, 1, "phy80211"))
    begin(HOME)
    start("wireless-lan-auto", "wlan1")
    assert wait_for(lambda: len(running()) == 2)
    first = supplicants()[0]
    assert run("wireless-lan-auto", "--stop", "wlan1")[0] == 0
    assert running() == [first]


def test_stop_ends_what_it_started():
    process = begin(HOME)
    joined()
    assert wait_for(clients)
    assert run("wireless-lan-auto", "--stop", "wlan0") == (0, b"", b"")
    assert process.wait(20) == 0
    assert running() == []
    assert not alive(clients()[-1]) and not alive(numbers("followers")[-1])
    assert sorted(os.listdir(STATE)) == ["lock"]


# ---- one hand at a time


def test_the_user_wins():
    process = begin(HOME)
    automatic = running()
    joining.note("status", CONNECTED)
    assert run("iwset", *arguments("Fourth"))[0] == 0
    assert not alive(automatic[0]) and len(running()) == 1
    ticks(process, 5)
    assert len(running()) == 1 and not os.path.exists(f"{STATE}/automatic")


def test_a_network_of_the_user_that_is_lost_for_long_is_given_up():
    process = begin(HOME, MARKET)
    joining.note("status", CONNECTED)
    run("iwset", *arguments("Fourth"))
    ticks(process, 5)
    by_hand = running()
    joining.note("status", SEARCHING)
    assert wait_for(lambda: not alive(by_hand[0]) and running())
    assert names() == ["Home", "Market"]
    assert len(running()) == 1


def test_a_join_that_failed_is_given_up():
    process = begin(HOME)
    assert run("iwset", *arguments("Fourth", "1234567", "open", wpa=True))[0] == 1
    ticks(process, 1)
    assert wait_for(running) and names() == ["Home"]


def test_a_network_of_the_user_that_comes_back_gets_its_address_again():
    begin(HOME)
    run("iwset", *arguments("Fourth"))
    joined()
    joining.note("status", SEARCHING)
    assert clients() == [], "the window asks for the first"
    joining.note("status", CONNECTED)
    assert run("lnk-ifup", "wlan0")[0] == 0
    joined()
    assert wait_for(lambda: len(clients()) == 2 and alive(clients()[-1]))
    assert not alive(clients()[0])


def test_disconnect_is_not_undone():
    process = begin(HOME)
    assert run("lnk-ifdown", "wlan0")[0] == 0
    ticks(process, 5)
    assert running() == []
    # The list is no reason either.
    save(HOME, MARKET)
    ticks(process, 5)
    assert running() == []
    assert run("wireless-lan-auto", "--now", "wlan0") == (0, b"", b"")
    assert wait_for(running) and names() == ["Home", "Market"]


def test_it_is_asked_while_it_wakes():
    """Its sleep has ended when it is to be ended."""
    process = begin(HOME)
    assert run("lnk-ifdown", "wlan0")[0] == 0
    late = ["strace", "-qq", "-o", "/dev/null", "-e", "trace=kill",
            "-e", "inject=kill:delay_enter=3000000"]
    assert run("wireless-lan-auto", "--now", "wlan0", wrap=late) == (0, b"", b"")
    assert wait_for(running)
    ticks(process)


def test_after_a_disconnect_it_begins_with_the_next_card():
    process = begin(HOME)
    run("lnk-ifdown", "wlan0")
    subprocess.run(["umount", "/sys/class/net"], check=True)
    ticks(process)
    assert running() == []
    make_interfaces(("wlan0", 9, 1, "phy80211"))
    assert wait_for(running)


def test_after_a_disconnect_it_begins_with_the_next_start_of_the_machine():
    process = begin(HOME)
    run("lnk-ifdown", "wlan0")
    ticks(process)
    words = read(f"{STATE}/choice").split()
    write(f"{STATE}/choice", b" ".join([words[0], b"another-boot", words[2]]) + b"\n")
    assert wait_for(running)


def test_a_new_card_of_the_same_name_is_begun_with_anew():
    begin(HOME)
    first = running()
    make_interfaces(("wlan0", 9, 1, "phy80211"))
    assert wait_for(lambda: not alive(first[0]) and running())


def test_a_card_that_is_replaced_while_it_is_begun_with():
    joining.note("slow-supplicant")
    save(HOME)
    joining.note("status", SEARCHING)
    start("wireless-lan-auto", "wlan0")
    assert wait_for(supplicants)
    make_interfaces(("wlan0", 9, 1, "phy80211"))
    machine.forget("slow-supplicant")
    assert wait_for(lambda: len(supplicants()) == 2 and running())


def test_status():
    assert run("wireless-lan-auto", "--status", "wlan0")[:2] == (3, b"wlan0 is not looked after\n")
    begin(HOME)
    run("lnk-ifdown", "wlan0")
    assert run("wireless-lan-auto", "--status", "wlan0")[:2] == (
        0, b"wlan0 is looked after; the network is chosen by: off\n")


def test_now_without_an_automatic():
    status, _, err = run("wireless-lan-auto", "--now", "wlan0")
    assert (status, err) == (
        1, b"wireless-lan-auto: it does not look after wlan0; start it first\n")


def test_hosting_is_restored_and_switches_it_off():
    settings(f"iface wlan0\naddrtype static \naddress 10.0.0.1\n{machine.GROUP}"
             .replace("wifigroup 0", "wifigroup 1"))
    save(HOME)
    process = start("wireless-lan-auto", "wlan0")
    assert wait_for(running)
    assert b"ssid=686f6d65\n" in given() and b"mode=1\n" in given()
    assert wait_for(lambda: any(b"10.0.0.1/8" in call for call in machine.ip_calls()))
    hosting = running()
    joining.note("status", SEARCHING)
    ticks(process, 6)
    assert running() == hosting
    settings(f"iface wlan0\naddrtype dhcp\ndns auto\n{machine.GROUP}")
    assert wait_for(lambda: not alive(hosting[0]) and running())
    assert names() == ["Home"]


# ---- the list changed


def test_a_new_list_while_it_searches():
    begin(HOME, MARKET)
    save(MARKET, HOME)
    assert wait_for(reconfigured)
    assert wait_for(lambda: names() == ["Market", "Home"])
    assert len(supplicants()) == 1


def test_a_new_list_does_not_touch_a_connection_that_it_holds():
    process = begin(HOME, MARKET)
    joined(1)
    save(OLD, MARKET)
    assert wait_for(lambda: os.path.exists(f"{STATE}/next.conf"))
    ticks(process)
    assert reconfigured() == [] and names() == ["Home", "Market"]
    joining.note("status", SEARCHING)
    action("DISCONNECTED")
    assert wait_for(reconfigured)
    assert wait_for(lambda: names() == ["Old School", "Market"])


@pytest.mark.parametrize("new", [(HOME,), (HOME, MARKET.replace("off", "open").replace(
    "KEY open", "KEY fghij"))], ids=["removed", "another key"])
def test_a_new_list_without_the_connection_counts_at_once(new):
    begin(HOME, MARKET)
    joined(1)
    save(*new)
    assert wait_for(reconfigured)


def test_an_emptied_list_leaves_the_network():
    begin(HOME)
    joined()
    save()
    assert wait_for(lambda: not running())


def test_a_list_that_is_away_for_a_moment_changes_nothing():
    process = begin(HOME)
    joined()
    os.rename(LIST, f"{LIST}.away")
    ticks(process)
    os.rename(f"{LIST}.away", LIST)
    ticks(process)
    assert reconfigured() == [] and len(supplicants()) == 1 and running()


# ---- how it is started


@pytest.mark.parametrize("hook, variables", [
    ("wireless-lan-auto.init", {}),
    ("wireless-lan-auto.ifupdown", {"IFACE": "wlan0", "IF_WIRELESS_LAN_AUTO": "yes"})])
def test_started_and_stopped(hook, variables):
    save(HOME)
    write("/etc/default/wireless-lan", "INTERFACE=wlan0\nAUTO_PAUSE=1\n")
    write("/usr/sbin/wireless-lan-auto",
          f'#!/bin/sh\nexec {machine.DEVICE}/wireless-lan-auto "$@"\n')
    os.chmod("/usr/sbin/wireless-lan-auto", 0o755)
    try:
        for word in ("start", "stop"):
            subprocess.run([f"{machine.DEVICE}/start/{hook}", word], check=True,
                           env=dict(environment(), MODE=word, **variables))
            assert wait_for(lambda: (running() != []) == (word == "start"))
    finally:
        os.remove("/usr/sbin/wireless-lan-auto")


def test_unit_is_hardened(tmp_path):
    """Whoever adds a right to it has to raise the number here, too."""
    unit = "wireless-lan-auto@.service"
    machine.shutil.copy(f"{machine.DEVICE}/start/{unit}", tmp_path)
    done = subprocess.run(["systemd-analyze", "security", "--offline=true", "--threshold=39",
                           "--no-pager", str(tmp_path / unit)], stdout=subprocess.PIPE,
                          stderr=subprocess.STDOUT, check=False)
    assert done.returncode == 0, done.stdout.decode()
