# SPDX-License-Identifier: MIT
"""What the commands share: limits of time, reasons, missing tools, PATH, defaults, taking turns."""

import os
import subprocess
import time

import pytest

import machine
from machine import choose, install, make_wlan0, read, wait_for, write

SHELLS = pytest.mark.parametrize("shell", [("sh",), *machine.SHELLS[1:]], ids=" ".join)


def library(text, shell=("sh",), path=machine.path_line(), limit=60):
    """What a command of this text does: status, output and error output."""
    done = subprocess.run(
        [*shell, "-c", f'set -u\nlibrary={machine.DEVICE}/wireless-lan.sh\n. "$library"\n{text}',
         "command"],
        env={**machine.environment(), "PATH": path}, stdin=subprocess.DEVNULL,
        stdout=subprocess.PIPE, stderr=subprocess.PIPE, check=False, timeout=limit)
    return done.returncode, done.stdout, done.stderr


def sleepers():
    return [pid for pid, line in machine.command_lines().items() if line.startswith(b"sleep\0")]


@SHELLS
@pytest.mark.parametrize("command, status, out", [
    ("true", 0, b""), ("sh -c 'echo a b; exit 3'", 3, b"a b\n"), ("sh -c 'kill -9 $$'", 137, b""),
    ("cat", 0, b""), ("not-there", 127, b"")])
def test_limited_is_the_command_itself(command, status, out, shell):
    result = library(f"limited 30 {command}", shell)
    assert result[:2] == (status, out)
    assert wait_for(lambda: sleepers() == [])


@SHELLS
@pytest.mark.parametrize("command", [
    "sleep 600", "sh -c 'sleep 600 & sleep 600'",
    "sh -c 'trap \"\" TERM; while :; do sleep 1; done'",
    "sh -c 'trap \"exit 1\" TERM; sleep 600 & wait'"])
def test_limited_ends_what_takes_longer(command, shell):
    begin = time.monotonic()
    # Whoever held the pipe would keep the answer waiting.
    assert library(f'answer=$(limited 1 {command}); echo $?', shell) == (0, b"124\n", b"")
    assert time.monotonic() - begin < 60
    assert wait_for(lambda: sleepers() == [])


def reason():
    return read("/run/wireless-lan/reason")


def test_reason():
    library("reason wrong-key")
    assert reason() == b"wrong-key\n"
    library("reason missing-tool Käse")
    assert reason() == "missing-tool Käse\n".encode()
    assert os.listdir("/run/wireless-lan") == ["reason"]
    library("no_reason")
    assert reason() == b""
    assert library("no_reason; echo on") == (0, b"on\n", b"")
    result = library("give_up no-wep \"there is none\"; echo on")
    assert result == (1, b"", b"command: there is none\n")
    assert reason() == b"no-wep\n"


def test_reason_that_cannot_be_left():
    write("/run/wireless-lan", "a file")
    assert library("reason busy; echo on") == (0, b"on\n", b"")


def test_missing_tool_is_named_at_once():
    assert library("need sh not-there wpa_cli; echo on") == (
        1, b"", b"command: not-there is missing: it has to be installed\n")
    assert reason() == b"missing-tool not-there\n"


@SHELLS
def test_path_of_the_caller_does_not_count(shell):
    bad = f"{machine.ROOT}/bad"
    os.makedirs(bad, exist_ok=True)
    write(f"{bad}/id", "#!/bin/sh\necho bad\n")
    os.chmod(f"{bad}/id", 0o755)
    for path in (f"{bad}:/usr/bin:/bin", ":/usr/bin:/bin", "bad:/usr/bin:/bin"):
        result = library(f"cd {bad}; id -u", shell, path)
        assert result[1:] == (b"0\n", b"")


@pytest.mark.parametrize("text, values", [
    (None, b"[] []"), ("", b"[] []"), ("INTERFACE=wlan1\nCOUNTRY=DE\n", b"[wlan1] [DE]"),
    ("# a comment\nINTERFACE=\"wlan 1\"\nCOUNTRY='DE'", b"[] [DE]"),
    ("INTERFACE='wlan1'\nCOUNTRY=\"de\"\n", b"[wlan1] []"),
    ("COUNTRY=$(id)\nINTERFACE=`id`\n", b"[`id`] []"), ("COUNTRY=DEU\nCOUNTRY=00\n", b"[] []"),
    ("INTERFACE=a/b\nINTERFACE=-x\n", b"[] []"),
    ("INTERFACE=$(touch /run/bad)\ntouch /run/bad\n", b"[] []")])
def test_defaults_are_data(text, values):
    if text is not None:
        os.makedirs("/etc/default", exist_ok=True)
        write("/etc/default/wireless-lan", text)
    result = library('read_defaults; echo "[$default_interface] [$country]"')
    assert result == (0, values + b"\n", b"")
    assert not os.path.exists("/run/bad")
    if text is not None:
        os.remove("/etc/default/wireless-lan")


@pytest.mark.parametrize("busybox", [False, True])
def test_commands_take_turns(busybox):
    """With a flock, and without one."""
    choose("ip")
    make_wlan0()
    wrap = machine.in_busybox() if busybox else []
    text = "use_interface wlan0; echo in >>/run/order; sleep 0.1; echo out >>/run/order; end_turn"
    three = [subprocess.Popen(
        [*wrap, "sh", "-c",
         f'set -u; library={machine.DEVICE}/wireless-lan.sh; . "$library"; {text}'],
        env=machine.environment()) for _ in range(3)]
    assert [one.wait(60) for one in three] == [0, 0, 0]
    assert read("/run/order") == b"in\nout\n" * 3
    assert os.listdir(machine.STATE) == ["lock"]


def test_turn_of_one_that_was_killed():
    choose("ip")
    make_wlan0()
    wrap = machine.in_busybox()
    killed = subprocess.Popen(
        [*wrap, "sh", "-c", f'library={machine.DEVICE}/wireless-lan.sh; . "$library"; '
         "use_interface wlan0; sleep 600"], env=machine.environment())
    assert wait_for(lambda: os.path.islink(f"{machine.STATE}/owner"))
    killed.kill()
    killed.wait()
    for _ in range(2):
        done = subprocess.run(
            [*wrap, "sh", "-c", f'library={machine.DEVICE}/wireless-lan.sh; . "$library"; '
             "use_interface wlan0; end_turn"], env=machine.environment(), check=False)
        assert done.returncode == 0


def test_turn_that_never_comes():
    choose("ip")
    os.makedirs(machine.STATE)
    holder = subprocess.Popen(["flock", f"{machine.STATE}/lock", "sleep", "600"])
    assert wait_for(lambda: sleepers())
    assert library("use_interface wlan0") == (
        1, b"", b"command: wlan0: another command keeps it busy\n")
    assert reason() == b"busy\n"
    holder.kill()
    holder.wait()


def test_only_root():
    choose("ip")
    install("id", "/bin/false")
    result = library("use_interface wlan0")
    assert result[0] == 1
    assert reason() == b"not-root\n"
