# SPDX-License-Identifier: MIT
"""iwlist of the device where the wireless extensions are of no use: the tool iw in their place."""

import glob
import os
import subprocess

import pytest

import board
import machine
from machine import SAMPLES, calls, choose, hide, make_wlan0, note, read, run, write
from scans import address_of, answer, assert_form, lines_of, patient_for_a_second
from support.iw import read_iw, records

GOLDENS = sorted(glob.glob(f"{machine.TOP}/tests/goldens/iw/*.txt"))
REASON = "/run/wireless-lan/reason"
TOO_MANY = b"wlan0     Failed to read scan data : Argument list too long\n\n"
NONE = b"wlan0     Interface doesn't support scanning.\n\n"
DENIED = b"command failed: Operation not permitted (-1)\n"


@pytest.fixture(autouse=True)
def card_without_extensions():
    choose("iwlist", "iw")
    make_wlan0()
    note("scan-error", NONE)


def network(name, dbm=b"-50.00 dBm", number=1, more=b"", capability=b"ESS Privacy (0x0011)"):
    """A network as iw prints it."""
    escaped = b"".join(
        b"\\x%02x" % byte if byte < 33 and (byte != 32 or place in (0, len(name) - 1)) or
        byte > 126 or byte == 92 else bytes([byte]) for place, byte in enumerate(name))
    return (b"BSS %s(on wlan0)\n\tlast seen: 13.599s [boottime]\n\tTSF: 0 usec (0d, 00:00:00)\n"
            b"\tfreq: 2412\n\tbeacon interval: 100 TUs\n\tcapability: %s\n\tsignal: %s\n"
            b"\tlast seen: 0 ms ago\n\tSSID: %s\n\tSupported rates: 1.0* 54.0 \n%s"
            % (address_of(number).lower(), capability, dbm, escaped, more))


def scan(*arguments, command="iwlist"):
    """The networks of a scan that goes well."""
    status, out, err = run(command, "wlan0", "scan", *arguments)
    assert (status, err) == (0, b"")
    assert_form(out)
    return board.networks(out)


def kinds(out):
    return [next((line[15:] for line in lines if line.startswith(b"Authentication:")), b"")
            for lines in lines_of(out)]


@pytest.mark.parametrize("awk", machine.AWKS)
def test_goldens(awk):
    """What iw prints on three kernels becomes the records beside it."""
    assert len(GOLDENS) >= 200
    rules = [part for name in ("networks", "from-iw")
             for part in ("-f", f"{machine.DEVICE}/{name}.awk")]
    for path in GOLDENS:
        out = b"wlan0     Scan completed :\n" + subprocess.run(
            [f"{machine.awk_directory(awk)}/awk", *rules, path], stdout=subprocess.PIPE, check=True,
            env={"LC_ALL": "C"}).stdout
        assert_form(out)
        found = [{**one, "name": board.name_bytes(one["essid"]), "authentication": kind}
                 for one, kind in zip(board.networks(out), kinds(out))]
        assert records(found) == read(path[:-4] + ".cells").decode(), path


@pytest.mark.parametrize("path", GOLDENS[::40], ids=os.path.basename)
def test_goldens_through_the_command(path):
    note("iw-scan", read(path))
    found = scan()
    wanted = read_iw(read(path))
    assert [(one["address"], board.name_bytes(one["essid"])) for one in found] == [
        (one["address"], one["name"]) for one in wanted]
    assert [call[1:] for call in calls("iw")] == [[b"dev", b"wlan0", b"scan"]]


@pytest.mark.parametrize("error", [
    TOO_MANY, NONE, b"wlan0     Interface doesn't support scanning : Operation not supported\n\n",
    b"wlan0     Interface doesn't support scanning : Invalid argument\n\n"])
def test_when_iw_is_asked(error):
    note("scan-error", error)
    note("iw-scan", network(b"cafe"))
    assert [one["essid"] for one in scan()] == [b"cafe"]


def test_without_iwlist():
    hide("iwlist")
    choose("iw")
    note("iw-scan", network(b"cafe"))
    assert [one["essid"] for one in scan()] == [b"cafe"]


def test_iw_is_not_asked_without_need():
    os.remove(f"{machine.LOG}/scan-error")
    note("scan", answer([(address_of(1), b"cafe")]))
    scan()
    assert calls("iw") == []


@pytest.mark.parametrize("iwlist", [True, False])
def test_without_iw(iwlist):
    hide("iw")
    hide("iwlist")
    choose(*(["iwlist"] if iwlist else []))
    note("scan-error", NONE)
    status, out, err = run("iwlist", "wlan0", "scan")
    assert (status, out) == (1, b"")
    assert err == b"iwlist: wlan0: " + (
        b"iwlist is refused here, and iw is not installed\n" if iwlist else
        b"neither iwlist nor iw is installed\n")
    assert read(REASON) == b"missing-tool iw\n"


