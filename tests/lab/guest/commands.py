# SPDX-License-Identifier: MIT
"""The device's commands without the window."""

import re
import subprocess

from air import run
from probe import wait_until
from steps import same


def iwset(name, key="off", enc="off", card="wlan0"):
    """Joins as the window does; the status and what was said."""
    words = [card, "essid", name, "mode", "Managed", "key", key, "enc", enc]
    words = ["wpa", *words] if enc != "off" else [*words, "[1]"]
    done = subprocess.run(["/sbin/iwset", *words], stdout=subprocess.PIPE,
                          stderr=subprocess.STDOUT, check=False, timeout=60)
    return done.returncode, done.stdout.decode(errors="replace")


def supplicant(*words, card="wlan0"):
    """One answer of our supplicant."""
    return run("wpa_cli", "-p", f"/run/wireless-lan/{card}/control", "-i", card, *words,
               check=False)


def reason():
    """The reason of a failure that the commands leave for the window."""
    try:
        with open("/run/wireless-lan/reason") as file:
            return file.read()
    except FileNotFoundError:
        return ""


def addresses(card="wlan0"):
    """The networks 10.9.N that a card has an address of."""
    told = run("ip", "-4", "addr", "show", "dev", card, check=False)
    return [int(one) for one in re.findall(r"inet 10\.9\.([0-9]+)\.", told)]


def joined(net, card="wlan0"):
    """The supplicant is in, and the network's own server gives an address that its access point
    answers to."""
    wait_until(lambda: "wpa_state=COMPLETED" in supplicant("status", card=card),
               lambda: f"the join in {supplicant('status', card=card)}", 40)
    # One that was left while the join took its time goes with its success.
    wait_until(lambda: reason() == "", lambda: f"the reason to go: {reason()}")
    run("/sbin/lnk-ifup", card)
    same(addresses(card), [net], "the network of the address")
    run("ping", "-c", "1", "-W", "10", "-I", card, f"10.9.{net}.1")
