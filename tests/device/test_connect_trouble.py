# SPDX-License-Identifier: MIT
"""Connects on a device where something is missing, fails, or takes its time."""

import os
import resource

import pytest

from connecting import (ACQUIRING, COMMANDS, CONNECTING, IDLE, INVALID, LOCKED, address_of, arrive,
                        children, connect, connected, idle, pass_time, poll_address, poll_link,
                        refresh, settle, wait_commands)
from harness import wait_until
from support.grammar import scan_text

# fork() fails in the program itself ("p" in the file no-fork) or in a child of it ("c"), and the
# program has many descriptors, so that one limit leaves it none and its children, who lose them,
# enough for a shell.
LIBRARY = r"""
#define _GNU_SOURCE
#include <dlfcn.h>
#include <errno.h>
#include <fcntl.h>
#include <stdio.h>
#include <string.h>
#include <unistd.h>

static pid_t program;

__attribute__((constructor)) static void begin(void)
{
    program = getpid();
    for (int i = 0; i < 40 && strcmp(program_invocation_short_name, "wireless-lan") == 0; i++)
        open("/dev/null", O_RDONLY | O_CLOEXEC);
}

pid_t fork(void)
{
    pid_t (*next)(void) = (pid_t (*)(void))dlsym(RTLD_NEXT, "fork");
    char who = 0;
    FILE *file = fopen("/device/state/no-fork", "re");
    if (file != NULL) {
        who = (char)fgetc(file);
        fclose(file);
    }
    if (who == (getpid() == program ? 'p' : 'c')) {
        errno = EAGAIN;
        return -1;
    }
    return next();
}
"""


def troubled(device, *networks):
    """A device whose program is linked with the library above."""
    d = device("none", rate=50, scan=scan_text(*networks))
    for name in COMMANDS:
        d.command(name, hook=":")
    app = d.start(environment=d.preload("trouble", LIBRARY))
    app.wait_listed()
    d.clock.rate = 0
    return d, app


def copies(d, app):
    """How many processes run the program, on the device and where it was started from."""
    return sum(line.split(b"\0")[0].endswith(b"/wireless-lan")
               for _, line in children(d.init) + children(app.process.pid))


def assert_alone(d, app):
    """One program, and no child of it, dead or alive."""
    assert children(app.pid) == []
    # A grandchild whose script could not be started may still be on its way out.
    wait_until(lambda: copies(d, app) == 1, lambda: f"{copies(d, app)} programs to become one")


def assert_usable(app):
    assert settle(app) == IDLE
    for name in LOCKED:
        assert app.sensitive(name)


def test_commands_that_are_missing_or_fail(device):
    d, app = idle(device, "one", "two")
    for name in ("iwset", "ifconfig", "lnk-ifup"):
        d.command(name, missing=True)
    connect(app, 0)
    app.wait_title(CONNECTING)
    pass_time(d, app, 100)
    poll_link(d, app)
    assert d.file("/tmp/essid_tmp") == b"one\n"
    # The access point comes all the same; the script that is not there leaves nothing over.
    d.associate(address_of(0))
    poll_link(d, app)
    assert settle(app) == ACQUIRING
    assert_alone(d, app)
    poll_address(d, app, 21)
    app.wait_state(0, INVALID)
    assert_usable(app)
    d.command("lnk-ifdown", missing=True)
    connect(app, 0)
    app.wait_printed("now is link down.")
    pass_time(d, app, 100)
    app.wait_state(0, "Disconnect")
    assert app.label("button-connect") == "gtk-connect"

    # The same commands, there again and failing with words.
    for name in ("iwset", "ifconfig", "lnk-ifup", "lnk-ifdown"):
        d.command(name, status=3, stderr="no such device\n", stdout="%s%n\n", hook=":")
    connect(app, 1)
    wait_commands(d, app)
    arrive(d, app, 1)
    assert_usable(app)