def test_another_scan_is_waited_for():
    note("iw-busy", "1\n")
    note("iw-scan", network(b"cafe"))
    assert [one["essid"] for one in scan()] == [b"cafe"]
    assert len(calls("iw")) == 2


def test_scan_that_others_always_keep_busy():
    """What these have found is the answer; without any the error is."""
    note("iw-busy", "1000\n")
    note("iw-scan dump", network(b"cafe"))
    assert [one["essid"] for one in scan()] == [b"cafe"]
    assert calls("iw")[-1][1:] == [b"dev", b"wlan0", b"scan", b"dump"]


def test_nobody_may_scan():
    note("iw-scan-error", DENIED)
    status, out, err = run("iwlist", "wlan0", "scan")
    assert (status, out) == (255, b"")
    assert err == (b"iwlist: wlan0: the kernel lets not even root scan; is this a container?\n" +
                   DENIED + b"\n")
    assert read(REASON) == b"no-scan\n"
    machine.install("id", "/bin/false")
    assert run("iwlist", "wlan0", "scan")[2] == (
        b"iwlist: wlan0: only root may scan\n" + DENIED + b"\n")
    assert read(REASON) == b"not-root\n"
    note("iw-scan dump", network(b"cafe"))
    assert [one["essid"] for one in scan()] == [b"cafe"]


def test_iw_that_hangs():
    note("iw-hangs")
    status, out, err = run(patient_for_a_second("iwlist"), "wlan0", "scan")
    assert (status, out, err) == (124, b"", b"iwlist: wlan0: no answer after 1 seconds\n")
    assert read(REASON) == b"no-answer\n"
    assert machine.wait_for(lambda: not machine.running("sleep"))


def test_scan_that_takes_too_long():
    """What has been found so far is the answer."""
    note("iw-scan-hangs")
    note("iw-scan dump", network(b"cafe"))
    found = scan(command=patient_for_a_second("iwlist"))
    assert [one["essid"] for one in found] == [b"cafe"]
    assert machine.wait_for(lambda: not machine.running("sleep"))


def test_scan_that_takes_longer_than_iwlist_waits():
    """It has a limit of its own, 15 seconds, after which it has nothing to show."""
    late = b"wlan0     Failed to read scan data : Resource temporarily unavailable\n\n"
    note("scan-error", late)
    assert run("iwlist", "wlan0", "scan") == (255, b"", late)
    note("iw-scan dump", network(b"cafe"))
    assert [one["essid"] for one in scan()] == [b"cafe"]
    assert {tuple(call[1:]) for call in calls("iw")} == {(b"dev", b"wlan0", b"scan", b"dump")}


@pytest.mark.parametrize("error, reason", [
    (b"command failed: No such device (-19)\n", b"no-interface\n"),
    (b"command failed: Network is down (-100)\n", b"command failed: Network is down (-100)\n")])
def test_other_failures(error, reason):
    note("iw-scan-error", error)
    assert run("iwlist", "wlan0", "scan") == (255, b"", error + b"\n")
    assert read(REASON) == reason


def test_options():
    note("iw-scan", network(b"cafe"))
    note("iw-scan dump", network(b"cellar"))
    assert [one["essid"] for one in scan("essid", "a b $x")] == [b"cafe"]
    assert calls("iw")[-1][1:] == [b"dev", b"wlan0", b"scan", b"ssid", b"a b $x"]
    assert [one["essid"] for one in scan("last")] == [b"cellar"]


def test_country():
    write("/etc/default/wireless-lan", "COUNTRY=DE\n")
    note("iw-scan", network(b"cafe"))
    scan()
    assert calls("iw")[0][1:] == [b"reg", b"set", b"DE"]


@pytest.mark.parametrize("line, quality", [
    (b"-30.00 dBm", b"100/100"), (b"-40.00 dBm", b"100/100"), (b"-47.00 dBm", b"90/100"),
    (b"-75.00 dBm", b"50/100"), (b"-110.00 dBm", b"0/100"), (b"-127.00 dBm", b"0/100"),
    (b"54/100", b"54/100"), (b"200/100", b"100/100"), (b"99999 dBm", b"100/100")])
def test_signal(line, quality):
    note("iw-scan", network(b"cafe", line))
    assert scan()[0]["quality"] == quality


RSN = (b"\tRSN:\t * Version: 1\n\t\t * Group cipher: CCMP\n\t\t * Pairwise ciphers: CCMP\n"
       b"\t\t * Authentication suites: %s\n\t\t * Capabilities: (0x0000)\n")


