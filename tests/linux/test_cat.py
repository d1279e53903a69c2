# SPDX-License-Identifier: MIT
"""cat of the device: every wireless interface in the kernel's list; otherwise the real cat."""

import subprocess

import pytest

import board
import machine
from machine import choose, make_interfaces, make_wlan0, note, path_line, read, run, write

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
    make_interfaces(("lo", 1, 772, ""), ("wlan0", 3, 1, "phy80211"), ("eth0", 2, 1, ""))
    note("wireless", kernel(sample))
    assert run("cat", "/proc/net/wireless", path=path_line(machine.awk_directory(awk))) == (
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
