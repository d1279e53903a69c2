# SPDX-License-Identifier: MIT
"""Real DHCP clients and a real server on a (virtual) wire."""

import os
import re
import shutil
import signal
import subprocess

import pytest

import joining
import machine
from machine import (CLIENTS, GROUP, alive, choose, note, read, run, settings, sh, start, static,
                     wait_for, write)

# Newer releases have no dhclient any more.
REAL_CLIENTS = [name for name in CLIENTS if shutil.which(name, path="/usr/sbin:/sbin")]


def addresses(interface="wlan0"):
    return subprocess.run(["ip", "-4", "-o", "address", "show", "dev", interface],
                          stdout=subprocess.PIPE, check=True).stdout


def routes():
    return subprocess.run(["ip", "route"], stdout=subprocess.PIPE, check=True).stdout


def left(name):
    """The processes of a client."""
    return [pid for pid, line in machine.command_lines().items()
            if name.encode() in os.path.basename(line.split(b"\0")[0].split(b" ")[0])
            and alive(pid)]


def install_client(name):
    """The only client on this machine is the real one of this name."""
    for old in CLIENTS:
        if os.path.lexists(f"/usr/sbin/{old}"):
            os.remove(f"/usr/sbin/{old}")
    os.symlink(machine.real_tool(name), f"/usr/sbin/{name}")


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
def far():
    """Networks at the other ends of wlan0, wlan1 and wlan2; how commands are run there."""
    write(f"{machine.ROOT}/leases", "")  # those of another test would stay for two minutes
    holder = subprocess.Popen(["unshare", "-n", "sleep", "600"])
    inside = ["nsenter", "-n", "-t", str(holder.pid)]
    assert wait_for(lambda: os.readlink(f"/proc/{holder.pid}/ns/net") !=
                    os.readlink("/proc/self/ns/net"))
    for number in range(3):
        end = f"server{number}"
        sh("ip", "link", "add", f"wlan{number}", "type", "veth", "peer", "name", end)
        sh("ip", "link", "set", end, "netns", str(holder.pid))
        sh(*inside, "ip", "link", "set", end, "up")
    yield inside
    holder.kill()
    holder.wait()


def serve(far, *networks):
    """A server of addresses of these networks, such as 10.7.0, each at the next interface."""
    # -d: it stays who it is, since an ordinary user's namespace has nobody else.
    command = [*far, "dnsmasq", "-d", "-C", "/dev/null", "-p", "0",
               f"--dhcp-leasefile={machine.ROOT}/leases"]
    for number, network in enumerate(networks):
        end = f"server{number}"
        sh(*far, "ip", "address", "flush", "dev", end)
        sh(*far, "ip", "address", "add", f"{network}.1/24", "dev", end)
        command += ["-i", end, f"--dhcp-range=set:{end},{network}.50,{network}.60,2m",
                    f"--dhcp-option=tag:{end},6,{network}.1"]
    return subprocess.Popen(command, stderr=subprocess.DEVNULL)


@pytest.fixture
def server(far):
    """Networks of 10.7.N.0/24, with addresses to give; the process that gives them."""
    process = serve(far, "10.7.0", "10.7.1", "10.7.2")
    yield process
    process.terminate()
    process.wait(20)


@pytest.mark.parametrize("dns, wanted", [("auto", b"10.7.0.1"), ("manual", b"192.0.2.53")])
@pytest.mark.parametrize("name", REAL_CLIENTS)
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
    assert read("/etc/resolv.conf") == b"nameserver 192.0.2.53\n"
    assert run("lnk-ifdown", "wlan0")[0] == 0
    assert addresses() == b""
    assert b"wlan0" not in routes()
    assert read("/etc/resolv.conf") == b"nameserver 192.0.2.53\n"


def test_a_second_card_leaves_the_default_route_of_the_first(server):
    install_client("udhcpc")
    first, second = b"default via 10.7.0.1 dev wlan0", b"default via 10.7.1.1 dev wlan1"
    for card in ("wlan0", "wlan1"):
        settings(f"iface {card}\naddrtype dhcp\ndns manual\n{GROUP}")
        assert run("lnk-ifup", card)[0] == 0
    assert wait_for(lambda: second in routes())
    assert first in routes()
    static("10.7.0.9", "255.255.255.0", "10.7.0.255", "10.7.0.1")
    assert run("lnk-ifup", "wlan0")[0] == 0
    assert first in routes() and second in routes()
    assert run("lnk-ifdown", "wlan1")[0] == 0
    assert first in routes() and second not in routes()


def start_everyone():
    """The clients, each on an interface of its own, at the same time."""
    waiting = []
    for number, name in enumerate(REAL_CLIENTS):
        install_client(name)
        waiting.append((name, f"wlan{number}", start("lnk-ifup", f"wlan{number}")))
        assert wait_for(lambda: left(name))
    return waiting


