# SPDX-License-Identifier: MIT
"""What a reader of the device commands expects of all of them."""

import os
import subprocess

import pytest

import machine

SCRIPTS = [os.path.join(machine.DEVICE, name) for name in machine.COMMANDS + machine.LIBRARIES]


def test_shellcheck_has_nothing_to_say():
    done = subprocess.run(["shellcheck", "-x", "-P", machine.TOP, *SCRIPTS,
                           os.path.join(machine.HERE, "stub")],
                          stdout=subprocess.PIPE, check=False, cwd=machine.TOP)
    assert done.returncode == 0, done.stdout.decode()


@pytest.mark.parametrize("name", machine.COMMANDS)
def test_a_command_can_be_run_and_stops_at_unset_variables(name):
    path = os.path.join(machine.DEVICE, name)
    assert os.access(path, os.X_OK)
    assert b"\nset -u\n" in machine.read(path)


@pytest.mark.parametrize("page", sorted(os.listdir(os.path.join(machine.DEVICE, "man"))))
def test_manual_page(page):
    done = subprocess.run(["mandoc", "-T", "lint", "-W", "warning",
                           os.path.join(machine.DEVICE, "man", page)],
                          stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False)
    assert done.returncode == 0, done.stdout.decode()


def test_stubs_note_whole_calls_of_the_same_moment():
    """However long their writing takes."""
    machine.choose("ip")
    subprocess.run(["strace", "-f", "-qq", "-o", "/dev/null", "-e", "trace=write",
                    "-e", "inject=write:delay_exit=50000", "sh", "-c",
                    'for n in 1 2 3 4; do "$0" "$n" "a\nb" & done; wait',
                    f"{machine.CHOSEN}/ip"],
                   env={"PATH": "/usr/bin:/bin", "STUB_LOG": machine.LOG}, check=True)
    assert sorted(machine.calls("ip")) == [[b"ip", number, b"a\nb"]
                                           for number in (b"1", b"2", b"3", b"4")]
