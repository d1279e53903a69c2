# SPDX-License-Identifier: MIT
"""What the real wpa_supplicant reads out of the configuration that is made of a preferred list."""

import glob
import os
import random
import re
import socket
import subprocess
import tempfile

import pytest

import machine
import parsing
from machine import read, write

CORPUS = os.path.join(machine.TOP, "tests", "fuzz", "corpus", "preferred_file")
LISTS = 1000


def hex_text(text):
    """A name as the list shows it: every byte as \\xNN."""
    return b"".join(b"\\x%02X" % byte for byte in text)


def random_name(generator):
    pool = generator.choice((bytes(range(1, 256)), b"abc \"#\\{}=\t$`'", b"\xc3\xa9\xe2\x98\x95a"))
    name = bytes(generator.choice(pool) for _ in range(generator.randint(1, 32)))
    if generator.random() < 0.5 or name != name.strip() or b"\\x" in name or \
            any(byte < 32 for byte in name):
        # 31 such bytes fill the field of a name.
        return name[:31], hex_text(name[:31])
    return name, name


def random_record(generator):
    """A record's eight lines, and the network that it stands for: name, kind and key; None for one
    that cannot be joined by itself."""
    name, shown = random_name(generator)
    wpa = generator.random() < 0.5
    enc = generator.choice((b"off", b"open", b"restricted"))
    adhoc = generator.random() < 0.1
    pool = generator.choice((b"0123456789abcdefABCDEF", b"\"#\\ '=%$`{}a", bytes(range(32, 127)),
                             bytes(range(1, 256))))
    size = generator.choice((5, 13, 16, 10, 26, 32, 8, 12, 63, 64)) \
        if generator.random() < 0.8 else generator.randint(1, 80)
    key = bytes(generator.choice(pool) for _ in range(size))
    key = key.replace(b"\n", b"n").replace(b"\r", b"r")
    index = generator.choice((0, 0, 1, 2, 3, 4, -1))
    lines = [b"USERCELL %d" % generator.randint(0, 99), b"ALIAS alias", b"ESSID " + shown,
             b"MODE " + (generator.choice((b"Ad-Hoc", b"ad-hoc")) if adhoc else b"Master"),
             b"KMGMT %d" % wpa, b"KINDEX %d" % index, b"Encryption " + enc, b"KEY " + key]
    text = b"\n".join(lines) + b"\n"
    if adhoc:
        return text, None
    digits = re.fullmatch(rb"[0-9A-Fa-f]+", key)
    if wpa and not (enc == b"off" and key == b"off"):
        if len(key) == 64 and digits:
            return text, (name, "psk", key.lower())
        if 8 <= len(key) <= 63 and not re.search(rb"[\x00-\x1f\x7f]", key):
            return text, (name, "phrase", key)
        return text, None
    if enc == b"off" or key == b"off":
        return text, (name, "open", b"")
    if not 0 <= index <= 3:
        return text, None
    if len(key) in (5, 13, 16):
        return text, (name, f"wep{index}", key.hex().encode())
    if len(key) in (10, 26, 32) and digits:
        return text, (name, f"wep{index}", key.lower())
    return text, None


class Supplicant:
    """The real one, on an interface without a radio, asked through its control socket."""

    def __init__(self):
        self.path = f"{machine.ROOT}/lists.conf"
        self.own = f"{machine.ROOT}/asking"
        self.head = f"ctrl_interface={parsing.control()}\nupdate_config=1\n".encode()
        write(self.path, self.head)
        self.process = parsing.start(self.path)
        self.socket = socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM)
        self.socket.settimeout(60)
        self.socket.bind(self.own)
        self.socket.connect(f"{parsing.control()}/parser0")

    def ask(self, question):
        self.socket.send(question)
        return self.socket.recv(65536)

    def networks(self, blocks):
        """What it makes of these blocks, as it would write them itself."""
        write(self.path, self.head + blocks)
        assert self.ask(b"RECONFIGURE") == b"OK\n", blocks
        assert self.ask(b"SAVE_CONFIG") == b"OK\n"
        return [dict(re.findall(rb"\t([a-z0-9_]+)=(.*)\n", block))
                for block in read(self.path).split(b"network={\n")[1:]]

    def end(self):
        self.socket.close()
        os.remove(self.own)
        self.process.kill()
        self.process.wait()


