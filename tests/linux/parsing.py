# SPDX-License-Identifier: MIT
"""The real wpa_supplicant, which reads a file without a radio."""

import os
import subprocess

import pytest

import machine
from machine import read, sh, wait_for

LACKING = []  # why it does not start here, once that is known


def control():
    """What `ctrl_interface` has to name."""
    return f"{machine.ROOT}/control"


def ask(*words):
    return subprocess.run(["wpa_cli", "-p", control(), "-i", "parser0", *words], check=False,
                          stdout=subprocess.PIPE, stderr=subprocess.DEVNULL).stdout.strip()


def start(path):
    """Gives its process once it answers. The test is left out where it ends itself because the
    kernel has no nl80211, as that of later releases does."""
    if LACKING:
        pytest.skip(LACKING[0])
    if not os.path.exists("/sys/class/net/parser0"):
        sh("ip", "link", "add", "parser0", "type", "veth", "peer", "name", "parser1")
    log = f"{machine.ROOT}/parser.log"
    with open(log, "wb") as out:
        process = subprocess.Popen(["wpa_supplicant", "-i", "parser0", "-D", "wired", "-c", path],
                                   stdin=subprocess.DEVNULL, stdout=out, stderr=out)
    assert wait_for(lambda: process.poll() is not None or ask("ping") == b"PONG"), read(log)
    if process.poll() is not None and b"'nl80211' generic netlink not found" in read(log):
        LACKING.append("left out: wpa_supplicant does not start here, the kernel has no nl80211")
        pytest.skip(LACKING[0])
    assert process.poll() is None, read(log)
    return process
