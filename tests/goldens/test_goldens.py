#!/usr/bin/python3
"""Works out the records that stand beside the inputs of this folder, by reading each input as a
whole, without the program. Without arguments it compares them with the files; with --write it
writes the files, to be read before they are committed.

scan/NAME.txt is the output of iwlist, scan/NAME.cells its networks; interfaces/NAME.txt is the
kernel's list, interfaces/NAME.names its interfaces. Bytes that are no printable ASCII, and the
backslash, stand as \\xNN. The inputs named real-... are the unchanged output of Wireless-Tools 30
and of Linux 6.1 on simulated radios (mac80211_hwsim)."""

import pathlib
import sys

HERE = pathlib.Path(__file__).parent
sys.path.insert(0, str(HERE.parent))
from support.grammar import INTERFACE_LINE, SPACES, pieces, read_interfaces, read_scan  # noqa: E402

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


def shown(value):
    return "".join(chr(b) if 32 <= b < 127 and b != 92 else "\\x%02x" % b for b in value)


def scan(text):
    networks = read_scan(text)[:128]
    out = ["networks: %d" % len(networks)]
    for found in networks:
        out.append("")
        for field, width in WIDTHS.items():
            name = "channel" if field == "frequency" else field
            value = shown(fit(found.get(field, b""), width))
            out.append(("%s: %s" % (name, value)).rstrip(" "))
        out.append("encmode: %d" % {None: 0, b"off": 0, b"on": 1}.get(found.get("key"), 2))
    return out


def interfaces(text):
    names = read_interfaces(text)
    if names is None:
        return ["interfaces: -1"]
    count = min(len(names), 16)
    # One slot more than there are lines holds what the last piece leaves in the buffer.
    last = pieces(text, INTERFACE_LINE)[-1].split(b":")[0].strip(SPACES)
    return ["interfaces: %d" % count] + [
        ("name: %s" % shown(fit(name, 16))).rstrip(" ") for name in (names + [last])[:16]]


def main():
    wrong = []
    inputs = sorted(HERE.glob("*/*.txt"))
    for path in inputs:
        rule, suffix = (scan, ".cells") if path.parent.name == "scan" else (interfaces, ".names")
        text = "\n".join(rule(path.read_bytes())) + "\n"
        target = path.with_suffix(suffix)
        if "--write" in sys.argv:
            target.write_text(text)
        elif not target.exists() or target.read_text() != text:
            wrong.append(target.name)
    print("%d goldens, %d differ %s" % (len(inputs), len(wrong), " ".join(wrong)))
    return 1 if wrong or not inputs else 0


if __name__ == "__main__":
    sys.exit(main())
