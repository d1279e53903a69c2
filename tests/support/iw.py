# SPDX-License-Identifier: MIT
"""What the tool iw prints about a scan, read as a whole and without a line of the commands under
test, and the networks that are to come of it, written as text."""

import re

FIELDS = ("address", "name", "mode", "frequency", "quality", "key", "authentication")
MOST = 128  # networks that the window keeps
_BEGINNING = re.compile(rb"^BSS ((?:[0-9a-f]{2}:){5}[0-9a-f]{2})\(", re.M)
_NEEDS_NO_KEY = {b"OWE", b"00-0f-ac:18"}


def _first(block, pattern, otherwise=b""):
    """The group of PATTERN in the first line of BLOCK that it matches as a whole."""
    found = re.search(rb"^\t" + pattern + rb"$", block, re.M)
    return found[1] if found else otherwise


def _name(text):
    name = re.sub(rb"\\x([0-9a-f]{2})", lambda found: bytes.fromhex(found[1].decode()), text)
    return name if len(name) <= 32 and name.strip(b"\0") else b""


def _percent(block):
    """The kernel's older interface has 0 to 70 for -110 dBm to -40 dBm."""
    dbm = _first(block, rb"signal: (-?[\d.]+) dBm", None)
    if dbm is None:
        return min(int(_first(block, rb"signal: (\d+)/100")), 100)
    return int((min(max(float(dbm), -110), -40) + 110) * 100 / 70 + 0.5)


def _network(address, block):
    """A network; None for what no station joins."""
    capability = _first(block, rb"capability: (.*)").split()
    if not {b"ESS", b"IBSS"} & set(capability[:1]):
        return None
    suites = re.findall(rb"^\tRSN:(?:(?!^\t[^\t])[\s\S])*?^\t\t \* Authentication suites: (.*)",
                        block, re.M)
    protected = re.search(rb"^\t(RSN|WPA):", block, re.M)
    open_to_all = suites and all(one.strip() in _NEEDS_NO_KEY for one in suites) \
        and not re.search(rb"^\tWPA:", block, re.M)
    key = b"on" if b"Privacy" in capability and not open_to_all else b"off"
    megahertz = float(_first(block, rb"freq: (\d+(?:\.\d+)?)"))
    percent = _percent(block)
    return {"address": address.upper(), "name": _name(_first(block, rb"SSID: (.*)")),
            "mode": b"Master" if capability[0] == b"ESS" else b"Ad-Hoc",
            "frequency": b"%g" % (megahertz / 1000), "quality": b"%d/100" % percent, "key": key,
            "authentication": b"" if key == b"off" else b"WPA" if protected else b"WEP",
            "percent": percent}


def read_iw(text):
    """The networks of the tool's answer, strongest first: {field: bytes} of each."""
    pieces = _BEGINNING.split(text)[1:]
    met = [network for network in map(_network, pieces[0::2], pieces[1::2]) if network]
    named = {network["address"] for network in met if network["name"]}
    kept, waiting = [], {}
    for network in met:
        address, name = network["address"], network["name"]
        if not name and address in named:
            # Listed once with its name and once without: the name stands where the first did.
            if all(one["address"] != address for one in kept):
                waiting[address] = network
                kept.append(network)
        elif address in waiting:
            waiting.pop(address).update(network)
        elif all((one["address"], one["name"]) != (address, name) for one in kept):
            kept.append(network)
    kept.sort(key=lambda network: -network.pop("percent"))
    return kept[:MOST]


def records(networks):
    """Networks as lines of text: bytes that are no printable ASCII, and the backslash, as \\xNN."""
    lines = [f"networks: {len(networks)}"]
    for network in networks:
        lines.append("")
        for field in FIELDS:
            text = "".join(chr(byte) if 32 <= byte < 127 and byte != 92 else f"\\x{byte:02x}"
                           for byte in network[field])
            lines.append(f"{field}: {text}".rstrip(" "))
    return "\n".join(lines) + "\n"