def test_commands_that_take_their_time(device):
    d, app = idle(device, "one")
    d.command("iwset", delay=0.5, hook=":")
    d.command("lnk-ifup", delay=30, hook=":")
    connect(app, 0)
    wait_commands(d, app)
    d.associate(address_of(0))
    # The script may hang as long as it likes: nobody waits for it.
    poll_link(d, app)
    d.wait_command("lnk-ifup", ended=False)
    assert settle(app) == ACQUIRING and children(app.pid) == []
    d.address("10.0.0.5")
    poll_address(d, app)
    app.wait_state(0, connected("10.0.0.5"))
    assert d.commands("lnk-ifup")[0].status is None
    assert_usable(app)


def test_fork_that_fails(device):
    d, app = troubled(device, "one")
    for count, who in enumerate("pc", 1):
        connect(app, 0)
        wait_commands(d, app, count)
        d.put("no-fork", who)
        d.associate(address_of(0))
        poll_link(d, app)
        assert settle(app) == ACQUIRING
        if who == "p":
            assert ("WIRELESS-LAN-DEBUG: fork PID -1 error 11\n"
                    "WIRELESS-LAN-DEBUG: wait fPID=-1,exPID=-1\n") in app.stderr()
        assert d.commands("lnk-ifup") == []
        assert_alone(d, app)
        poll_address(d, app, 21)
        app.wait_state(0, INVALID)
        assert_usable(app)
        assert app.stderr().count("detect_network_interface_state") == 21 * count
        d.drop("no-fork")
        d.dissociate()
        connect(app, 0)
        app.wait_printed("now is link down.", count)
        pass_time(d, app, 100)
        app.wait_state(0, "Disconnect")
    connect(app, 0)
    wait_commands(d, app, 3)
    d.associate(address_of(0))
    poll_link(d, app)
    d.wait_command("lnk-ifup")


def test_no_descriptor_left(device):
    d, app = troubled(device, "one", "two")
    # A first connect, so that what the toolkit opens late is open.
    connect(app, 1)
    wait_commands(d, app)
    arrive(d, app, 1)
    connect(app, 0)
    wait_commands(d, app, 2)
    poll_link(d, app)
    assert settle(app) == ACQUIRING

    # An address that cannot be asked for is none.
    before = resource.prlimit(app.pid, resource.RLIMIT_NOFILE)
    taken = {int(number) for number in os.listdir(f"/proc/{app.pid}/fd")}
    free = next(number for number in range(len(taken) + 1) if number not in taken)
    resource.prlimit(app.pid, resource.RLIMIT_NOFILE, (free, before[1]))
    d.address("10.0.0.5")
    poll_address(d, app, 21)
    app.wait_state(0, INVALID)
    assert_usable(app)

    # The shell has descriptors of its own, so the device is told everything.
    connect(app, 1)
    wait_commands(d, app, 3)
    assert d.commands("iwset")[2].argv[3] == "two"
    assert d.file("/tmp/essid_tmp") == b"two\n" and d.file("/tmp/key_tmp") == b"off\n"
    poll_link(d, app, 21)
    app.wait_state(1, "Not Connect")
    assert_usable(app)

    resource.prlimit(app.pid, resource.RLIMIT_NOFILE, before)
    d.address("10.0.0.5")
    refresh(d, app)
    app.wait_state(1, connected("10.0.0.5"))


