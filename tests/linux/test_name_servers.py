# SPDX-License-Identifier: MIT
"""name-servers: what a lease says of name servers reaches the machine in its own way, and goes."""

import os

import pytest

import machine
from machine import STATE, calls, choose, note, read, run, write

RESOLV = "/etc/resolv.conf"
BEFORE = "nameserver 192.0.2.53\n"
OURS = b"search home.example\nnameserver 10.7.0.1\nnameserver 2001:db8::1\n"
LEASE = ("home.example", "10.7.0.1 2001:db8::1")


@pytest.fixture(autouse=True)
def before():
    choose()
    if os.path.lexists(RESOLV):
        os.remove(RESOLV)
    yield
    if os.path.lexists(RESOLV):
        os.remove(RESOLV)
    write(RESOLV, BEFORE)


def names(action, *words):
    assert run("name-servers", action, "wlan0", *words) == (0, b"", b"")


def test_file_is_put_back():
    write(RESOLV, BEFORE)
    names("set", *LEASE)
    assert read(RESOLV) == OURS
    assert os.stat(RESOLV).st_mode & 0o777 == 0o644
    names("set", "", "10.7.0.2")
    assert read(RESOLV) == b"nameserver 10.7.0.2\n"
    names("drop")
    assert read(RESOLV) == BEFORE.encode()
    names("drop")
    assert os.listdir(STATE) == []


def test_no_file_before():
    names("set", *LEASE)
    assert read(RESOLV) == OURS
    names("drop")
    assert not os.path.exists(RESOLV)


def test_file_that_somebody_has_written_since_stays():
    write(RESOLV, BEFORE)
    names("set", *LEASE)
    write(RESOLV, "nameserver 192.0.2.99\n")
    names("drop")
    assert read(RESOLV) == b"nameserver 192.0.2.99\n"


@pytest.mark.parametrize("there", [True, False], ids=["another's file", "nothing"])
def test_nothing_is_written_through_a_link(there):
    target = "/run/systemd/resolve/stub-resolv.conf"
    if there:
        os.makedirs(os.path.dirname(target))
        write(target, "nameserver 127.0.0.53\n")
    os.symlink(target, RESOLV)
    names("set", *LEASE)
    assert read(RESOLV) == OURS and not os.path.islink(RESOLV)
    assert read(target) == (b"nameserver 127.0.0.53\n" if there else b"")
    names("drop")
    assert os.readlink(RESOLV) == target


def test_resolved():
    choose("resolvectl")
    os.makedirs("/run/systemd/resolve")
    os.symlink("/run/systemd/resolve/stub-resolv.conf", RESOLV)
    note("resolved")
    names("set", *LEASE)
    names("drop")
    assert [b" ".join(call[1:]) for call in calls("resolvectl") if call[1] != b"status"] == [
        b"dns wlan0 10.7.0.1 2001:db8::1", b"domain wlan0 home.example", b"revert wlan0"]
    assert os.path.islink(RESOLV)


def test_resolvconf():
    choose("resolvconf")
    names("set", *LEASE)
    assert read(f"{machine.LOG}/resolvconf-wlan0.wireless-lan") == OURS
    assert not os.path.exists(RESOLV)
    names("drop")
    assert not os.path.exists(f"{machine.LOG}/resolvconf-wlan0.wireless-lan")


@pytest.mark.parametrize("words, wanted", [
    (("cafe.de", "10.0.0.1"), b"search cafe.de\nnameserver 10.0.0.1\n"),
    (("a b", "10.0.0.1 10.0.0.2"), b"search a b\nnameserver 10.0.0.1\nnameserver 10.0.0.2\n"),
    (("$(touch /run/bad) `x` a;b * -v", "10.0.0.1"), b"nameserver 10.0.0.1\n"),
    (("x\nnameserver 6.6.6.6", "10.0.0.1"),
     b"search x nameserver\nnameserver 6.6.6.6\nnameserver 10.0.0.1\n"),
    (("", "fe80::1%wlan0"), b"nameserver fe80::1%wlan0\n"), (("home",), b""), ((), b"")])
def test_what_a_server_sends(words, wanted):
    names("set", *words)
    assert read(RESOLV) == wanted
    assert not os.path.exists("/run/bad")


@pytest.mark.parametrize("words", [(), ("set",), ("set", "a/b", "10.0.0.1"), ("other", "wlan0")])
def test_refused_words(words):
    assert run("name-servers", *words)[0] == 2
