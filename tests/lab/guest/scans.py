# SPDX-License-Identifier: MIT
"""scans.py PREFIX IW...: what the tool iw (the words IW are how it is run) prints about many airs,
for the goldens: one file PREFIX-NN.txt a scan.

Every air is made of chance numbers with a seed of its own: names of every kind of byte, every kind
of encryption, hidden names, ad-hoc and mesh networks, elements as long as real ones, and elements
whose text tries to look like a network's."""

import os
import random
import subprocess
import sys

import air
from air import AIR, FAR, run, start
from probe import wait_until

AIRS = 9
STATION = "wlan0"
ADHOC, MESH = 5, 6
# A channel for each radio with access points; the last is in the 5 GHz band.
RADIOS = {1: ("g", 1), 2: ("g", 6), 3: ("g", 11), 4: ("a", 36)}

PHRASE = "wpa_passphrase=correct horse"
KINDS = {
    "open": [],
    "wep": ["auth_algs=1", "wep_default_key=0", "wep_key0=0102030405"],
    "wpa": ["wpa=1", "wpa_key_mgmt=WPA-PSK", "wpa_pairwise=TKIP", PHRASE],
    "wpa2": ["wpa=2", "wpa_key_mgmt=WPA-PSK", "rsn_pairwise=CCMP", PHRASE],
    "both": ["wpa=3", "wpa_key_mgmt=WPA-PSK", "wpa_pairwise=TKIP CCMP", PHRASE],
    "sha256": ["wpa=2", "wpa_key_mgmt=WPA-PSK WPA-PSK-SHA256", "rsn_pairwise=CCMP",
               "ieee80211w=1", PHRASE],
    "sae": ["wpa=2", "wpa_key_mgmt=SAE", "rsn_pairwise=CCMP", "ieee80211w=2",
            "sae_password=correct horse"],
    "h2e": ["wpa=2", "wpa_key_mgmt=SAE", "rsn_pairwise=CCMP", "ieee80211w=2", "sae_pwe=1",
            "sae_password=correct horse"],
    "transition": ["wpa=2", "wpa_key_mgmt=WPA-PSK SAE", "rsn_pairwise=CCMP",
                   "ieee80211w=1", PHRASE],
    "owe": ["wpa=2", "wpa_key_mgmt=OWE", "rsn_pairwise=CCMP", "ieee80211w=2"],
    "ft": ["wpa=2", "wpa_key_mgmt=WPA-PSK FT-PSK", "rsn_pairwise=CCMP", "mobility_domain=a1b2",
           "nas_identifier=lab", "ft_psk_generate_local=1", PHRASE],
    "company": ["wpa=2", "wpa_key_mgmt=WPA-EAP", "rsn_pairwise=CCMP", "ieee8021x=1",
                "own_ip_addr=127.0.0.1", "auth_server_addr=127.0.0.1",
                "auth_server_shared_secret=lab"],
}

NAMES = [
    b"cafe", b"home net", b"a\"b$(id)", b"\\", b"end\\", b"\\x41", b"a\\x41", b"\"", b"'", b"`id`",
    b"$HOME", b"%s%n", b"-n", b" blank at ends ", b"eight        blanks", b" ",
    b"Cell 99 - Address: x", b"ESSID:\"x\"", b"BSS 02:00:00:00:00:99(on wlan0)", b"SSID: x",
    b"\tfreq: 5180", b"line\nend", b"\r\n", "Café ☕".encode(), "Zürich Москва".encode(),
    "無線ネット".encode(), b"\xf0\x9f\x98\x80", b"\xff\xfe", b"\xc3", b"\xe2\x80\xae rtl", b"\x7f\x01",
    b"x" * 32, b"\xff" * 32, bytes(range(32)), bytes(range(224, 256)), "☕".encode() * 10, b"a\0b",
    b"\0a", b"<invalid: 33 bytes",
]


def element(number, data):
    return bytes([number, len(data)]) + data


def attribute(number, text):
    return number.to_bytes(2, "big") + len(text).to_bytes(2, "big") + text


def setup_element(dice):
    """What a router tells of itself for its push button; the tool prints its texts as they are."""
    forged = dice.choice((b"Router", b"A\nBSS 02:66:66:66:66:66(on wlan0)\n\tSSID: forged\n",
                          b"\n\tSSID: forged\n\tfreq: 1\n\tsignal: 99999 dBm\n\tcapability: IBSS",
                          b"\nBSS 02:66:66:66:66:6x;id(on x)\n\tSSID: $(id)\n\tfreq: \\x41"))
    return element(221, b"\0\x50\xf2\x04" + attribute(0x104a, b"\x10") + attribute(0x1044, b"\2")
                   + attribute(0x1021, forged) + attribute(0x1011, b"Living room \x1b[2J"))


def elements(dice):
    """Elements of other makers, up to the 400 bytes that real beacons have."""
    made = b""
    if dice.random() < 0.4:
        made += setup_element(dice)
    while len(made) < dice.choice((0, 0, 40, 200)):
        made += element(221, b"\2\0\0" + dice.randbytes(dice.randint(1, 80)))
    return made


def name(dice):
    if dice.random() < 0.6:
        return dice.choice(NAMES)
    size = dice.randint(1, 32)
    pool = dice.choice((bytes(range(256)), b"abc \\\"'x4", "äöü☕".encode() + b" a"))
    return bytes(dice.choice(pool) for _ in range(size))


