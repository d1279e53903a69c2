# SPDX-License-Identifier: MIT
"""What the installation puts where."""

import json
import os
import subprocess

import machine
from machine import read


def test_commands_lie_where_the_program_calls_them():
    """Where /sbin and /usr/sbin are two directories the program found nothing."""
    out = subprocess.run(["meson", "introspect", "--buildoptions", f"{machine.TOP}/meson.build"],
                         stdout=subprocess.PIPE, check=True).stdout
    options = {option["name"]: option["value"] for option in json.loads(out)}
    assert options["linux_device_sbindir"] == "/sbin"


def test_every_file_of_the_device_is_installed():
    rules = read(f"{machine.TOP}/device/meson.build").decode()
    for name in os.listdir(machine.DEVICE):
        if name != "README.md" and os.path.isfile(f"{machine.DEVICE}/{name}"):
            assert f"'linux/{name}'" in rules, name
