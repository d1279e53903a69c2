# SPDX-License-Identifier: MIT
"""The two texts that a device prints, read and written without a line of the program: the output of
"iwlist IF scan" and the kernel's list of wireless interfaces (/proc/net/wireless)."""

import re

KEYWORDS = {b"Address:": "address", b"ESSID:": "essid", b"Mode:": "mode",
            b"Frequency:": "frequency", b"Quality:": "quality", b"Encryption key:": "key"}
SPACES = b" \t\n\f\r"
SCAN_LINE = 511  # bytes of a line that the program reads at once
INTERFACE_LINE = 254


def pieces(text, limit):
    """The lines as fgets returns them, up to their first NUL byte."""
    return [piece.split(b"\0")[0]
            for piece in re.findall(rb"[^\n]{%d}|[^\n]*\n|[^\n]+" % limit, text)]


def _value(line, keyword):
    """The text after a keyword up to the separator; empty when there is none."""
    text = line.partition(keyword)[2].strip(SPACES)
    return text.split(b" " * (8 if keyword == b"ESSID:" else 1))[0]


def _name(text):
    """A name without its quotes."""
    text = re.sub(rb'\A"', b" ", text)
    return re.sub(rb'"\Z', b" ", text).strip(SPACES)


def read_scan(text):
    """The networks of a scan in order, each {field: bytes} with the fields that it has; fields are
    the values of KEYWORDS."""
    networks, is_open = [], False
    for line in pieces(text, SCAN_LINE):
        if not is_open:
            if b"Cell" not in line:
                continue
            is_open = True
            networks.append({})
        network = networks[-1]
        for keyword, field in KEYWORDS.items():
            value = _value(line, keyword)
            if value and field not in network:
                network[field] = _name(value) if field == "essid" else value
                break
        else:
            is_open = not _value(line, b"Bit Rates:")
    return networks


def read_interfaces(text):
    """The lines below the header of the kernel's list, each up to its first colon; None when there
    is no header."""
    lines = pieces(text, INTERFACE_LINE)
    for number, line in enumerate(lines):
        if line.startswith(b" face"):
            return [line.split(b":")[0].strip(SPACES) for line in lines[number + 1:]]
    return None


def to_bytes(text):
    """A text as bytes; a byte that is no UTF-8 is a surrogate in it."""
    return text if isinstance(text, bytes) else text.encode("utf-8", "surrogateescape")


def scan_text(*networks):
    """The output of a scan, from (essid, key, quality, mode, address) of each network; all but the
    name may be left out: "off", "70/100", "Master", 02:00:00:00:00:01 and so on."""
    lines = [b"wlan0     Scan completed :"]
    for number, network in enumerate(networks, 1):
        network = (network,) if isinstance(network, (str, bytes)) else network
        standard = (None, "off", "70/100", "Master",
                    f"02:00:00:00:{number // 256:02X}:{number % 256:02X}")
        essid, key, quality, mode, address = (
            to_bytes(value) for value in tuple(network) + standard[len(network):])
        lines += [
            b"          Cell %02d - Address: %s" % (number, address),
            b'                    ESSID:"%s"' % essid,
            b"                    Mode:" + mode,
            b"                    Frequency:2.437 GHz (Channel 6)",
            b"                    Quality:%s  Signal level:-50 dBm  Noise level:-95 dBm" % quality,
            b"                    Encryption key:" + key,
            b"                    Bit Rates:54 Mb/s",
        ]
    return b"\n".join(lines) + b"\n\n"
