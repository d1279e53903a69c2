# SPDX-License-Identifier: MIT
"""iwlist of the device: scans in the board's form, everything else the real tool's."""

import glob
import os
import re
import subprocess

import pytest

import board
import machine
from machine import calls, choose, note, path_line, read, run, sh, wait_for, write
from scans import (address_of, answer, assert_form, assert_names, convert, ends_like_an_escape,
                   hostile_names, lines_of, numbered, patient_for_a_second, portions,
                   use_awk)

REASON = "/run/wireless-lan/reason"
SCANS = sorted(os.path.basename(path)
               for path in glob.glob(f"{machine.SAMPLES}/iwlist-scan-linux-*.txt"))

# What was on the air when the samples were taken.
AIR = {
    b"02:00:00:00:01:00": b"cafe", b"02:00:00:00:01:01": b"", b"02:00:00:00:01:02": b"",
    b"02:00:00:00:01:03": "Café ☕".encode(), b"02:00:00:00:01:04": b"a\"b$(id)",
    b"02:00:00:00:01:05": b"eight        blanks", b"02:00:00:00:01:06": b" blank at ends ",
    b"02:00:00:00:01:07": b"Cell 99 - Address: x", b"02:00:00:00:02:00": b"home net",
    b"02:00:00:00:02:01": b"mixed", b"02:00:00:00:02:02": b"sae", b"02:00:00:00:03:00": b"old wep",
}


@pytest.fixture(autouse=True)
def real_tool_is_a_stub():
    choose("iwlist")


@pytest.mark.parametrize("awk", machine.AWKS)
@pytest.mark.parametrize("sample", SCANS)
def test_sample_in_our_form(sample, awk):
    use_awk(awk)
    out = convert(read(f"{machine.SAMPLES}/{sample}"))
    assert out == read(f"{machine.EXPECTED}/{sample}")
    assert_form(out)


@pytest.mark.parametrize("sample", SCANS)
def test_sample_shows_what_was_on_the_air(sample):
    found = board.networks(read(f"{machine.EXPECTED}/{sample}"))
    air = dict(AIR)
    if "associated" in sample or "hidden-probed" in sample:
        air[b"02:00:00:00:01:01"] = b"hidden one"
    names = {cell["address"]: board.name_bytes(cell["essid"]) for cell in found}
    assert len(names) == len(found), "an access point is listed twice"
    if len(found) == 128:  # the list is full: not everybody is in it
        air = {address: name for address, name in air.items() if address in names}
    assert {address: names.get(address) for address in air} == air
    assert len(air) > 7
    keys = {cell["address"]: cell["key"] for cell in found if cell["address"] in AIR}
    assert keys == {address: b"on" if address[12:14] in (b"02", b"03") else b"off"
                    for address in keys}
    modes = {board.name_bytes(cell["essid"]): cell["mode"] for cell in found}
    if b"adhoc wep" in read(f"{machine.SAMPLES}/{sample}"):
        assert modes[b"adhoc wep"] == b"Ad-Hoc"
    for cell in found:
        assert cell["lines"] == 6
        assert re.fullmatch(rb"\d+/70", cell["quality"])
        assert re.fullmatch(rb"2\.4\d+", cell["frequency"])


def test_sample_of_163_networks_fills_the_list():
    out = read(f"{machine.EXPECTED}/iwlist-scan-linux-6.1-hwsim-163-networks.txt")
    assert len(board.networks(out)) == 128


@pytest.mark.parametrize("awk", machine.AWKS)
def test_every_name_comes_back(awk):
    use_awk(awk)
    for names in portions(hostile_names()):
        assert_names(convert(answer(numbered(names))), names)


def test_names_without_elements():
    for names in portions([name for name in hostile_names() if not ends_like_an_escape(name)]):
        assert_names(convert(answer(numbered(names), elements=False)), names)


@pytest.mark.parametrize("name, text", [
    (b"\xff" * 32, rb"\X" + b"FF" * 32), (b"\xff" * 31, rb"\xFF" * 31),
    (b"\xff" * 31 + b"a", rb"\xFF" * 31 + b"a"), (b" " + b"\x01" * 31, rb"\X20" + b"01" * 31)])
