# SPDX-License-Identifier: MIT
r"""The records beside the inputs of this directory, worked out from each input as a whole, without
the program.

scan/NAME.txt is the output of iwlist, scan/NAME.cells its networks; interfaces/NAME.txt is the
kernel's list, interfaces/NAME.names its interfaces; iw/NAME.txt is the output of the tool iw,
iw/NAME.cells its networks. Bytes that are no printable ASCII, and the backslash, are written as
\xNN. The inputs named real-... are the unchanged output of Wireless-Tools 30 and of Linux 6.1 on
simulated radios (mac80211_hwsim); so are those of iw whose names tell a kernel, which
tests/lab/record-scans makes. report-... are written by hand, in the form that other cards give.

For a new input: pytest tests/goldens --write-goldens"""

import pathlib

import pytest

from support.grammar import INTERFACE_LINE, SPACES, pieces, read_interfaces, read_scan
from support.iw import read_iw, records

HERE = pathlib.Path(__file__).parent
INPUTS = sorted(HERE.glob("*/*.txt"))
NETWORKS = 128
INTERFACES = 16
WIDTHS = {"address": 32, "essid": 128, "mode": 16, "frequency": 40, "quality": 16, "key": 4}


def fit(value, width):
    """What a field holds: whole UTF-8 characters."""
    if len(value) < width:
        return value
    end = width - 1
    for start in range(max(end - 3, 0), end):
        for stop in range(end + 1, start + 5):
            try:
                if len(value[start:stop].decode()) == 1:
                    return value[:start]
            except UnicodeDecodeError:
                pass
    return value[:end]


def shown(name, value):
    text = "".join(chr(byte) if 32 <= byte < 127 and byte != 92 else f"\\x{byte:02x}"
                   for byte in value)
    return f"{name}: {text}".rstrip(" ")


def networks_of(text):
    networks = read_scan(text)[:NETWORKS]
    lines = [f"networks: {len(networks)}"]
    for network in networks:
        lines.append("")
        for field, width in WIDTHS.items():
            lines.append(shown("channel" if field == "frequency" else field,
                               fit(network.get(field, b""), width)))
        lines.append(f"encmode: {({None: 0, b'off': 0, b'on': 1}).get(network.get('key'), 2)}")
    return lines


def interfaces_of(text):
    names = read_interfaces(text)
    if names is None:
        return ["interfaces: -1"]
    # The slot after the last interface holds what the last line read leaves in it.
    left = pieces(text, INTERFACE_LINE)[-1].split(b":")[0].strip(SPACES)
    return [f"interfaces: {min(len(names), INTERFACES)}"] + [
        shown("name", fit(name, INTERFACES)) for name in (names + [left])[:INTERFACES]]


def lines(rule):
    return lambda text: "\n".join(rule(text)) + "\n"


# What becomes of the inputs of a directory, and the suffix of the files with it.
RULES = {
    "scan": (lines(networks_of), ".cells"),
    "interfaces": (lines(interfaces_of), ".names"),
    "iw": (lambda text: records(read_iw(text)), ".cells"),
}


def test_there_are_inputs():
    assert {path.parent.name for path in INPUTS} == {"scan", "interfaces", "iw"}


@pytest.mark.parametrize("path", INPUTS, ids=lambda path: f"{path.parent.name}/{path.stem}")
def test_records(path, request):
    text, golden = RULES[path.parent.name]
    text, golden = text(path.read_bytes()), path.with_suffix(golden)
    if request.config.getoption("--write-goldens"):
        golden.write_text(text, encoding="ascii")
    assert golden.read_text(encoding="ascii") == text
