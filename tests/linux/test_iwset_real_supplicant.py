# SPDX-License-Identifier: MIT
"""What the real wpa_supplicant reads out of the files that iwset gives it."""

import random

import pytest

import joining
import machine
import parsing
from joining import iwset
from machine import STATE, read, sh, write


def read_back(field, *words, **options):
    """A field of the network, as the supplicant tells it."""
    joining.set_up()
    iwset(*words, **options)
    sh("umount", "/sys/class/net")
    path = f"{machine.ROOT}/real.conf"
    write(path, read(f"{machine.LOG}/conf").replace(STATE.encode(), machine.ROOT.encode()))
    process = parsing.start(path)
    try:
        return parsing.ask("get_network", "0", field)
    finally:
        process.terminate()
        process.wait(20)


@pytest.mark.parametrize("name", [b"cafe", b"a\"b$(id)", b"Caf\xc3\xa9", b"\n\x01", b"#",
                                  b"x" * 32])
def test_name(name):
    shown = read_back("ssid", name)
    assert name == (shown[1:-1] if shown[:1] == b'"' else bytes.fromhex(shown.decode()))


def phrases():
    generator = random.Random(11)
    return ["".join(generator.choice("\"#\\a '=%$") for _ in range(generator.randint(8, 20)))
            for _ in range(25)]


@pytest.mark.parametrize("key", ["12345678", "a\"b#c $(id)", "\"quoted\"", "ends in \\",
                                 "Löcher im Käse", "0" * 64, *phrases()])
def test_wpa_key(key):
    assert read_back("psk", "x", key, "open", wpa=True) == b"*"


@pytest.mark.parametrize("field, words, options, value", [
    ("key_mgmt", ("12345678", "open"), {"wpa": True}, b"WPA-PSK FT-PSK WPA-PSK-SHA256 SAE FT-SAE"),
    ("wep_tx_keyidx", ("abcde", "open"), {"index": "[3]"}, b"2"),
    ("wep_key2", ("abcde", "open"), {"index": "[3]"}, b"*"),
    ("auth_alg", ("abcde", "restricted"), {}, b"SHARED"),
    ("mode", (), {"mode": "Ad-Hoc"}, b"1"),
    ("proto", ("12345678", "open"), {"mode": "Ad-Hoc", "wpa": True}, b"RSN")])
def test_field(field, words, options, value):
    assert read_back(field, "x", *words, **options) == value
