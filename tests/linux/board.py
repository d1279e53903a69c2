# SPDX-License-Identifier: MIT
"""The two grammars of a device, read strictly: no line is longer than the program reads at once."""

import os
import re
import sys

sys.path.insert(0, os.path.dirname(os.path.dirname(os.path.abspath(__file__))))
from support.grammar import KEYWORDS, SCAN_LINE, read_interfaces, read_scan  # noqa: E402


def networks(text):
    """The networks of a scan with all their fields and the number of those found, in order."""
    assert all(len(line) <= SCAN_LINE for line in text.splitlines(keepends=True))
    return [{**dict.fromkeys(KEYWORDS.values(), b""), **network, "lines": len(network)}
            for network in read_scan(text)]


interfaces = read_interfaces


def name_bytes(text):
    """The bytes that a name of the list stands for."""
    if re.fullmatch(rb"\\X[0-9A-F]{64}", text):
        return bytes.fromhex(text[2:].decode())
    return re.sub(rb"\\x([0-9A-Fa-f]{2})", lambda m: bytes.fromhex(m[1].decode()), text)
