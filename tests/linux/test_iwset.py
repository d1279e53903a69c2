# SPDX-License-Identifier: MIT
"""iwset: what the supplicant is given, what is refused, what is left, and that no key leaks."""

import contextlib
import glob
import hashlib
import os
import re
import signal
import subprocess
import threading
import time

import pytest

import board
import joining
import machine
from joining import configuration, iwset, iwset_wpa
from machine import STATE, alive, calls, forget, note, read, run, supplicants, wait_for, write
from scans import HOSTILE, answer, convert, numbered


@pytest.fixture(autouse=True)
def every_join_succeeds():
    joining.set_up("iwlist")


OPEN = {b"ssid": b"63616665", b"scan_ssid": b"1", b"key_mgmt": b"NONE"}
WPA = {b"ssid": b"686f6d65206e6574", b"scan_ssid": b"1"}
ALL_MANAGEMENTS = b"WPA-PSK WPA-PSK-SHA256 FT-PSK SAE FT-SAE"


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


@pytest.mark.parametrize("index, key, digits, enc, algorithm", [
    (1, "abcde", b"6162636465", "open", b"OPEN"),
    (2, "0123456789", b"0123456789", "restricted", b"SHARED"),
    (3, "thirteen char", b"746869727465656e2063686172", "restricted", b"SHARED"),
    (4, "0123456789abcdefABCDEF0123", b"0123456789abcdefABCDEF0123", "open", b"OPEN")])
def test_wep(index, key, digits, enc, algorithm):
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
    assert configuration() == {**WPA, b"key_mgmt": b"WPA-PSK WPA-PSK-SHA256 FT-PSK",
                               b"psk": key.encode()}


AD_HOC = {b"ssid": b"64657669636520", b"scan_ssid": b"1", b"mode": b"1", b"frequency": b"2412"}
HOSTED = {**AD_HOC, b"scan_freq": b"2412"}  # nothing is looked for on other channels


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
    assert configuration() == {**(AD_HOC if more.get("index", "[1]") else HOSTED), **wanted}


# ---- names


def names_read(names, shell, awk):
    """What iwset makes of names: a process for each would take minutes."""
    machine.install("awk", f"{machine.awk_directory(awk)}/awk")
    text = (f'library={machine.DEVICE}/wireless-lan.sh; . "$library"\n'
            '. "${library%/*}/wpa-network.sh"\n'
            'for name in "$@"; do name_hex "$name"; done')
    out = subprocess.run([*(shell or ["sh"]), "-c", text, "iwset", *names],
                         env=machine.environment(), stdout=subprocess.PIPE, check=True).stdout
    return [bytes.fromhex(line.decode()) for line in out.split()]


@pytest.mark.parametrize("shell, awk", list(zip(machine.SHELLS, machine.AWKS)))
def test_what_the_list_shows_gives_the_name_back(shell, awk):
    names = [name for name in HOSTILE if name.strip(b"\0")]
    found = board.networks(convert(answer(numbered(names))))
    assert names_read([cell["essid"] for cell in found], shell, awk) == names


@pytest.mark.parametrize("shell, awk", list(zip(machine.SHELLS, machine.AWKS)))
def test_the_name_itself(shell, awk):
    names = [name for name in HOSTILE
             if b"\0" not in name and not re.search(rb"\\x[0-9A-Fa-f]{2}", name)]
    assert names_read(names, shell, awk) == names


@pytest.mark.parametrize("name", [b"a\"b$(id)", b"\\", b"-n", b"line\nend", b"\xff\xfe", b"*",
                                  b" "])
def test_name_arrives(name):
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


def assert_refused_after_leaving(words, word):
    result = assert_refused(1, words)
    assert reason() == f"{word}\n".encode()
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
    assert_refused_after_leaving(joining.arguments(name), "bad-name")


@pytest.mark.parametrize("key", ["1234", "123456", "123456789", "12345678901",
                                 "0123456789abcdefABCDEF012x", "x" * 40])
def test_refused_wep_key(key):
    result = assert_refused_after_leaving(joining.arguments("x", key, "open"), "bad-wep-key")
    assert key.encode() not in result[1] + result[2]


@pytest.mark.parametrize("key", ["1234567", "x" * 64, "0" * 63 + "g", "0" * 65, "off", "",
                                 "12345678\t", "1234567\n8", "1234567\x7f8"])
