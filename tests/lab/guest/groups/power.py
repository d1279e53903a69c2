# SPDX-License-Identifier: MIT
"""The automatic connection where systemd is the machine's init, and the power is cut.

Each list of scenarios is one start of the machine. The air and the card are there before it."""

import datetime
import glob
import os
import re
import shutil
import signal
import time

import air
import hwsim
import window as w
from air import network, run, start
from commands import addresses, supplicant
from probe import wait_until
from steps import (check, connected_to, host, linked, press_button, same, second_station,
                   write_preferred)

PACKAGES = "systemd-sysv udev dbus dhcpcd-base isc-dhcp-client"
INIT = "/lib/systemd/systemd"
BOOTS = 4

UNIT = "wireless-lan-auto@wlan0.service"
STATE = "/run/wireless-lan/wlan0"
PREFERRED = "/etc/wireless-user.conf"
LIST = "user_cell_list_front"
FIRST = network(b"First", key="the-first-key", net=1)
SECOND = network(b"Second", key="second-to-none", net=2)
THIRD = network(b"Third", net=3)
SEEN_OF_SECOND = "02:00:00:00:01:00"
# What the list is after the window has put the second first.
REORDERED = ["Second", "First", "Third"]
# That a file is no program, which run-parts asks of each, is no right that is missing.
REFUSED = re.compile(r"^\d+ +(?!access\(.* X_OK\))(\w+\(.*\)) += -1 (EPERM|EACCES|EROFS) ",
                     re.M)


def around():
    """What is there before the machine is switched on."""
    # What the installation script of dhcpcd-base does.
    with open("/etc/passwd", "r+") as file:
        if "dhcpcd:" not in file.read():
            file.write("dhcpcd:x:101:65534:DHCP Client Daemon:/usr/lib/dhcpcd:/bin/false\n")
    air.radios(4)
    air.access_point(1, 6, [SECOND])
    air.access_point(2, 11, [THIRD])
    air.addresses(1, 2, 3, more=["--dhcp-option=option:dns-server,0.0.0.0"])
    start("ip", "-4", "-ts", "monitor", "address", log="addresses.log")


def prepare():
    print(run("systemctl", "--failed", "--no-pager"))


def shown(word, unit=UNIT):
    """One property of a unit."""
    return run("systemctl", "show", "--value", "-p", word, unit).strip()


def uptime():
    with open("/proc/uptime") as file:
        return float(file.read().split()[0])


def times(what):
    """How long the address took that is there, from the steps before it."""
    with open(f"{air.LOGS}/addresses.log") as file:
        stamp = re.findall(r"^\[(\S+)\] \d+: wlan0 +inet 10\.9\.", file.read(), re.M)[-1]
    # The clock of the machine has not been set meanwhile.
    address = datetime.datetime.fromisoformat(stamp).timestamp() - (time.time() - uptime())
    with open(f"{STATE}/supplicant.pid") as file:
        begun = int(file.read().split()[1]) / os.sysconf("SC_CLK_TCK")
    unit = int(shown("ExecMainStartTimestampMonotonic")) / 1e6
    with open("/run/handed-over") as file:
        handed_over = float(file.read())
    print(f"power: {what}: an address {address:.1f} s after the kernel's start, "
          f"{address - handed_over:.1f} s after that of systemd, {address - unit:.1f} s after that "
          f"of the unit, {address - begun:.1f} s after that of the supplicant")


def lives(name):
    """Whether the process lives that the commands have noted in their file of this name."""
    try:
        with open(f"{STATE}/{name}") as file:
            return os.path.exists(f"/proc/{file.read().split()[0]}")
    except (FileNotFoundError, IndexError):
        return False


def joined(net):
    """The machine has joined this network by itself, and the unit is well."""
    # A killed client leaves its address: it counts with one that lives.
    wait_until(lambda: lives("dhcp.pid") and "wpa_state=COMPLETED" in supplicant("status")
               and addresses() == [net],
               lambda: f"an address of {net}: {addresses()}, {supplicant('status')}", 300)
    run("ping", "-c", "1", "-W", "10", "-I", "wlan0", f"10.9.{net}.1")
    same(shown("ActiveState"), "active", "the state of the unit")
    # The service of the supplicant's own package is the other one.
    ours = [pid for pid in run("pidof", "wpa_supplicant").split() if STATE in words(pid)]
    same(len(ours), 1, "the number of our supplicants")
    # The DHCP client's script sees to it after the address.
    wait_until(lambda: run("cat", "/etc/resolv.conf", check=False) == f"nameserver 10.9.{net}.1\n",
               lambda: run("cat", "/etc/resolv.conf", check=False))


def words(pid):
    with open(f"/proc/{pid}/cmdline") as file:
        return file.read()


