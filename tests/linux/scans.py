# SPDX-License-Identifier: MIT
"""Scans for the tests: names that a careless program would spoil, answers of the real iwlist that
carry them, and the strict form of our own."""

import os
import random
import re
import shutil

import board
import machine
from machine import awk_directory, install, note, run

HOSTILE = [
    b"cafe", b"home net", b"a\"b$(id)", b"`id`", b"$HOME", b"\\", b"\\\\", b"end\\", b"'", b"\"",
    b"\"\"", b"%s%n%d", b"-n", b"--help", b"-", b"*", b"/etc/passwd", b"../..", b"a;id", b"a|id",
    b"a&b", b"<b>&amp;", b"#x", b"a # b", b"{", b"}", b"network={", b"ssid=x",
    b"Cell 99 - Address: x", b"Address:", b"ESSID:\"x\"", b"Mode:Ad-Hoc", b"Quality:1/1",
    b"Encryption key:off", b"Bit Rates:1", b"Caf\xc3\xa9 \xe2\x98\x95", b"\xf0\x9f\x98\x80",
    b"\t tab \t", b"line\nend", b"\r", b"\x7f\x01", b" ends ", b"eight        blanks",
    b"sixteen                 b", b" ", b"        ", b"\\x41", b"a\\x41", b"\\x41b", b"\\\\x41",
    b"\\x4", b"\\x5Cx41", b"\xff\xfe", b"\xc3", b"\xc0\xaf", b"\xed\xa0\x80", b"\xf4\x90\x80\x80",
    b"\xe2\x80\xae rtl", b"\xc2\x85", b"a\x00b", b"\x00a", b"x" * 32, b"\xff" * 31,
    b"\xff" * 32, bytes(range(224, 256)), b"\\X" + b"41" * 15, b"\\X4",
    b"\xe2\x98\x95" * 10, b"off", b"any", b"wpa", b"essid", b"[TEMP-DISABLED]",
    b"wpa_state=COMPLETED",
]


def hostile_names():
    """The names above and 400 chance ones."""
    generator = random.Random(7)
    names = list(HOSTILE)
    for _ in range(400):
        size = generator.randint(1, 31)
        pool = generator.choice((bytes(range(256)), b"\\x41 \"C", b" \\x\n",
                                 b"\xc3\xa9\xe2\x98\x95a"))
        names.append(bytes(generator.choice(pool) for _ in range(size)))
    return [name for name in names if name.strip(b"\0")]


def ends_like_an_escape(name):
    """Whether the text that iwlist prints for a name stands for another one too."""
    return re.search(rb"\\x[0-9A-Fa-f]{2}$", name)


def address_of(number):
    return b"02:00:00:00:%02X:%02X" % (number >> 8, number & 255)


def escape(name):
    """A name as iwlist prints it."""
    out = b""
    for place, byte in enumerate(name):
        rest = name[place:]
        literal = len(rest) > 4 and re.match(rb"\\x[0-9A-Fa-f]{2}", rest)
        out += b"\\x%02X" % byte if literal or byte < 32 or byte > 126 else bytes([byte])
    return out


def answer(names, elements=True):
    """An answer of iwlist for these (address, name) pairs."""
    out = b"wlan0     Scan completed :\n"
    for number, (address, name) in enumerate(names, 1):
        out += (b"          Cell %02d - Address: %s\n                    Channel:1\n"
                b"                    Frequency:2.412 GHz (Channel 1)\n"
                b"                    Quality=70/70  Signal level=-30 dBm  \n"
                b"                    Encryption key:off\n                    ESSID:\"%s\"\n"
                b"                    Bit Rates:1 Mb/s; 2 Mb/s; 5.5 Mb/s; 11 Mb/s; 6 Mb/s\n"
                b"                              9 Mb/s; 12 Mb/s\n"
                b"                    Mode:Master\n                    Extra:tsf=0000000000000000\n"
                % (number, address, escape(name)))
        if elements:
            out += b"                    IE: Unknown: 00%02X%s\n" % (
                len(name), name.hex().upper().encode())
    return out + b"\n"


def numbered(names):
    return [(address_of(number), name) for number, name in enumerate(names)]


def use_awk(name):
    """The commands find this awk."""
    install("awk", f"{awk_directory(name)}/awk")


def patient_for_a_second(command):
    """A command of the device whose limit is a second, so that no test waits longer for it."""
    directory = os.path.join(machine.ROOT, "hasty")
    shutil.copytree(machine.DEVICE, directory, dirs_exist_ok=True)
    path = os.path.join(directory, command)
    text = machine.read(path)
    hasty, changed = re.subn(rb"^patience=\d+$", b"patience=1", text, flags=re.M)
    assert changed == 1
    machine.write(path, hasty)
    return path


def convert(text):
    """What the iwlist of the device makes of an answer of the real one."""
    note("scan", text)
    status, out, err = run("iwlist", "wlan0", "scan")
    assert (status, err) == (0, b"")
    return out


def lines_of(out):
    """The lines of each network, without their margin; nothing else may be there."""
    lines = out.split(b"\n")
    assert lines[0].endswith(b"Scan completed :")
    assert lines[-2:] == [b"", b""]
    networks = []
    for line in lines[1:-2]:
        if line.startswith(b"          Cell "):
            networks.append([])
            assert line.startswith(b"          Cell %02d - Address: " % len(networks))
            networks[-1].append(line.strip().split(b" - ")[1])
        else:
            assert line.startswith(b" " * 20) and line[20:21] != b" "
            networks[-1].append(line[20:])
    return networks


def assert_form(out):
    """One line a keyword, in order."""
    for lines in lines_of(out):
        wanted = [b"Address", b"ESSID", b"Mode", b"Frequency", b"Quality", b"Encryption key",
                  b"Bit Rates"]
        if b"Encryption key:on" in lines:
            assert lines.pop(6) in (b"Authentication:WPA", b"Authentication:WEP")
        assert [line.split(b":")[0] for line in lines] == wanted


def portions(names):
    """So many at once as the list holds."""
    return [names[start:start + 128] for start in range(0, len(names), 128)]


def assert_names(out, names):
    """Every name comes back exactly, in order, with everything else a network has."""
    assert_form(out)
    found = board.networks(out)
    assert [board.name_bytes(cell["essid"]) for cell in found] == names
    assert {(cell["lines"], cell["key"]) for cell in found} == {(6, b"off")}
