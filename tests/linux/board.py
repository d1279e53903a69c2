"""The two grammars of a device, read strictly as the program reads them: a reader that shares no
line with the program or with the commands under test."""

import re

KEYWORDS = (b"Address:", b"ESSID:", b"Mode:", b"Frequency:", b"Quality:", b"Encryption key:")
FIELDS = ("address", "essid", "mode", "frequency", "quality", "key")


def value(line, keyword, separator):
    """The text behind a keyword up to the separator; None when there is none."""
    position = line.find(keyword)
    if position < 0:
        return None
    text = line[position + len(keyword):].strip(b" \t\n\v\f\r")
    return text.split(separator)[0] if text else None


def networks(text):
    """The networks of a scan as dictionaries, in order."""
    lines = iter(text.splitlines(keepends=True))
    found = []
    for line in lines:
        if b"Cell" not in line:
            continue
        network = dict.fromkeys(FIELDS, b"")
        used = set()
        while True:
            assert len(line) <= 511, line
            for keyword, field in zip(KEYWORDS, FIELDS):
                if field in used:
                    continue
                text = value(line, keyword, b" " * 8 if field == "essid" else b" ")
                if text is not None:
                    used.add(field)
                    if field == "essid":
                        text = re.sub(rb'^"', b" ", text)
                        text = re.sub(rb'"$', b" ", text).strip(b" \t\n\v\f\r")
                    network[field] = text
                    break
            else:
                if value(line, b"Bit Rates:", b" ") is not None:
                    break
            line = next(lines, None)
            if line is None:
                break
        network["lines"] = len(used)
        found.append(network)
    return found


def interfaces(text):
    """The names under the header of the kernel's list; None when there is no header."""
    lines = text.split(b"\n")[:-1]
    for number, line in enumerate(lines):
        if line.startswith(b" face"):
            return [line.split(b":")[0].strip() for line in lines[number + 1:]]
    return None


def name_bytes(text):
    """The bytes that a name of the list stands for."""
    return re.sub(rb"\\x([0-9A-Fa-f]{2})", lambda m: bytes.fromhex(m[1].decode()), text)