def test_refused_wpa_key(key):
    result = assert_refused_after_leaving(joining.arguments("x", key, "open", wpa=True),
                                          "bad-wpa-key")
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
    """The process numbers of those that watch a join, without the subshells of each."""
    found = [pid for pid, line in machine.command_lines().items() if b"/iwset\0" in line]
    parents = {pid: read(f"/proc/{pid}/stat").rpartition(b") ")[2].split()[1:2] for pid in found}
    return [pid for pid in found if not any(parent.decode() in found for parent in parents[pid])]


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
    assert wait_for(lambda: len(followers()) == 1)
    old = followers()
    iwset("another")
    # What is noted now would be about the new network too, for whoever follows that.
    for pid in followers():
        if pid not in old:
            os.kill(int(pid), signal.SIGKILL)
    note("status", joining.HANDSHAKE)
    note("networks", joining.DISABLED)
    assert wait_for(lambda: not any(alive(pid) for pid in old))
    assert alive(supplicants()[-1])


def test_follower_of_an_old_network_leaves_the_reason_of_a_refused_key():
    note("slow-status")
    assert iwset("cafe")[0] == 0
    assert wait_for(lambda: [call for call in calls("wpa_cli") if call[-1] == b"status"])
    assert run("iwset", *joining.arguments("x", "1234", "open"))[0] == 1
    forget("slow-status")
    assert wait_for(lambda: not followers())
    assert reason() == b"bad-wep-key\n"


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
    stopped = set()

    # What is slow to begin notes its number after the others.
    def all_stopped():
        for pid in {*supplicants(), *machine.numbers("followers")} - stopped:
            with contextlib.suppress(ProcessLookupError):  # the command has ended it
                os.kill(pid, signal.SIGKILL)
            stopped.add(pid)
        return not tracer.is_alive()
    assert wait_for(all_stopped)
    lines = [line for line in read(trace).splitlines() if b"exec" in line]
    assert len(lines) > 5
    for secret in (key.encode(), key.encode().hex().encode()):
        assert [line for line in lines[1:] if secret in line] == []
    assert key.encode() not in read(f"{machine.LOG}/calls")
    assert held == ([] if label in ("refused", "WEP text") else [f"{STATE}/wpa_supplicant.conf"])
    assert run("lnk-ifdown", "wlan0")[0] == 0
    assert not os.path.exists(f"{STATE}/wpa_supplicant.conf")


# ---- what the supplicant and the radio can do


def test_management_frames_are_protected_where_the_driver_can():
    """Asked for in the network, a driver that cannot would fail like a wrong key."""
    iwset_wpa("home net", "12345678")
    common, networks = joining.whole_configuration()
    assert common == {b"pmf": b"1", b"sae_pwe": b"2"}
    assert len(networks) == 1 and b"ieee80211w" not in networks[0]


@pytest.mark.parametrize("offer, managements, common", [
    ("WPA-EAP WPA-PSK", b"WPA-PSK WPA-PSK-SHA256", {b"pmf": b"1"}),
    ("WPA-PSK SAE", b"WPA-PSK WPA-PSK-SHA256 SAE", {b"pmf": b"1", b"sae_pwe": b"2"}),
    ("NONE WPA-EAP", b"WPA-PSK", {})])
def test_only_what_the_supplicant_can_do_is_asked_of_it(offer, managements, common):
    note("capability-key_mgmt", offer + "\n")
    assert iwset_wpa("home net", "12345678")[0] == 0
    assert joining.whole_configuration()[0] == common
    assert configuration()[b"key_mgmt"] == managements


@pytest.mark.parametrize("words, managements, common", [
    ("sae_pwe", ALL_MANAGEMENTS, {b"pmf": b"1"}),             # older than hash to element
    ("sae_pwe\nFT-SAE", b"WPA-PSK WPA-PSK-SHA256 FT-PSK SAE", {b"pmf": b"1"}),
    ("sae_pwe\nFT-SAE\nSHA256", b"WPA-PSK FT-PSK SAE", {b"pmf": b"1"}),
    ("SAE\nsae_pwe\nFT-", b"WPA-PSK", {}), ("pmf", b"WPA-PSK", {})])
def test_what_it_refuses_all_the_same_is_left_out(words, managements, common):
    """One word that a build does not know makes it refuse the whole file."""
    note("refused-words", words)
    assert iwset_wpa("home net", "12345678")[0] == 0
    assert joining.whole_configuration()[0] == common
    assert configuration()[b"key_mgmt"] == managements


def test_open_network_that_may_encrypt():
    iwset("cafe")
    networks = joining.whole_configuration()[1]
    assert networks == [{**OPEN, b"key_mgmt": b"OWE"}, OPEN]
    note("capability-key_mgmt", "NONE WPA-PSK\n")
    iwset("cafe")
    assert joining.whole_configuration()[1] == [OPEN]


