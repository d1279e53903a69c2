# SPDX-License-Identifier: MIT
"""iwset: what the supplicant is given, what is refused, what is left, and that no key leaks."""

import glob
import hashlib
import os
import re
import subprocess
import threading

import pytest

import board
import joining
import machine
from joining import configuration, iwset, iwset_wpa
from machine import STATE, alive, calls, note, read, run, supplicants, wait_for, write
from scans import HOSTILE, answer, convert, numbered


@pytest.fixture(autouse=True)
def every_join_succeeds():
    joining.set_up("iwlist")


OPEN = {b"ssid": b"63616665", b"scan_ssid": b"1", b"key_mgmt": b"NONE"}
WPA = {b"ssid": b"686f6d65206e6574", b"scan_ssid": b"1", b"ieee80211w": b"1"}
ALL_MANAGEMENTS = b"WPA-PSK WPA-PSK-SHA256 SAE"


@pytest.mark.parametrize("options", [
    {}, {"key": "secret"},                   # a key that is left over
    {"enc": "open"},                         # an encrypted network without a key
    {"wpa": True},
    {"mode": "Master"}, {"mode": "managed"}, {"mode": "Unknown/bug"}])
def test_open_network(options):
    assert iwset("cafe", **options)[0] == 0
    assert configuration() == OPEN


def test_supplicant_and_its_files():
    iwset("cafe")
    assert read(f"{machine.LOG}/modes") == b"600 0 regular file\n700 0 directory\n700 0 directory\n"
    state = STATE.encode()
    assert calls("wpa_supplicant") == [[
        b"wpa_supplicant", b"-B", b"-i", b"wlan0", b"-D", b"nl80211,wext",
        b"-c", state + b"/wpa_supplicant.conf", b"-P", state + b"/wpa_supplicant.pid"]]


@pytest.mark.parametrize("enc, algorithm", [("open", b"OPEN"), ("restricted", b"SHARED")])
@pytest.mark.parametrize("key, digits", [
    ("abcde", b"6162636465"), ("0123456789", b"0123456789"),
    ("thirteen char", b"746869727465656e2063686172"),
    ("0123456789abcdefABCDEF0123", b"0123456789abcdefABCDEF0123")])
def test_wep(key, digits, enc, algorithm):
    for index in (1, 2, 3, 4):
        iwset("old wep", key, enc, index=f"[{index}]")
        assert configuration() == {
            b"ssid": b"6f6c6420776570", b"scan_ssid": b"1", b"key_mgmt": b"NONE",
            b"wep_key%d" % (index - 1): digits, b"wep_tx_keyidx": b"%d" % (index - 1),
            b"auth_alg": algorithm}


def test_wep_without_an_index_is_the_first():
    iwset("x", "abcde", "open", index=None)
    assert configuration()[b"wep_key0"] == b"6162636465"


@pytest.mark.parametrize("key", [
    "8 chars.", "x" * 63, "Käse mit Löchern", "a#b$(id)`\\\"x", " blanks at ends ", "\"12345678\"",
    "% s%n%d -- '"])
def test_wpa_phrase(key):
    assert iwset_wpa("home net", key)[0] == 0
    assert configuration() == {**WPA, b"key_mgmt": ALL_MANAGEMENTS, b"psk": b'"%s"' % key.encode()}


@pytest.mark.parametrize("name", [b"home net", b"\n $(id)\n", b"\xff\\"])
@pytest.mark.parametrize("key", ["a\"b#c de", "\"#123456", "\"#psk=\"abc\" #"])
def test_wpa_phrase_that_a_reader_would_cut_at_a_comment(key, name):
    iwset_wpa(name, key)
    made = hashlib.pbkdf2_hmac("sha1", key.encode(), name, 4096, 32).hex().encode()
    assert configuration() == {**WPA, b"ssid": name.hex().encode(), b"key_mgmt": ALL_MANAGEMENTS,
                               b"psk": made, b"sae_password": key.encode().hex().encode()}


def test_wpa_64_digits():
    key = "0123456789abcdefABCDEF0123456789" * 2
    iwset_wpa("home net", key, "restricted")
    assert configuration() == {**WPA, b"key_mgmt": b"WPA-PSK WPA-PSK-SHA256", b"psk": key.encode()}


HOSTED = {b"ssid": b"64657669636520", b"scan_ssid": b"1", b"mode": b"1", b"frequency": b"2412"}