def test_name_whose_text_is_longer_than_the_field(name, text):
    """No name is this text itself: it would have 66 bytes."""
    found = board.networks(convert(answer([(address_of(1), name)])))[0]
    assert (found["essid"], board.name_bytes(found["essid"])) == (text, name)
    assert len(text) < 128


@pytest.mark.parametrize("name, text", [
    ("Ünïcode ✓".encode(), "Ünïcode ✓".encode()), (b"\xff", rb"\xFF"), (b"\xc3x", rb"\xC3x"),
    (b"a\nb", rb"a\x0Ab"), (b"\xc2\x85", rb"\xC2\x85"), (b"\xed\xa0\x80", rb"\xED\xA0\x80"),
    (b"\xe2\x80\xae", rb"\xE2\x80\xAE"), (b"\\x41", rb"\x5Cx41"), (b"\\x4g", rb"\x4g"),
    (b"\\", b"\\"), (b" a ", rb"\x20a\x20"), (b"a  b", b"a  b"), (b"\0\0\0", b""), (b"", b""),
    (b"a        b", rb"a       \x20b"), (b"\xf0\x9f\x98\x80", b"\xf0\x9f\x98\x80"),
    (b"\xc0\xaf", rb"\xC0\xAF"), (b"\xe2\x98", rb"\xE2\x98")])
def test_text_of_a_name(name, text):
    assert board.networks(convert(answer([(address_of(1), name)])))[0]["essid"] == text


@pytest.mark.parametrize("elements", [True, False])
def test_names_through_the_real_tool(elements):
    """It, not we, says how names are printed."""
    choose()
    shim = os.path.join(machine.ROOT, "scan_shim.so")
    sh("cc", "-Wall", "-Wextra", "-Werror", "-shared", "-fPIC", "-o", shim,
       f"{machine.HERE}/scan_shim.c", "-ldl")
    names = hostile_names()[:128]
    if not elements:
        names = [name for name in names if not ends_like_an_escape(name)]
    write(f"{machine.ROOT}/names", b"".join(name.hex().encode() + b"\n" for name in names))
    environment = {"LD_PRELOAD": shim, "SCAN_NETWORKS": f"{machine.ROOT}/names"}
    if elements:
        environment["SCAN_ELEMENTS"] = "1"
    status, out, err = run("iwlist", "lo", "scan", more_environment=environment)
    assert (status, err) == (0, b"")
    assert_names(out, names)


def test_failed_scan_of_the_real_tool():
    choose()
    assert run("iwlist", "lo", "scan") == (
        255, b"", read(f"{machine.SAMPLES}/iwlist-scan-error-not-wireless.txt"))


ONE, TWO, THREE = map(address_of, (1, 2, 3))


@pytest.mark.parametrize("sent, shown", [
    ([(ONE, b""), (TWO, b"b"), (ONE, b"a")], [(ONE, b"a"), (TWO, b"b")]),  # hidden, then found
    ([(ONE, b"a"), (TWO, b"b"), (ONE, b"")], [(ONE, b"a"), (TWO, b"b")]),
    ([(ONE, b"\0\0"), (ONE, b"a")], [(ONE, b"a")]),
    ([(ONE, b""), (ONE, b"\0")], [(ONE, b"")]),
    ([(ONE, b"a"), (ONE, b"a")], [(ONE, b"a")]),
    ([(ONE, b"a"), (ONE, b"b")], [(ONE, b"a"), (ONE, b"b")]),  # two names of one access point
    ([(ONE, b""), (ONE, b"a"), (THREE, b""), (ONE, b"b")],
     [(ONE, b"a"), (THREE, b""), (ONE, b"b")]),
    ([(ONE, b"a"), (TWO, b"a")], [(ONE, b"a"), (TWO, b"a")])])
def test_network_that_is_there_twice(sent, shown):
    assert [(cell["address"], cell["essid"])
            for cell in board.networks(convert(answer(sent)))] == shown


