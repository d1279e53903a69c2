# SPDX-License-Identifier: MIT
"""Real DHCP clients and a real server on a (virtual) wire."""

import glob
import os
import re
import shutil
import subprocess

import pytest

import machine
from machine import CLIENTS, GROUP, alive, read, run, settings, sh, start, static, wait_for, write


def addresses(interface="wlan0"):
    return subprocess.run(["ip", "-4", "-o", "address", "show", "dev", interface],
                          stdout=subprocess.PIPE, check=True).stdout


def routes():
    return subprocess.run(["ip", "route"], stdout=subprocess.PIPE, check=True).stdout


def left(name):
    """The processes of a client."""
    return [path for path in glob.glob("/proc/[0-9]*/cmdline")
            if name.encode() in os.path.basename(read(path).split(b"\0")[0].split(b" ")[0])
            and alive(path.split("/")[2])]


def install_client(name):
    """The only client on this machine is the real one of this name."""
    for old in CLIENTS:
        if os.path.lexists(f"/usr/sbin/{old}"):
            os.remove(f"/usr/sbin/{old}")
    os.symlink(f"{machine.real_sbin()}/{name}", f"/usr/sbin/{name}")


@pytest.fixture(autouse=True)
def real_files():
    sh("ip", "link", "set", "lo", "up")
    os.makedirs("/etc/dhcp/dhclient-enter-hooks.d", exist_ok=True)
    shutil.copy(f"{machine.DEVICE}/dhclient-hook", "/etc/dhcp/dhclient-enter-hooks.d/wireless-lan")
    if os.path.islink("/etc/resolv.conf"):
        os.remove("/etc/resolv.conf")
    yield
    for old in CLIENTS:
        if os.path.lexists(f"/usr/sbin/{old}"):
            os.remove(f"/usr/sbin/{old}")


@pytest.fixture
def server():
    """Networks of 10.7.N.0/24 at the other ends of wlan0, wlan1 and wlan2, with addresses to give;
    the process that gives them."""
    holder = subprocess.Popen(["unshare", "-n", "sleep", "600"])
    other = ["nsenter", "-n", "-t", str(holder.pid)]
    assert wait_for(lambda: os.readlink(f"/proc/{holder.pid}/ns/net") !=
                    os.readlink("/proc/self/ns/net"))
    serve = [*other, "dnsmasq", "-k", "-C", "/dev/null", "-p", "0", "-u", "root", "-g", "root",
             "--log-facility=-", f"--dhcp-leasefile={machine.ROOT}/leases",
             f"--pid-file={machine.ROOT}/dnsmasq.pid"]
    for number in range(3):
        end = f"server{number}"
        sh("ip", "link", "add", f"wlan{number}", "type", "veth", "peer", "name", end)
        sh("ip", "link", "set", end, "netns", str(holder.pid))
        sh(*other, "ip", "address", "add", f"10.7.{number}.1/24", "dev", end)
        sh(*other, "ip", "link", "set", end, "up")
        serve += ["-i", end, f"--dhcp-range=set:{end},10.7.{number}.50,10.7.{number}.60,2m",
                  f"--dhcp-option=tag:{end},6,10.7.{number}.1"]
    process = subprocess.Popen(serve, stderr=subprocess.DEVNULL)
    yield process
    process.terminate()
    process.wait(20)
    holder.kill()
    holder.wait()


@pytest.mark.parametrize("dns, wanted", [("auto", b"10.7.0.1"), ("manual", b"192.0.2.53")])
@pytest.mark.parametrize("name", CLIENTS)
def test_lease(name, dns, wanted, server):
    install_client(name)
    write("/etc/resolv.conf", "nameserver 192.0.2.53\n")
    settings(f"iface wlan0\naddrtype dhcp\ndns {dns}\n{GROUP}")
    status, _, err = run("lnk-ifup", "wlan0")
    assert (status, err) == (0, b"")
    assert b"inet 10.7.0." in addresses()
    gives_way_to_a_wire = rb"default via 10\.7\.0\.1 dev wlan0 .*metric 600"
    assert wait_for(lambda: re.search(gives_way_to_a_wire, routes()))
    assert wait_for(lambda: b"nameserver " + wanted + b"\n" in read("/etc/resolv.conf"), 10)
    if dns == "manual":
        assert read("/etc/resolv.conf") == b"nameserver 192.0.2.53\n"
    sh("busybox", "ping", "-c", "1", "-W", "5", "10.7.0.1")

    static("10.7.0.9", "255.255.255.0", "10.7.0.255", "10.7.0.1")
    assert run("lnk-ifup", "wlan0")[0] == 0
    assert addresses().count(b"inet ") == 1
    assert b"10.7.0.9/24" in addresses()
    assert wait_for(lambda: not left(name))
    assert run("lnk-ifdown", "wlan0")[0] == 0
    assert addresses() == b""
    assert b"wlan0" not in routes()


def test_no_server(server):
    """A client makes no address up, and takes no old lease for a new one. Each on an interface of
    its own, all at once: giving up takes its time."""
    for number, name in enumerate(CLIENTS):
        install_client(name)
        assert run("lnk-ifup", f"wlan{number}")[0] == 0
        assert run("lnk-ifdown", f"wlan{number}")[0] == 0
        assert wait_for(lambda: not left(name))
    server.terminate()
    server.wait(20)
    waiting = []
    for number, name in enumerate(CLIENTS):
        install_client(name)
        waiting.append((name, f"wlan{number}", start("lnk-ifup", f"wlan{number}")))
        assert wait_for(lambda: left(name))
    for name, interface, process in waiting:
        assert process.wait(120) == 1
        assert addresses(interface) == b""
        assert wait_for(lambda: not left(name))