def test_interface_names_that_no_kernel_gives(device):
    d, app = idle(device, "one")
    lines = d.state_file("wireless").decode().splitlines()
    d.associate(address_of(0))
    d.address("10.0.0.5")
    refresh(d, app)
    app.wait_state(0, connected("10.0.0.5"))
    d.clear_commands()
    d.set_wireless("\n".join(lines[:2] + ["wl;id>/tmp/x: 0000 0 0 0 0 0 0 0 0 0", ""]))
    connect(app, 0)
    app.wait_printed("now is link down.")
    pass_time(d, app, 100)
    app.wait_state(0, "Disconnect")
    app.wait_printed("WIRELESS-LAN-DEBUG: no usable interface name, skipping leaving the network\n")
    connect(app, 0)
    app.wait_title(CONNECTING)
    pass_time(d, app, 100)
    app.wait_printed("WIRELESS-LAN-DEBUG: no usable interface name, skipping joining the network\n")
    poll_link(d, app, 21)
    app.wait_state(0, "Not Connect")
    assert {one.name for one in d.commands()} == {"cat"}
    assert d.file("/tmp/x") is None and d.file("/tmp/key_tmp") is None
    assert_usable(app)
    # The right one is back.
    d.set_interfaces("wlan0")
    connect(app, 0)
    wait_commands(d, app)


@pytest.mark.parametrize("name", ["essid_tmp", "key_tmp"])
def test_a_name_in_tmp_that_cannot_be_had(device, name):
    """Name and key belong together: both files are ours, or neither is there and nothing is run."""
    d, app = idle(device, "cafe", "bar")
    d.sh(f"echo old >/tmp/essid_tmp; echo old >/tmp/key_tmp; rm /tmp/{name}; mkdir /tmp/{name}")
    connect(app, 0)
    app.wait_title(CONNECTING)
    pass_time(d, app, 100)
    box = app.dialog(text="The name and the key cannot be left in /tmp for the device.\n"
                          "The network is not set up.")
    app.wait_printed(f"WIRELESS-LAN-DEBUG: /tmp/{name} is not written: File exists\n")
    box.press("gtk-close")
    box.wait_gone()
    assert d.commands("iwset") == []
    assert d.sh("ls /tmp | grep _tmp || true").split() == [name]
    assert [row[4] for row in app.networks()] == ["Not Connect", "Disconnect"]
    assert settle(app) == IDLE and all(app.sensitive(key) for key in LOCKED)
    # Hosting needs the name alone.
    app.press("button-wifi-settings")
    dialog = app.dialog("WLAN Setting")
    dialog.click("adhoc-hostwlan0")
    dialog.press("gtk-ok")
    if name == "essid_tmp":
        app.dialog(text="The name and the key cannot be left in /tmp for the device.\n"
                        "The network is not set up.").press("gtk-close")
    dialog.wait_gone()
    assert settle(app) == "Ad-Hoc Host Mode"
    assert len(d.commands("iwset")) == (0 if name == "essid_tmp" else 1)


def test_control_characters(device):
    """They stay in the record and the command; a line has none, in /tmp and in diagnostics."""
    name, key = "a\x1b[2J\x07b", "one\ntwo"
    d, app = idle(device, (name, "on"))
    connect(app, 0)
    dialog = app.dialog("Encrypted Network")
    dialog.type("connect_key", key)
    dialog.press("gtk-ok")
    app.dialog(text="Do you want to add this configuration to the preferred network?").press(
        "gtk-no")
    wait_commands(d, app)
    assert d.commands("iwset")[0].argv[3:8] == [name, "mode", "Managed", "key", key]
    assert d.file("/tmp/essid_tmp") == name.encode() + b"\n"
    assert d.file("/tmp/key_tmp") == b"one two\n"
    shown = r"a\x1b[2J\x07b"
    assert f"WIRELESS-LAN-DEBUG: ESSID:{shown}\n" in app.stderr()
    assert f"WIRELESS-LAN-DEBUG: essid to set:{shown}\n" in app.stderr()
    assert (f'iwset cmd=/sbin/iwset "wlan0" essid "{shown}" mode "Managed" key "one\\x0atwo" '
            'enc "open" "[1]"\r\n') in app.stdout()
    arrive(d, app, 0)
    refresh(d, app)
    app.wait_printed(f"matched connect info:state [1],essid:[{shown}]")
    assert not set(app.stdout() + app.stderr()) & set(map(chr, [*range(9), 11, 12, *range(14, 32)]))