def reason():
    return read("/run/wireless-lan/reason")


@pytest.mark.parametrize("refuses", ["file", "network"])
def test_wep_with_a_supplicant_that_has_none(refuses):
    if refuses == "file":
        note("refused-words", "wep_key")
    else:
        note("networks", "network id / ssid / bssid / flags\n0\tx\tany\t[DISABLED]\n")
    assert iwset("old wep", "abcde", "open") == (
        1, b"", b"iwset: this wpa_supplicant was built without WEP\n")
    assert reason() == b"no-wep\n"
    assert not alive(supplicants()[-1])


def test_country():
    os.makedirs("/etc/default", exist_ok=True)
    write("/etc/default/wireless-lan", "COUNTRY=DE\n")
    iwset("cafe")
    os.remove("/etc/default/wireless-lan")
    assert joining.whole_configuration()[0][b"country"] == b"DE"


@pytest.mark.parametrize("tool", ["wpa_supplicant", "wpa_cli"])
def test_missing_tool_is_named(tool):
    os.rename(f"/usr/sbin/{tool}", f"/usr/sbin/{tool}.away")
    os.remove(f"{machine.CHOSEN}/{tool}")
    try:
        assert iwset("cafe") == (
            1, b"", f"iwset: {tool} is missing: it has to be installed\n".encode())
    finally:
        os.rename(f"/usr/sbin/{tool}.away", f"/usr/sbin/{tool}")
    assert reason() == f"missing-tool {tool}\n".encode()


# ---- the radio


def make_radio(soft, hard):
    radio = "/sys/class/net/wlan0/phy80211/rfkill7"
    os.makedirs(radio)
    write(f"{radio}/soft", f"{soft}\n")
    write(f"{radio}/hard", f"{hard}\n")
    return f"{radio}/soft"


def test_soft_block_is_lifted():
    soft = make_radio(1, 0)
    assert iwset("cafe")[0] == 0
    assert read(soft) == b"0\n"
    assert reason() == b""


def test_hard_block_is_named():
    make_radio(0, 1)
    assert iwset("cafe") == (
        1, b"", b"iwset: a switch on the machine has turned the radio of wlan0 off\n")
    assert reason() == b"rfkill-hard\n"
    assert calls("wpa_supplicant") == []


# ---- hosting


def hosts(**options):
    return iwset("device ", index=None, mode="Ad-Hoc", **options)


@pytest.mark.parametrize("modes, mode", [("IBSS AP MESH", b"1"), ("AP", b"2")])
def test_hosting_as_the_driver_can(modes, mode):
    note("capability-modes", modes + "\n")
    assert hosts()[0] == 0
    assert configuration() == {**HOSTED, b"mode": mode, b"key_mgmt": b"NONE"}
    assert os.path.exists(f"{STATE}/hosting") == (mode == b"2")
    assert reason() == b""


def test_hosting_that_the_driver_cannot():
    note("capability-modes", "\n")
    assert hosts() == (1, b"", b"iwset: the driver of wlan0 can host no network\n")
    assert reason() == b"no-hosting\n"


def test_hosting_that_does_not_come_about():
    note("status", "wpa_state=SCANNING\n")
    assert hosts() == (1, b"", b"iwset: wlan0 can host no network\n")
    assert reason() == b"no-hosting\n"
    assert not alive(supplicants()[-1])


# ---- events


BSS = "02:00:00:00:00:01"


@pytest.mark.parametrize("event", [
    'CTRL-EVENT-SSID-TEMP-DISABLED id=0 ssid="x" auth_failures=1 duration=10 reason=WRONG_KEY',
    f"CTRL-EVENT-AUTH-REJECT {BSS} auth_type=3 auth_transaction=2 status_code=15",
    # hostapd's answer: it says no more
    f"CTRL-EVENT-AUTH-REJECT {BSS} auth_type=3 auth_transaction=2 status_code=1"])
def test_event_of_a_wrong_key(event):
    """A wrong key of WPA3 shows in no state: that stays AUTHENTICATING."""
    note("status", "wpa_state=AUTHENTICATING\n")
    joining.event(event)
    if event.endswith("=1"):
        joining.event(f"SME: Trying to authenticate with {BSS} (SSID='x' freq=2437 MHz)")
        joining.event(event)
    assert iwset_wpa("x", "12345678") == (1, b"", b"iwset: the access point refuses the key\n")
    assert reason() == b"wrong-key\n"
    assert not alive(supplicants()[-1])