# dnsmasq becomes another user, and an ordinary user's namespace lets nobody.
@pytest.mark.skipif(read("/proc/self/setgroups") == b"deny\n", reason="needs root")
@pytest.mark.parametrize("text, own", [
    (None, b"10.42.0.1/24"), ("static", b"10.1.2.3/24")])
def test_network_of_our_own(text, own):
    """Whoever joins it gets an address, where dnsmasq is installed."""
    sh("ip", "link", "add", "wlan0", "type", "veth", "peer", "name", "guest0")
    sh("ip", "link", "set", "guest0", "up")
    os.makedirs(machine.STATE)
    write(f"{machine.STATE}/hosting", "")
    if text:
        static(gateway="0.0.0.0")
    assert run("lnk-ifup", "wlan0") == (0, b"", b"")
    assert b"inet " + own in addresses()
    install_client("udhcpc")
    got = subprocess.run(
        ["udhcpc", "-i", "guest0", "-f", "-q", "-n", "-t", "10", "-T", "1", "-s", "/bin/true"],
        stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False)
    assert b"lease of " + own.rsplit(b".", 1)[0] + b"." in got.stdout, got.stdout
    assert run("lnk-ifdown", "wlan0")[0] == 0
    assert wait_for(lambda: not left("dnsmasq"))


def test_no_server(server):
    """A client makes no address up, takes no old lease for a new one, and goes on asking."""
    for number, name in enumerate(REAL_CLIENTS):
        install_client(name)
        assert run("lnk-ifup", f"wlan{number}")[0] == 0
        assert run("lnk-ifdown", f"wlan{number}")[0] == 0
        assert wait_for(lambda: not left(name))
    server.terminate()
    server.wait(20)
    for name, interface, process in start_everyone():
        assert process.wait(120) == 1
        assert addresses(interface) == b""
        assert left(name), name


def test_server_that_is_away_for_longer_than_a_lease(far):
    """The address goes with its lease, and comes with its server."""
    def give():
        given = []
        for number in range(3):
            path = f"{machine.ROOT}/udhcpd{number}"
            write(path, f"interface server{number}\nstart 10.7.{number}.50\nend 10.7.{number}.60\n"
                        f"option subnet 255.255.255.0\noption lease 20\nmin_lease 20\n"
                        f"lease_file {path}.leases\npidfile {path}.pid\n")
            write(f"{path}.leases", "")
            given.append(subprocess.Popen([*far, "busybox", "udhcpd", "-f", path],
                                          stderr=subprocess.DEVNULL))
        return given
    for number in range(3):
        sh(*far, "ip", "address", "add", f"10.7.{number}.1/24", "dev", f"server{number}")
    servers = give()
    for name, _, process in start_everyone():
        assert process.wait(60) == 0, name
    for process in servers:
        process.kill()
        process.wait()
    for number, name in enumerate(REAL_CLIENTS):
        assert wait_for(lambda: addresses(f"wlan{number}") == b"", 90), name
    give()
    for number, name in enumerate(REAL_CLIENTS):
        assert wait_for(lambda: b"inet 10.7." in addresses(f"wlan{number}"), 90), name


@pytest.mark.parametrize("name", REAL_CLIENTS)
def test_another_subnet_under_the_same_name(name, far):
    """A new association asks anew: the old address would reach nobody."""
    choose("wpa_supplicant", "wpa_cli", "iw")
    note("status", joining.CONNECTED)
    install_client(name)
    process = serve(far, "10.7.0")
    assert joining.iwset("Home")[0] == 0
    assert run("lnk-ifup", "wlan0")[0] == 0
    assert b"inet 10.7.0." in addresses()
    process.terminate()
    process.wait(20)
    process = serve(far, "10.8.0")
    subprocess.run([f"{machine.DEVICE}/wpa-action", "wlan0", "CONNECTED"], check=True, env=dict(
        machine.environment(), wireless_lan_supplicant=str(machine.supplicants()[-1])))
    assert wait_for(lambda: b"inet 10.8.0." in addresses() and b"10.7.0." not in addresses())
    process.terminate()
    process.wait(20)


def test_lease_is_given_back(far):
    """So that it is free for the next one; and only while its network is there."""
    for name in REAL_CLIENTS:
        process = serve(far, "10.7.0")
        install_client(name)
        assert run("lnk-ifup", "wlan0")[0] == 0
        assert run("lnk-ifdown", "wlan0")[0] == 0
        assert wait_for(lambda: b"10.7.0." not in read(f"{machine.ROOT}/leases")), name
        process.terminate()
        process.wait(20)


