# SPDX-License-Identifier: MIT
"""cat of the device: every wireless interface in the kernel's list; otherwise the real cat."""

import os
import subprocess

import pytest

import board
import machine
from machine import choose, make_interfaces, make_wlan0, note, read, run, write
from scans import patient_for_a_second

PLAIN = (b"Inter-| sta-|   Quality        |   Discarded packets               | Missed | WE\n"
         b" face | tus | link level noise |  nwid  crypt   frag  retry   misc | beacon | 22\n")
IDLE = b"%6s: 0000    0     0     0        0      0      0      0      0        0\n"


def kernel(sample):
    return read(f"{machine.SAMPLES}/proc-net-wireless-{sample}.txt")


@pytest.fixture(autouse=True)
def kernel_list_is_a_stub():
    choose("cat")


@pytest.mark.parametrize("awk", machine.AWKS)
@pytest.mark.parametrize("sample, shown", [
    ("cfg80211-module-not-associated", "cfg80211-builtin-not-associated"),
    ("cfg80211-module-not-associated-mipsel", "cfg80211-builtin-not-associated"),
    ("associated", "associated"), ("associated-wpa2", "associated-wpa2"),
    ("cfg80211-builtin-not-associated", "cfg80211-builtin-not-associated")])
def test_one_interface_is_always_listed(sample, shown, awk):
    machine.install("awk", f"{machine.awk_directory(awk)}/awk")
    make_interfaces(("lo", 1, 772, ""), ("wlan0", 3, 1, "phy80211"), ("eth0", 2, 1, ""))
    note("wireless", kernel(sample))
    assert run("cat", "/proc/net/wireless") == (
        0, kernel(shown), b"")


def test_kernel_without_a_list():
    make_wlan0()
    assert run("cat", "/proc/net/wireless") == (0, PLAIN + IDLE % b"wlan0", b"")


def test_no_interface():
    make_interfaces(("lo", 1, 772, ""))
    assert run("cat", "/proc/net/wireless") == (0, PLAIN, b"")


def test_several_interfaces():
    make_interfaces(*((f"wlan{n}", 10 + n, 1, "phy80211") for n in range(6)))
    note("wireless", kernel("cfg80211-builtin-six"))
    assert run("cat", "/proc/net/wireless")[1] == kernel("cfg80211-builtin-six")
    make_interfaces(("wlan0", 4, 1, "wireless"), ("wlan0b", 5, 1, "phy80211"))
    note("wireless", kernel("cfg80211-builtin-two"))
    assert run("cat", "/proc/net/wireless")[1] == kernel("cfg80211-builtin-two")


def test_order_is_that_of_the_kernels_numbers():
    """Monitors are left out; what only the kernel's list knows is last."""
    make_interfaces(("wlan10", 12, 1, "phy80211"), ("wlan9", 9, 1, "phy80211"),
                    ("mon0", 5, 803, "phy80211"), ("a-15-letter-one", 100, 1, "phy80211"))
    note("wireless", PLAIN +
         b"wlan10: 0000   70.  -30.  -256        0      0      0      0      3        0\n"
         b" other: 0000    0     0     0        0      0      0      0      0        0\n")
    out = run("cat", "/proc/net/wireless")[1]
    assert board.interfaces(out) == [b"wlan9", b"wlan10", b"a-15-letter-one", b"other"]
    assert b"wlan10: 0000   70.  -30." in out


USES = b"""phy#1
\tUnnamed/non-netdev interface
\t\twdev 0x100000002
\t\ttype P2P-device
\tInterface wlan1
\t\tifindex 12
\t\tssid type monitor
\t\ttype %s
\t\ttxpower 20.00 dBm
phy#0
\tInterface wlan0
\t\tifindex 11
\t\ttype managed
"""


def interfaces(said=b""):
    status, out, err = run("cat", "/proc/net/wireless")
    assert (status, err) == (0, said)
    return board.interfaces(out)


@pytest.mark.parametrize("awk", machine.AWKS)
@pytest.mark.parametrize("use, offered", [
    (b"managed", True), (b"IBSS", True), (b"AP", False), (b"AP/VLAN", False), (b"monitor", False),
    (b"mesh point", False), (b"P2P-GO", False), (b"outside context of a BSS", False)])
def test_interface_of_another_use_is_not_offered(use, offered, awk):
    choose("cat", "iw")
    machine.install("awk", f"{machine.awk_directory(awk)}/awk")
    make_interfaces(("wlan0", 11, 1, "phy80211"), ("wlan1", 12, 1, "phy80211"))
    note("iw-dev", USES % use)
    for listed in (b"", b"", IDLE % b"wlan1" + IDLE % b"wlan0"):
        note("wireless", PLAIN + listed)
        assert interfaces() == [b"wlan0", b"wlan1"][:2 if offered else 1]


def test_access_point_that_we_host_stays():
    choose("cat", "iw")
    make_interfaces(("wlan0", 11, 1, "phy80211"), ("wlan1", 12, 1, "phy80211"))
    note("iw-dev", USES % b"AP")
    os.makedirs("/run/wireless-lan/wlan1")
    began = read("/proc/self/stat").rsplit(b")", 1)[1].split()[19]
    write("/run/wireless-lan/wlan1/supplicant.pid", b"%d %s\n" % (os.getpid(), began))
    assert interfaces() == [b"wlan0", b"wlan1"]
    write("/run/wireless-lan/wlan1/supplicant.pid", b"%d 1\n" % os.getpid())
    assert interfaces() == [b"wlan0"]


@pytest.mark.parametrize("named, offered", [
    ("wlan1", [b"wlan1"]), ("'wlan0'", [b"wlan0"]), ("wlan7", []), ("$(id)", []),
    ("a/b", [b"wlan0", b"wlan1"])])
def test_the_interface_that_the_administrator_names(named, offered):
    make_interfaces(("wlan0", 11, 1, "phy80211"), ("wlan1", 12, 1, "phy80211"))
    note("wireless", PLAIN + IDLE % b"wlan0" + IDLE % b"other")
    write("/etc/default/wireless-lan", f"COUNTRY=DE\nINTERFACE={named}\n")
    said = b"" if offered else \
        b"cat: %s, which /etc/default/wireless-lan names, is not there\n" % named.encode()
    assert [name for name in interfaces(said) if name != b"other"] == offered


@pytest.mark.parametrize("hangs", ["iw-hangs", "wireless-hangs"])
def test_driver_that_hangs(hangs):
    choose("cat", "iw")
    make_wlan0()
    note(hangs)
    assert run(patient_for_a_second("cat"), "/proc/net/wireless") == (
        0, PLAIN + IDLE % b"wlan0", b"")
    assert machine.wait_for(lambda: not machine.running("sleep"))


def test_every_other_file_is_the_real_tools():
    make_wlan0()
    file = f"{machine.ROOT}/file"
    write(file, b"a\0b")
    assert run("cat", file) == (0, b"a\0b", b"")
    assert run("cat", "-n", file) == (0, b"     1\ta\0b", b"")
    assert run("cat", "/proc/net/wireless", file)[0] == 1
    assert run("cat", "/nonexistent")[0] == 1
    out = subprocess.run("printf x | cat", shell=True, stdout=subprocess.PIPE, check=True,
                         env=machine.environment(machine.DEVICE)).stdout
    assert out == b"x"