def ours():
    """The programs that the unit has running."""
    found = []
    for pid in run("cat", f"/sys/fs/cgroup{shown('ControlGroup')}/cgroup.procs").split():
        with open(f"/proc/{pid}/comm") as file:
            found.append(file.read().strip())
    return found


def complaints():
    """What the journal has of the unit that tells of a right that it lacks."""
    told = run("journalctl", "-b", "--no-pager", "-u", UNIT)
    return [line for line in told.splitlines() if re.search(
        "not permitted|[Pp]ermission|[Rr]ead-only|denied|ordering cycle|status=2[0-9][0-9]", line)]


def names():
    with open(PREFERRED) as file:
        return re.findall(r"^ESSID (.*)$", file.read(), re.M)


def joins_with_nothing_refused(net, *wanted):
    """The unit begins with an empty list; every system call that fails is noted from there on."""
    run("systemctl", "stop", UNIT)
    open(PREFERRED, "w").close()
    run("systemctl", "start", UNIT)
    log = f"{air.LOGS}/refused-{net}-{int(uptime())}.log"
    main = shown("MainPID")
    tracer = start("strace", "-f", "-Z", "-s", "200", "-o", log, "-p", main)
    wait_until(lambda: "TracerPid:\t0\n" not in run("cat", f"/proc/{main}/status"), "strace")
    write_preferred(*wanted)
    joined(net)
    tracer.send_signal(signal.SIGINT)
    tracer.wait()
    with open(log) as file:
        same(sorted(set(REFUSED.findall(file.read()))), [], "what is refused to the unit")
    same(complaints(), [], "the complaints in the journal")


def the_package_has_switched_it_on():
    same(shown("ActiveState"), "active", "the state of the unit")
    same(os.readlink("/etc/systemd/system/sys-subsystem-net-devices-wlan0.device.wants/" + UNIT),
         "/lib/systemd/system/wireless-lan-auto@.service", "the link to the unit")
    with open("/etc/wireless.conf") as file:
        check("iface wlan0\naddrtype dhcp\n" in file.read(), "there are no first settings")
    begun = uptime()
    write_preferred(FIRST, SECOND, THIRD)
    os.chmod(PREFERRED, 0o600)
    joined(2)
    print(f"power: an address {uptime() - begun:.1f} s after the first list was written")
    same(linked(), SEEN_OF_SECOND, "the access point")


def nothing_is_refused_to_it():
    joins_with_nothing_refused(2, FIRST, SECOND, THIRD)
    check("dhcpcd" in ours(), f"its programs are {ours()}")
    leases = glob.glob("/var/lib/dhcpcd/*")
    check([one for one in leases if "wlan0" in one and os.path.getsize(one)],
          f"the leases are {leases}")


def nothing_is_refused_to_the_other_dhcp_clients():
    hidden = []
    try:
        for old, new in (("dhcpcd", "udhcpc"), ("udhcpc", "dhclient")):
            while shutil.which(old):
                hidden.append(shutil.which(old))
                os.rename(hidden[-1], f"{hidden[-1]}.hidden")
            joins_with_nothing_refused(2, FIRST, SECOND, THIRD)
            check(new in ours(), f"its programs are {ours()}")
    finally:
        for path in hidden:
            os.rename(f"{path}.hidden", path)


def killed_it_is_started_again():
    before = shown("MainPID")
    os.kill(int(before), signal.SIGKILL)
    wait_until(lambda: shown("NRestarts") != "0" and shown("MainPID") not in ("0", before),
               lambda: run("systemctl", "status", UNIT, check=False), 60)
    joined(2)
    times("killed")


def a_killed_supplicant_is_replaced():
    with open(f"{STATE}/supplicant.pid") as file:
        os.kill(int(file.read().split()[0]), signal.SIGKILL)
    wait_until(lambda: not lives("supplicant.pid"), "its end")
    wait_until(lambda: lives("supplicant.pid"), "another", 60)
    joined(2)


def a_card_that_is_pulled_and_put_in_again():
    hwsim.remove_radio(0, "wlan0")
    wait_until(lambda: shown("ActiveState") == "inactive",
               lambda: run("systemctl", "status", UNIT, check=False), 60)
    same(ours_left(), [], "what the unit has left")
    begun = uptime()
    hwsim.add_radio("wlan0")
    joined(2)
    print(f"power: an address at most {uptime() - begun:.1f} s after the card")
    times("card")


def ours_left():
    """What is left of the command after its end."""
    return [pid for name in ("wpa_supplicant", "wpa_cli", "dhcpcd", "udhcpc", "dhclient")
            for pid in run("pidof", name, check=False).split()
            if STATE in words(pid) or "wlan0" in words(pid)]