def configuration(radio, networks, dice):
    """hostapd's file for the networks of a radio: (name, kind, hidden), the first one's first."""
    band, channel = RADIOS[radio]
    first = f"wlan{radio}"
    lines = [f"interface={first}", "driver=nl80211", f"hw_mode={band}", f"channel={channel}",
             "country_code=DE", f"ieee80211d={dice.randint(0, 1)}", "beacon_int=60",
             f"ieee80211n={dice.randint(0, 1)}", "wmm_enabled=1"]
    if band == "a":
        lines += [f"ieee80211ac={dice.randint(0, 1)}"]
    for index, (essid, kind, hidden) in enumerate(networks):
        if index:
            lines.append(f"bss={first}_{index}")
        lines += [f"bssid=02:00:00:00:{radio:02x}:{index:02x}", f"ssid2={essid.hex()}",
                  f"ignore_broadcast_ssid={hidden}"] + KINDS[kind]
        more = elements(dice)
        if more:
            lines.append(f"vendor_elements={more.hex()}")
    return "\n".join(lines) + "\n"


def put_on_air(radio, networks, dice):
    """Start a radio's access points; return the process, or None if this hostapd cannot."""
    path = f"/tmp/hostapd-{radio}.conf"
    with open(path, "w") as file:
        file.write(configuration(radio, networks, dice))
    process = start("hostapd", path, netns=AIR, log=f"hostapd-{radio}.log")
    last = f"wlan{radio}" if len(networks) == 1 else f"wlan{radio}_{len(networks) - 1}"
    wait_until(lambda: process.poll() is not None or "ssid" in run(
        "iw", "dev", last, "info", netns=AIR, check=False), "on the air", 60)
    if process.poll() is not None:
        print(f"radio {radio}: hostapd ended")
        return None
    run("iw", "dev", f"wlan{radio}", "set", "txpower", "fixed", str(100 * dice.randint(0, 20)),
        netns=AIR, check=False)
    return process


def own_networks(dice):
    """An ad-hoc network and a mesh; return what ends them."""
    adhoc, mesh = f"wlan{ADHOC}", f"wlan{MESH}"
    frequency = dice.choice(("2412", "2437", "2462"))
    key = dice.choice(([], ["key", "0:abcde"]))
    run("ip", "link", "set", adhoc, "down", netns=AIR)
    run("iw", "dev", adhoc, "set", "type", "ibss", netns=AIR)
    run("ip", "link", "set", adhoc, "up", netns=AIR)
    run("iw", "dev", adhoc, "ibss", "join", f"own {dice.randint(0, 9)}", frequency,
        "fixed-freq", f"02:00:00:00:05:{dice.randint(0, 255):02x}", *key, netns=AIR)
    run("ip", "link", "set", mesh, "down", netns=FAR)
    run("iw", "dev", mesh, "set", "type", "mp", netns=FAR)
    run("ip", "link", "set", mesh, "up", netns=FAR)
    run("iw", "dev", mesh, "mesh", "join", f"mesh {dice.randint(0, 9)}", "freq", "2437",
        "beacon-interval", "60", netns=FAR)

    def leave():
        run("iw", "dev", adhoc, "ibss", "leave", netns=AIR)
        run("iw", "dev", mesh, "mesh", "leave", netns=FAR)
    return leave


class Recorder:
    def __init__(self, prefix, tool):
        self.prefix, self.tool, self.number = prefix, tool, 0

    def keep(self, *words):
        """One more file: what the tool prints, if it prints a network."""
        def answered():
            # A simulated radio can hang in a scan; it is well again after a new start.
            done = subprocess.run(["timeout", "20", *self.tool, "dev", STATION, "scan", *words],
                                  stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False)
            self.text = done.stdout
            if done.returncode == 124:
                run("ip", "link", "set", STATION, "down")
                run("ip", "link", "set", STATION, "up")
            return done.returncode == 0
        wait_until(answered, lambda: f"scan {words}: {self.text}", 90)
        if b"BSS " not in self.text:
            return
        self.number += 1
        with open(f"{self.prefix}-{self.number:02d}.txt", "wb") as file:
            file.write(self.text)


def record(number, recorder):
    dice = random.Random(f"{recorder.prefix} {number}")
    kinds = list(KINDS)
    running, hidden, plain = [], None, f"Plain {number}"
    for radio in RADIOS:
        networks = []
        for _ in range(dice.randint(1, 3)):
            one = (name(dice), dice.choice(kinds), dice.choice((0, 0, 0, 1, 2)))
            networks.append(one)
            hidden = one[0] if one[2] == 1 and b"\0" not in one[0] else hidden
        if radio == 1:
            networks.append((plain.encode(), "open", 0))
        running.append(put_on_air(radio, networks, dice))
    leave = own_networks(dice) if number % 2 else None
    recorder.keep("flush")
    recorder.keep("flush", "passive")
    for frequency in ("2412", "2437", "2462", "5180"):
        recorder.keep("flush", "freq", frequency)
    if hidden:
        recorder.keep("freq", "2412", "2437", "2462", "5180", "ssid", os.fsdecode(hidden))
    run("iw", "dev", STATION, "connect", "-w", plain, check=False)
    recorder.keep("dump")
    run("iw", "dev", STATION, "disconnect", check=False)
    recorder.keep("freq", "2412", "5180", "2462")
    recorder.keep("dump")
    if leave:
        leave()
    for process in running:
        if process:
            process.terminate()
            process.wait()


def main():
    air.radios(MESH + 1)
    run("iw", "reg", "set", "DE")
    run("ip", "link", "set", STATION, "up")
    recorder = Recorder(sys.argv[1], sys.argv[2:])
    for number in range(AIRS):
        record(number, recorder)
        print(f"air {number}: {recorder.number} scans")


main()