HEAD = b"x     Scan completed :\n          Cell 01 - Address: 02:00:00:00:00:01\n"
MARGIN = b" " * 20


def test_no_results():
    assert convert(b"wlan0     No scan results\n\n") == b"wlan0     No scan results\n\n"


def test_lines_of_an_older_driver():
    found = board.networks(convert(
        HEAD + MARGIN + b"ESSID:off/any/hidden\n" +
        MARGIN + b"Quality:12/70  Signal level:-60 dBm\n" +
        MARGIN + b"Encryption key:1234-5678-90 [2]   Security mode:open\n"))
    assert (found[0]["essid"], found[0]["quality"], found[0]["key"]) == (b"", b"12/70", b"on")


def test_network_without_lines_closes():
    found = board.networks(convert(
        HEAD + HEAD[-45:] + MARGIN + b"ESSID:\"Mode: x\" [2]\n" + MARGIN + b"Bit Rates:\n"))
    assert len(found) == 1


def test_interface_of_a_confusing_name():
    out = convert(HEAD.replace(b"x  ", b"Cell") + MARGIN + b"ESSID:\"a\"\n")
    assert len(board.networks(out)) == 1


@pytest.mark.parametrize("name, reason", [
    ("interface-down", b"wlan0     Interface doesn't support scanning : Network is down\n"),
    ("no-device", b"no-interface\n"), ("not-wireless", b"no-interface\n")])
def test_error_is_passed_on(name, reason):
    text = read(f"{machine.SAMPLES}/iwlist-scan-error-{name}.txt")
    note("scan-error", text)
    assert run("iwlist", "wlan0", "scan") == (255, b"", text)
    assert read(REASON) == reason
    assert len(calls("iwlist")) == 1


def test_reason_of_an_earlier_failure_is_gone_after_a_scan():
    os.makedirs(os.path.dirname(REASON))
    write(REASON, "wrong-key\n")
    convert(answer([(address_of(1), b"a")]))
    assert not os.path.exists(REASON)


def radio(soft, hard, flags):
    """A card whose radio is blocked so, and the kernel's flags of its interface."""
    machine.make_wlan0()
    switch = "/sys/class/net/wlan0/phy80211/rfkill3"
    os.makedirs(switch)
    write(f"{switch}/soft", f"{soft}\n")
    write(f"{switch}/hard", f"{hard}\n")
    write("/sys/class/net/wlan0/flags", f"{flags}\n")
    return f"{switch}/soft"


def test_radio_that_a_switch_has_turned_off():
    radio(1, 1, "0x1002")
    assert run("iwlist", "wlan0", "scan") == (
        1, b"", b"iwlist: a switch on the machine has turned the radio of wlan0 off\n")
    assert read(REASON) == b"rfkill-hard\n"
    assert calls("iwlist") == []


def test_radio_that_is_blocked_by_software_is_switched_on():
    choose("iwlist", "ip")
    soft = radio(1, 0, "0x1002")
    assert len(board.networks(convert(answer([(address_of(1), b"a")])))) == 1
    assert read(soft) == b"0\n"
    assert calls("ip") == [[b"ip", b"link", b"set", b"dev", b"wlan0", b"up"]]


def test_radio_that_is_on_is_left_alone():
    choose("iwlist", "ip")
    radio(0, 0, "0x1003")
    convert(answer([(address_of(1), b"a")]))
    assert calls("ip") == []