def leave_during_script(far, name, hook, go, begun):
    """lnk-ifdown, while the script for the lease is running; `hook`, which it runs, waits for the
    file `go`. The lease is given back all the same."""
    serve(far, "10.7.0")
    install_client(name)
    write(*hook)
    try:
        assert run("lnk-ifup", "wlan0")[0] == 0
        assert wait_for(begun)
        leaving = start("lnk-ifdown", "wlan0")
        # It is still at it: the client has been told, or is about to be.
        assert not wait_for(lambda: leaving.poll() is not None, limit=1)
        write(go, "")
        assert leaving.wait(60) == 0
    finally:
        os.remove(hook[0])
    assert wait_for(lambda: b"10.7.0." not in read(f"{machine.ROOT}/leases"))


@pytest.mark.skipif("dhclient" not in REAL_CLIENTS, reason="left out: no dhclient here")
def test_lease_that_dhclient_has_not_written_yet_is_given_back(far, tmp_path):
    """It has set the address. A release without a lease would take less than a second; this one
    waits for it."""
    go = tmp_path / "go"
    hook = f'[ "$reason" != BOUND ] || until [ -e {go} ]; do sleep 0.1; done\n'
    leave_during_script(far, "dhclient", ("/etc/dhcp/dhclient-exit-hooks.d/wait", hook), go,
                        lambda: b"lease {" not in read(f"{machine.STATE}/dhclient.leases"))


@pytest.mark.skipif("dhcpcd" not in REAL_CLIENTS, reason="left out: no dhcpcd here")
def test_lease_is_given_back_by_a_dhcpcd_in_its_script(far, tmp_path):
    """It hears no signal meanwhile; and it is not disturbed while it says that it leaves."""
    go, reasons = tmp_path / "go", tmp_path / "reasons"
    hook = f'''
        echo "$reason" >>{reasons}
        [ "$reason" != BOUND ] || until [ -e {go} ]; do sleep 0.1; done
        case $reason in STOP | RELEASE) sleep 2.5 ;; esac
        '''
    leave_during_script(far, "dhcpcd", ("/etc/dhcpcd.exit-hook", hook), go,
                        lambda: b"BOUND\n" in read(reasons))
    # Releases of dhcpcd differ in the word for leaving.
    assert read(reasons).endswith((b"BOUND\nSTOP\nSTOPPED\n", b"BOUND\nRELEASE\nSTOPPED\n"))


@pytest.mark.parametrize("hangs", (False, True), ids=("ends", "hangs"))
@pytest.mark.parametrize("name", REAL_CLIENTS)
def test_client_of_somebody_else_is_ended(name, hangs, server):
    """It would set its address again, beside the one that is wanted. One that does not end by
    itself leaves no helper behind."""
    words = {"dhclient": ["-d", "-lf", "/run/l", "-pf", "/run/p"], "udhcpc": ["-f", "-i"],
             "dhcpcd": ["-B", "-4"]}[name]
    static("10.7.0.9", "255.255.255.0", "10.7.0.255", "10.7.0.1")
    install_client(name)
    client = subprocess.Popen([name, *words, "wlan0"], stdout=subprocess.DEVNULL,
                              stderr=subprocess.DEVNULL)
    assert wait_for(lambda: left(name))
    if name != "udhcpc":
        assert wait_for(lambda: re.search(rb"10\.7\.0\.[56]", addresses()))
    if hangs:
        client.send_signal(signal.SIGSTOP)
    status, _, err = run("lnk-ifup", "wlan0")
    assert (status, err) == (
        0, f"lnk-ifup: another DHCP client on wlan0 has been ended: {name}\n".encode())
    assert wait_for(lambda: not left(name))
    assert addresses().count(b"inet ") == 1 and b"10.7.0.9/24" in addresses()


# ---- what the kernel learns by itself


def addresses6():
    return subprocess.run(["ip", "-6", "-o", "address", "show", "dev", "wlan0"],
                          stdout=subprocess.PIPE, check=True).stdout


@pytest.mark.parametrize("command, words", [
    ("lnk-ifdown", ["wlan0"]), ("iwset", joining.arguments("x"))])
def test_ipv6_of_the_old_network_goes(command, words, far):
    choose("wpa_supplicant", "wpa_cli", "iw")
    note("status", joining.CONNECTED)
    sh("ip", "link", "set", "wlan0", "up")
    sh("ip", "-6", "address", "add", "2001:db8::5/64", "dev", "wlan0", "nodad")
    sh("ip", "-6", "route", "add", "default", "via", "fe80::1", "dev", "wlan0", "proto", "ra")
    assert run(command, *words)[0] == 0
    assert b"2001:db8" not in addresses6()
    assert b"default" not in subprocess.run(["ip", "-6", "route"], stdout=subprocess.PIPE,
                                            check=True).stdout
    assert wait_for(lambda: b"fe80:" in addresses6()), "the next network's routers are asked"