def stopped_it_leaves_nothing():
    run("systemctl", "stop", UNIT)
    same((shown("Result"), ours_left(), addresses(), linked()), ("success", [], [], None),
         "what is left")
    run("systemctl", "start", UNIT)
    joined(2)


def another_dhcp_client_is_ended():
    """It has more rights than the unit, which has to find it all the same."""
    run("systemctl", "stop", UNIT)
    other = start("udhcpc", "-f", "-i", "wlan0")
    wait_until(lambda: "udhcpc" in run("cat", f"/proc/{other.pid}/comm"), "the other client")
    run("systemctl", "start", UNIT)
    joined(2)
    wait_until(lambda: other.poll() is not None, "its end")


def the_power_is_cut_after_the_window_has_saved():
    w.begin()
    w.idle()
    w.refresh_until(lambda now: w.connected_row(2) is not None, "the second is shown as connected")
    w.app.press("button-network-configure")
    box = w.app.dialog("Preferred Network Setting")
    box.click_row(LIST, 1)
    wait_until(lambda: box.selected(LIST) == [1], "the second to be selected")
    box.press("gtk-go-up")
    wait_until(lambda: [row[0] for row in box.rows(LIST)] == REORDERED, "the new order")
    box.press("gtk-ok")
    box.wait_gone()
    same(names(), REORDERED, "the list")


def the_second_is_joined_again():
    joined(2)
    times("power-on")
    same(linked(), SEEN_OF_SECOND, "the access point")
    same(complaints(), [], "the complaints in the journal")


def what_was_saved_is_whole():
    same(names(), REORDERED, "the list")
    with open(PREFERRED) as file:
        same(re.findall("^KEY (.*)$", file.read(), re.M), [SECOND["key"], FIRST["key"], "off"],
             "the keys")
    same(os.stat(PREFERRED).st_mode & 0o777, 0o600, "the mode of the list")
    same(sorted(one for one in os.listdir("/etc") if one.startswith("wireless")),
         ["wireless-user.conf", "wireless.conf"], "the files of the program")
    same(glob.glob("/tmp/*_tmp"), [], "what is left in /tmp")


def disconnected_by_hand_nothing_is_joined():
    w.begin()
    w.idle()
    w.refresh_until(lambda now: w.connected_row(2) is not None, "the second is shown as connected")
    w.select(w.connected_row(2))
    press_button("gtk-disconnect")
    wait_until(lambda: not linked(), "the interface to be left", 30)
    for _ in range(4):
        w.refresh()
        same((linked(), addresses()), (None, []), "the network and the address")
    same(shown("ActiveState"), "active", "the state of the unit")


def a_network_is_hosted_and_the_power_cut():
    w.begin()
    w.idle()
    w.refresh_until(lambda now: w.connected_row(2) is not None, "the second is shown as connected")
    w.select(w.connected_row(2))
    connected_to(2)
    host("Our own", "10.9.77.1", "255.255.255.0", "10.9.77.255", "10.9.77.1")


def the_hosted_network_is_back():
    wait_until(lambda: addresses() == [77], lambda: run("ip", "addr", "show", "dev", "wlan0"), 300)
    told = run("iw", "dev", "wlan0", "info")
    check("ssid Our own\n" in told and "type IBSS\n" in told, told)
    times("power-on, hosting")
    second_station("wlan3", "Our own", 77)
    same(complaints(), [], "the complaints in the journal")


def removed_it_leaves_nothing():
    removal = ("/usr/bin/dpkg", "-r", "wireless-lan", "wireless-lan-linux")
    said = run(*removal) if os.path.isdir("/lab/packages") else run("sh", "/lab/prerm", "remove")
    check("Glob" not in said and "ailed" not in said, f"it says {said}")
    same(glob.glob("/etc/systemd/system/*.wants/wireless-lan*"), [], "the links to the unit")
    same((shown("ActiveState"), ours_left(), addresses()), ("inactive", [], []), "what is left")
    check("ssid" not in run("iw", "dev", "wlan0", "info"), "the hosted network is there")


SCENARIOS = [
    [
        the_package_has_switched_it_on,
        nothing_is_refused_to_it,
        nothing_is_refused_to_the_other_dhcp_clients,
        killed_it_is_started_again,
        a_killed_supplicant_is_replaced,
        a_card_that_is_pulled_and_put_in_again,
        stopped_it_leaves_nothing,
        another_dhcp_client_is_ended,
        the_power_is_cut_after_the_window_has_saved,
    ],
    [
        the_second_is_joined_again,
        what_was_saved_is_whole,
        disconnected_by_hand_nothing_is_joined,
    ],
    [
        the_second_is_joined_again,
        a_network_is_hosted_and_the_power_cut,
    ],
    [
        the_hosted_network_is_back,
        removed_it_leaves_nothing,
    ],
]