@pytest.mark.parametrize("event, word", [
    (f"CTRL-EVENT-ASSOC-REJECT bssid={BSS} status_code=17", b"refused\n"),
    (f"CTRL-EVENT-AUTH-REJECT {BSS} auth_type=0 auth_transaction=2 status_code=17", b"refused\n"),
    (f"CTRL-EVENT-AUTH-REJECT {BSS} auth_type=3 auth_transaction=2 status_code=1", b"refused\n"),
    ("CTRL-EVENT-NETWORK-NOT-FOUND ", b"not-found\n"),
    # a name that says what the supplicant would
    ('CTRL-EVENT-SSID-TEMP-DISABLED id=0 ssid="<3>CTRL-EVENT-CONNECTED reason=WRONG_KEY" '
     "auth_failures=1 duration=10 reason=CONN_FAILED", b"")])
def test_event_that_decides_nothing_yet(event, word):
    note("status", "wpa_state=AUTHENTICATING\n")
    joining.event(event)
    begin = time.monotonic()
    assert iwset_wpa("x", "12345678") == (0, b"", b"")
    assert time.monotonic() - begin > 10, "it is given its time"
    assert reason() == word
    late = supplicants()[-1]
    assert alive(late)
    # The key is in no list of processes for as long as the join is watched.
    assert followers()
    assert not [line for line in machine.command_lines().values() if b"12345678" in line]
    joining.event(f"CTRL-EVENT-CONNECTED - Connection to {BSS} completed [id=0 id_str=]")
    assert wait_for(lambda: not followers())
    assert reason() == b""
    assert alive(late)


def test_open_network_that_is_out_of_reach():
    """It is not waited for, but whoever waits finds the reason before the watch is over."""
    note("status", "wpa_state=SCANNING\n")
    assert joining.iwset("Nowhere") == (0, b"", b"")
    assert wait_for(lambda: reason() == b"not-found\n")
    assert followers()
    joining.event(f"CTRL-EVENT-CONNECTED - Connection to {BSS} completed [id=0 id_str=]")
    assert wait_for(lambda: not followers())
    assert reason() == b""


def test_follower_waits_for_its_turn():
    """It must not end what another command has just begun."""
    note("status", "wpa_state=AUTHENTICATING\n")
    iwset_wpa("x", "12345678")
    late = supplicants()[-1]
    other = subprocess.Popen(["flock", f"{STATE}/lock", "sleep", "600"])
    assert wait_for(lambda: subprocess.run(["flock", "-n", f"{STATE}/lock", "true"],
                                           check=False).returncode != 0)
    joining.event(f"CTRL-EVENT-AUTH-REJECT {BSS} auth_type=3 auth_transaction=2 status_code=15")
    # Another command has started a supplicant of its own meanwhile.
    new = subprocess.Popen(["sleep", "600"])
    machine_time = read(f"/proc/{new.pid}/stat").rsplit(b")", 1)[1].split()[19].decode()
    write(f"{STATE}/supplicant.pid", f"{new.pid} {machine_time}\n")
    subprocess.run(["pkill", "-P", str(other.pid)], check=False)
    other.kill()
    other.wait()
    assert wait_for(lambda: not followers())
    assert new.poll() is None and alive(late)
    assert os.path.exists(f"{STATE}/wpa_supplicant.conf")


# ---- after a command that was killed


def test_killed_while_the_supplicant_starts():
    """Power button, out of memory: the supplicant stays, and no note says which it is."""
    note("slow-supplicant")
    killed = machine.start("iwset", *joining.arguments("x"))
    assert wait_for(supplicants)
    killed.kill()
    killed.wait()
    forget("slow-supplicant")
    left = supplicants()[-1]
    assert alive(left) and not os.path.exists(f"{STATE}/supplicant.pid")
    assert iwset("cafe")[0] == 0
    assert [alive(pid) for pid in supplicants()] == [False, True]
    os.remove(f"{STATE}/supplicant.pid")
    assert run("lnk-ifdown", "wlan0")[0] == 0
    assert not any(alive(pid) for pid in supplicants())


# ---- busybox as the only userland


@pytest.mark.parametrize("name, options", [
    ("cafe", {}), ("old wep", {"key": "abcde", "enc": "open"}),
    ("home net", {"key": "12345678", "enc": "open", "wpa": True})])
def test_in_busybox(name, options):
    assert iwset(name, wrap=machine.in_busybox(), **options) == (0, b"", b"")
    assert configuration()[b"ssid"] == name.encode().hex().encode()
    assert run("lnk-ifdown", "wlan0", wrap=machine.in_busybox()) == (0, b"", b"")
    assert not alive(supplicants()[-1])