@pytest.mark.parametrize("words, more, wanted", [
    (("off", "off"), {"index": None}, {b"key_mgmt": b"NONE"}),
    (("off", "open"), {"index": None}, {b"key_mgmt": b"NONE"}),
    (("off", "restricted"), {"index": None}, {b"key_mgmt": b"NONE"}),
    (("abcde", "open"), {"mode": "ad-hoc", "index": "[2]"}, {
        b"key_mgmt": b"NONE", b"wep_key1": b"6162636465", b"wep_tx_keyidx": b"1",
        b"auth_alg": b"OPEN"}),
    (("12345678", "open"), {"wpa": True}, {
        b"proto": b"RSN", b"key_mgmt": b"WPA-PSK", b"pairwise": b"CCMP", b"group": b"CCMP",
        b"psk": b"\"12345678\""})])
def test_hosted_network(words, more, wanted):
    iwset("device ", *words, **{"mode": "Ad-Hoc", **more})
    assert configuration() == {**HOSTED, **wanted}


# ---- names


@pytest.mark.parametrize("shell", machine.SHELLS)
def test_what_the_list_shows_gives_the_name_back(shell):
    names = [name for name in HOSTILE if name.strip(b"\0")]
    found = board.networks(convert(answer(numbered(names))))
    for cell, name in zip(found, names):
        status = iwset(cell["essid"], shell=shell)[0]
        assert (status, configuration()[b"ssid"]) == (0, name.hex().encode())


def test_the_name_itself():
    for name in HOSTILE:
        if b"\0" not in name and not re.search(rb"\\x[0-9A-Fa-f]{2}", name):
            assert (iwset(name)[0], configuration()[b"ssid"]) == (0, name.hex().encode())


def test_names_that_are_words_of_the_command():
    iwset("wpa")
    assert configuration()[b"ssid"] == b"777061"
    iwset_wpa("essid", "12345678")
    assert configuration()[b"ssid"] == b"6573736964"


# ---- refusals


WORDS = ["wlan0", "essid", "E", "mode", "Managed", "key", "off", "enc", "off"]


def assert_refused(status, words):
    """Refused with one line that says why, and nothing is started."""
    iwset("cafe")
    before = len(calls("wpa_supplicant"))
    result = run("iwset", *words)
    assert result[0] == status
    assert result[2].startswith(b"iwset: ") and result[2].count(b"\n") == 1
    assert len(calls("wpa_supplicant")) == before
    return result


def assert_refused_after_leaving(words):
    result = assert_refused(1, words)
    assert not alive(supplicants()[-1])
    assert not os.path.exists(f"{STATE}/wpa_supplicant.conf")
    return result


@pytest.mark.parametrize("words", [
    [""], WORDS[:-1], [*WORDS, "[1]", "x"],
    *([*WORDS[:place], "other", *WORDS[place + 1:]] for place in (1, 3, 5, 7, 8)),
    *([*WORDS, index] for index in ("[0]", "[5]", "1", "[1", "[11]", "")),
    *([name, *WORDS[1:]] for name in ("", "-x", ".", "..", "a/b", "../wlan0", "a b",
                                      "sixteen-letters-", "a:b"))])
def test_refused_words(words):
    assert_refused(2, words)


def test_refused_interface_that_is_not_there():
    assert_refused(1, ["wlan9", *WORDS[1:]])


@pytest.mark.parametrize("name", ["", "x" * 33])
def test_refused_name(name):
    assert_refused_after_leaving(joining.arguments(name))


@pytest.mark.parametrize("key", ["1234", "123456", "123456789", "12345678901",
                                 "0123456789abcdefABCDEF012x", "x" * 40])
def test_refused_wep_key(key):
    result = assert_refused_after_leaving(joining.arguments("x", key, "open"))
    assert key.encode() not in result[1] + result[2]


@pytest.mark.parametrize("key", ["1234567", "x" * 64, "0" * 63 + "g", "0" * 65, "off", "",
                                 "12345678\t", "1234567\n8", "1234567\x7f8"])
def test_refused_wpa_key(key):
    result = assert_refused_after_leaving(joining.arguments("x", key, "open", wpa=True))
    assert len(key) < 4 or key.encode() not in result[1] + result[2]


def test_supplicant_that_does_not_start():
    note("no-supplicant")
    assert iwset("cafe")[0] == 1
    assert not os.path.exists(f"{STATE}/wpa_supplicant.conf")


# ---- one after another


def test_one_supplicant_at_a_time():
    iwset_wpa("one", "12345678")
    iwset("two", "abcde", "open")
    iwset("three")
    assert [alive(pid) for pid in supplicants()] == [False, False, True]
    assert configuration() == {**OPEN, b"ssid": b"7468726565"}
    assert [b"ip", b"-4", b"address", b"flush", b"dev", b"wlan0"] in calls("ip")