@pytest.mark.parametrize("more, key, kind", [
    (b"", b"on", b"WEP"), (RSN % b"PSK", b"on", b"WPA"), (RSN % b"SAE", b"on", b"WPA"),
    (b"\tWPA:\t * Version: 1\n\t\t * Authentication suites: PSK\n", b"on", b"WPA"),
    (RSN % b"OWE", b"off", b""), (RSN % b"00-0f-ac:18", b"off", b""),
    (RSN % b"OWE PSK", b"on", b"WPA"), (RSN % b"OWE" + b"\tWPA:\t * Version: 1\n", b"on", b"WPA")])
def test_kind_of_key(more, key, kind):
    note("iw-scan", network(b"cafe", more=more))
    out = run("iwlist", "wlan0", "scan")[1]
    assert (board.networks(out)[0]["key"], kinds(out)) == (key, [kind])
    note("iw-scan", network(b"cafe", more=more, capability=b"ESS (0x0001)"))
    assert scan()[0]["key"] == b"off"


@pytest.mark.parametrize("capability, mode", [
    (b"ESS (0x0001)", b"Master"), (b"IBSS Privacy (0x0012)", b"Ad-Hoc"), (b"(0x0000)", None)])
def test_mode(capability, mode):
    """A mesh is nothing that a station joins."""
    note("iw-scan", network(b"cafe", capability=capability))
    assert [one["mode"] for one in scan()] == ([mode] if mode else [])


def test_every_name_comes_back():
    names = [bytes([byte]) * size for byte in range(1, 256) for size in (1, 32)]
    for start in range(0, len(names), 128):
        some = names[start:start + 128]
        note("iw-scan", b"".join(network(name, number=number) for number, name in enumerate(some)))
        assert [board.name_bytes(one["essid"]) for one in scan()] == some


def test_text_of_an_element_changes_no_other_value():
    """The maker's name of a router is printed as it is on the air."""
    forged = (b"\tWPS:\t * Version: 1.0\n\t\t * Manufacturer: \n\tSSID: forged\n\tfreq: 1\n"
              b"\tsignal: 9 dBm\n\tcapability: IBSS\nBSS 02:00:00:00:00:0g(on wlan0)\nBSS x\n")
    note("iw-scan", network(b"one", more=forged) + network(b"two", number=2))
    assert [(one["essid"], one["mode"], one["quality"]) for one in scan()] == [
        (b"one", b"Master", b"86/100"), (b"two", b"Master", b"86/100")]


def test_crowd_with_elements_of_real_length():
    """163 networks: the strongest 128, in order."""
    element = b"\tVendor specific: OUI 02:00:00, data:" + b" ff" * 400 + b"\n"
    note("scan-error", TOO_MANY)
    note("iw-scan", b"".join(
        network(b"%03d" % number, b"-%d.00 dBm" % (41 + number * 67 % 163 // 3), number, element)
        for number in range(163)))
    found = scan()
    assert len(found) == len({one["essid"] for one in found}) == 128
    levels = [int(one["quality"].split(b"/")[0]) for one in found]
    assert levels == sorted(levels, reverse=True)
    assert {one["essid"] for one in found} == {
        b"%03d" % number for number in sorted(
            range(163), key=lambda number: (number * 67 % 163 // 3, number))[:128]}


def test_error_of_a_card_that_is_none():
    """Nothing for iw to do: the real tool's answer stands."""
    subprocess.run(["umount", "/sys/class/net"], check=True)
    text = read(f"{SAMPLES}/iwlist-scan-error-not-wireless.txt")
    note("scan-error", text)
    assert run("iwlist", "lo", "scan") == (255, b"", text)
    assert calls("iw") == []


def test_where_busybox_is_the_only_userland():
    wrap = machine.in_busybox()
    note("iw-scan", read(GOLDENS[0]))
    status, out, err = run("iwlist", "wlan0", "scan", wrap=wrap)
    assert (status, err) == (0, b"")
    assert [board.name_bytes(one["essid"]) for one in board.networks(out)] == [
        one["name"] for one in read_iw(read(GOLDENS[0]))]
    choose("iwlist")
    note("scan", answer([(address_of(1), b"\xff" * 32)]))
    out = run("iwlist", "wlan0", "scan", wrap=wrap)[1]
    assert board.name_bytes(board.networks(out)[0]["essid"]) == b"\xff" * 32
    choose("iw")
    note("iw-link", "Connected to 02:00:00:00:0a:00 (on wlan0)\n")
    assert run("ap-address", "wlan0", wrap=wrap) == (0, b"02:00:00:00:0a:00\n", b"")
    choose("cat")
    note("wireless")
    out = run("cat", "/proc/net/wireless", wrap=wrap)[1]
    assert board.interfaces(out) == [b"wlan0"]