@pytest.fixture(scope="module")
def blocks_of():
    """The blocks of many lists, made by one shell."""
    def make(lists):
        directory = tempfile.mkdtemp(dir=machine.ROOT)
        for number, text in enumerate(lists):
            write(f"{directory}/{number}", text)
        script = (f'library={machine.DEVICE}/wireless-lan.sh; . "$library"\n'
                  f". {machine.DEVICE}/wpa-network.sh; . {machine.DEVICE}/preferred.sh\n"
                  f"cd {directory}; offered='WPA-PSK SAE '; for list in *; do\n"
                  "preferred_blocks $list >$list.out 2>$list.log; done")
        subprocess.run(["sh", "-c", script], check=True)
        return [(read(f"{directory}/{number}.out"), read(f"{directory}/{number}.log"))
                for number in range(len(lists))]
    return make


def text_of(field):
    """A text as the supplicant writes it: between quotation marks or as hexadecimal digits."""
    return field[1:-1] if field[:1] == b'"' else bytes.fromhex(field.decode())


def check(found, wanted, supplicant_text):
    name, kind, key = wanted
    assert text_of(found[b"ssid"]) == name, supplicant_text
    if kind == "phrase":
        # Where its parser would see a comment, the phrase comes as what it makes, beside itself.
        assert key in (text_of(found[b"psk"]), text_of(found.get(b"sae_password", b'""'))), key
    elif kind == "psk":
        assert found[b"psk"] == key
    elif kind == "open":
        assert found[b"key_mgmt"] == b"NONE" and not any(b"wep_key" in field for field in found)
    else:
        assert text_of(found[b"wep_key" + kind[3:].encode()]).hex().encode() == key
        assert found.get(b"wep_tx_keyidx", b"0") == kind[3:].encode()


def test_random_lists_reach_the_supplicant_byte_for_byte(blocks_of):
    generator = random.Random(16)
    lists = [[random_record(generator) for _ in range(generator.choice((1, 1, 2, 3)))]
             for _ in range(LISTS * 3 // 4)]
    texts = [b"".join(text for text, _ in one) for one in lists]
    for _ in range(LISTS - len(lists)):
        # Half written, with bytes changed, with lines lost.
        text = bytearray(generator.choice(texts[:len(lists)]))
        for _ in range(generator.randint(0, 3)):
            text[generator.randrange(len(text))] = generator.randrange(256)
        lines = bytes(text[:generator.randint(1, len(text))]).split(b"\n")
        del lines[generator.randrange(len(lines))]
        texts.append(b"\n".join(lines))
    texts += [read(path) for path in sorted(glob.glob(f"{CORPUS}/*"))]
    made = blocks_of(texts)
    supplicant = Supplicant()
    try:
        for number, (blocks, log) in enumerate(made):
            found = supplicant.networks(blocks)
            assert len(found) == blocks.count(b"network={"), blocks
            priorities = [int(one[b"priority"]) for one in found]
            assert priorities == sorted(set(priorities), reverse=True)
            if number >= len(lists):
                continue
            wanted = [network for _, network in lists[number] if network]
            assert len(found) == len(wanted), (texts[number], blocks, log)
            for one, network in zip(found, wanted):
                check(one, network, blocks)
            assert log.count(b"\n") == len(lists[number]) - len(wanted)
    finally:
        supplicant.end()


def test_at_most_64_networks(blocks_of):
    text = b"".join(b"USERCELL %d\nALIAS %d\nESSID n%d\nMODE Master\nKMGMT 0\nKINDEX 0\n"
                    b"Encryption off\nKEY off\n" % (n, n, n) for n in range(70))
    (blocks, log), = blocks_of([text])
    assert re.findall(rb"priority=(\d+)", blocks) == [b"%d" % n for n in range(64, 0, -1)]
    assert log == b""


@pytest.mark.parametrize("record, words", [
    (b"ALIAS Work\nESSID w\nMODE Master\nKMGMT 1\nKINDEX 0\nEncryption open\nKEY secret7\n",
     b"Work is left out: its key has an impossible length"),
    (b"ALIAS \x1b[2J\nESSID w\nMODE Ad-Hoc\nKMGMT 0\nKINDEX 0\nEncryption off\nKEY off\n",
     b"?[2J is left out: an Ad-Hoc network is joined by hand"),
    (b"ALIAS a\nESSID \nMODE Master\nKMGMT 0\nKINDEX 0\nEncryption off\nKEY off\n",
     b"a is left out: it has no name"),
    (b"ALIAS a\nESSID " + b"x" * 33 + b"\nMODE Master\nKMGMT 0\nKINDEX 0\nEncryption off\n"
     b"KEY off\n",
     b"a is left out: its name has more than 32 bytes"),
    (b"ALIAS a\nESSID w\nMODE Master\nKMGMT 0\nKINDEX 4\nEncryption open\nKEY abcde\n",
     b"a is left out: its key has no number from 1 to 4")])
def test_one_line_says_what_is_left_out(record, words, blocks_of):
    (blocks, log), = blocks_of([b"USERCELL 0\n" + record])
    assert (blocks, log) == (b"", b"sh: " + words + b"\n")