def test_stranger_under_an_old_number_lives():
    iwset("one")
    stranger = subprocess.Popen(["sleep", "600"])
    write(f"{STATE}/supplicant.pid", f"{stranger.pid} 1\n")
    iwset("two")
    assert stranger.poll() is None


def test_spoilt_note():
    iwset("one")
    write(f"{STATE}/supplicant.pid", "rubbish\n")
    assert iwset("two")[0] == 0


def test_three_at_once_leave_one():
    iwset("one")
    running = [machine.start("iwset", *joining.arguments(name))
               for name in ("two", "three", "four")]
    assert [process.wait(60) for process in running] == [0, 0, 0]
    assert [alive(pid) for pid in supplicants()] == [False, False, False, True]


# ---- keys that are refused


def test_wrong_key_is_given_up():
    note("status", joining.HANDSHAKE)
    note("networks", joining.DISABLED)
    status, _, err = iwset_wpa("home net", "12345678")
    assert (status, err) == (1, b"iwset: the access point refuses the key\n")
    assert not alive(supplicants()[-1])
    assert not os.path.exists(f"{STATE}/wpa_supplicant.conf")


def test_name_cannot_say_that_all_is_well():
    note("status", "ssid=wpa_state=COMPLETED\nwpa_state=4WAY_HANDSHAKE\n")
    note("networks", joining.DISABLED)
    assert iwset_wpa("x", "12345678")[0] == 1


def test_right_key():
    assert iwset_wpa("x", "12345678")[0] == 0
    assert alive(supplicants()[-1])


def absent():
    """The network is not there, and bears a name like a flag."""
    note("status", "wpa_state=SCANNING\n")
    note("networks", "network id / ssid / bssid / flags\n0\t[TEMP-DISABLED]\tany\t[CURRENT]\n")


def followers():
    return [path for path in glob.glob("/proc/[0-9]*/cmdline") if b"/iwset\0" in read(path)]


def test_access_point_that_shows_up_late_refuses_the_key():
    absent()
    assert iwset_wpa("x", "12345678")[0] == 0
    late = supplicants()[-1]
    assert alive(late)
    note("status", joining.HANDSHAKE)
    note("networks", joining.DISABLED)
    assert wait_for(lambda: not alive(late))


def test_follower_of_an_old_network_leaves_the_new_one_alone():
    absent()
    iwset_wpa("x", "12345678")
    iwset("another")
    note("status", joining.HANDSHAKE)
    assert wait_for(lambda: not followers())
    assert alive(supplicants()[-1])


# ---- secrets


@pytest.mark.parametrize("label, key, options", [
    ("WEP text", "q7z9k", {"enc": "open"}),
    ("WEP digits", "c0ffee1234", {"enc": "restricted"}),
    ("WPA phrase", "Zq7 secret phrase", {"enc": "open", "wpa": True}),
    ("WPA digits", "c0ffee12" * 8, {"enc": "open", "wpa": True}),
    ("refused", "Zq7sec", {"enc": "open", "wpa": True})])
def test_no_program_is_given_a_key(label, key, options):
    """Not in its arguments, not in its environment; one file holds it until the network is left."""
    trace = f"{machine.ROOT}/trace {label}"
    # strace follows the supplicant and its wpa_cli too, for as long as they live.
    tracer = threading.Thread(target=iwset, args=("home net", key), kwargs=dict(options, wrap=[
        "strace", "-f", "-v", "-s", "4096", "-e", "trace=execve,execveat", "-o", trace]))
    tracer.start()

    def ended():
        lines = read(trace).split(b"\n")[:-1]
        return lines and any(line.startswith(lines[0].split()[0]) and b"+++ exited" in line
                             for line in lines[1:])
    assert wait_for(ended)
    held = [path for path in glob.glob("/run/**", recursive=True)
            if os.path.isfile(path) and key.encode() in read(path)]
    for pid in supplicants() + machine.numbers("followers"):
        os.kill(pid, 9)
    tracer.join()
    lines = [line for line in read(trace).splitlines() if b"exec" in line]
    assert len(lines) > 5
    for secret in (key.encode(), key.encode().hex().encode()):
        assert [line for line in lines[1:] if secret in line] == []
    assert key.encode() not in read(f"{machine.LOG}/calls")
    assert held == ([] if label in ("refused", "WEP text") else [f"{STATE}/wpa_supplicant.conf"])
    assert run("lnk-ifdown", "wlan0")[0] == 0
    assert not os.path.exists(f"{STATE}/wpa_supplicant.conf")