def test_strongest_first():
    """Among equals the order is the kernel's; the list holds 128."""
    text = answer(numbered([b"%03d" % number for number in range(150)]))
    qualities = [1 + number * 7 % 69 for number in range(150)]
    parts = text.split(b"Quality=70/70")
    text = parts[0] + b"".join(b"Quality=%d/70%s" % pair for pair in zip(qualities, parts[1:]))
    found = board.networks(convert(text))
    # What shows the same per cent is the same.
    shown = sorted(range(150), key=lambda number: -(qualities[number] * 100 // 70))[:128]
    assert [cell["essid"] for cell in found] == [b"%03d" % number for number in shown]


@pytest.mark.parametrize("key, elements, lines", [
    (b"on", [b"Unknown: 000161"], [b"Encryption key:on", b"Authentication:WEP"]),
    (b"on", [b"Unknown: 000161", b"WPA Version 1"], [b"Encryption key:on", b"Authentication:WPA"]),
    (b"on", [b"IEEE 802.11i/WPA2 Version 1\n" + b" " * 24 + b"Authentication Suites (1) : PSK"],
     [b"Encryption key:on", b"Authentication:WPA"]),
    # A driver that hands no elements on does not say.
    (b"on", [], [b"Encryption key:on"]), (b"off", [b"Unknown: 000161"], [b"Encryption key:off"]),
    # Opportunistic encryption alone needs no key.
    (b"on", [b"IEEE 802.11i/WPA2 Version 1\n" + b" " * 24 +
             b"Authentication Suites (1) : unknown (18)"], [b"Encryption key:off"]),
    (b"on", [b"IEEE 802.11i/WPA2 Version 1\n" + b" " * 24 +
             b"Authentication Suites (2) : unknown (18) PSK"],
     [b"Encryption key:on", b"Authentication:WPA"])])
def test_kind_of_key(key, elements, lines):
    text = answer([(address_of(1), b"a")], elements=False).rstrip(b"\n") + b"\n"
    text = text.replace(b"Encryption key:off", b"Encryption key:" + key)
    text += b"".join(MARGIN + b"IE: " + element + b"\n" for element in elements) + b"\n"
    assert lines_of(convert(text))[0][5:-1] == lines


def test_real_tool_that_hangs():
    note("scan-hangs")
    status, out, err = run(patient_for_a_second("iwlist"), "wlan0", "scan")
    assert (status, out) == (124, b"")
    assert err == b"iwlist: wlan0: no answer after 1 seconds\n"
    assert read(REASON) == b"no-answer\n"
    assert wait_for(lambda: not machine.running("sleep"))


def test_another_scan_is_waited_for():
    note("busy", read(f"{machine.SAMPLES}/iwlist-scan-error-busy.txt"))
    note("scan", answer([(address_of(1), b"cafe")]))
    status, out, err = run("iwlist", "wlan0", "scan", "essid", "a b")
    assert (status, err, len(board.networks(out))) == (0, b"", 1)
    assert calls("iwlist")[1:] == [[b"iwlist", b"wlan0", b"scan", b"essid", b"a b", b"last"]]
    note("scan-error", "wlan0     Failed to read scan data : Resource temporarily unavailable\n\n")
    assert run("iwlist", "wlan0", "scan") == (255, b"", read(f"{machine.LOG}/scan-error"))


def test_other_questions_are_passed_on():
    note("scan", "as it is\n")
    assert run("iwlist", "wlan0", "freq")[:2] == (0, b"as it is\n")
    assert calls("iwlist") == [[b"iwlist", b"wlan0", b"freq"]]


def test_scan_options_are_passed_on():
    note("scan", answer([(address_of(1), b"a")]))
    status, out, _ = run("iwlist", "wlan0", "scanning", "essid", "a b $x")
    assert (status, len(board.networks(out))) == (0, 1)
    assert calls("iwlist") == [[b"iwlist", b"wlan0", b"scan", b"essid", b"a b $x"]]


def test_own_directory_is_skipped_however_it_is_written():
    note("scan", answer([(address_of(1), b"a")]))
    device = machine.DEVICE
    status, out, _ = run("iwlist", "wlan0", "scan",
                         path=path_line(device, f"{device}/.", f"{device}/man/.."))
    assert (status, len(board.networks(out))) == (0, 1)


def test_found_on_path():
    note("scan", answer([(address_of(1), b"a")]))
    out = subprocess.run("iwlist wlan0 scan", shell=True, stdout=subprocess.PIPE, check=True,
                         env=machine.environment(machine.DEVICE)).stdout
    assert len(board.networks(out)) == 1
