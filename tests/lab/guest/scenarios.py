"""scenarios.py GROUP: what a person does with real networks, and what must come of it.

Every scenario is one function; its name, with blanks, is the name of the test. A group shares one
machine and one run of the program; its first function prepares the air. A result is one line of the
file "results": "ok NAME" or "not ok NAME: reason"."""

import faulthandler
import os
import re
import subprocess
import sys
import time
import traceback

import air
import window as w
from air import AIR, FAR, network, run, until

# A name that would do harm if a shell read it, as long as a name can be less one byte.
SHELL_NAME = b"$(touch /tmp/x)\"\\';&|<`>/tmp/y`"
SHELL_KEY = "it's `id` \"$HOME\" \\ ; & #"
UTF8_NAME = "Café Zürich Москва"


def check(condition, reason):
    if not condition:
        raise AssertionError(reason)


def same(got, wanted, what):
    check(got == wanted, f"{what} is {got!r}, not {wanted!r}")


def connected_to(net, limit=90):
    """Wait until a row tells an address of subnet NET and the window is idle; return the row."""
    prefix = f"Connected\nIP Address:10.9.{net}."
    row = until(lambda: next((i for i, one in enumerate(w.rows()) if one[4].startswith(prefix)), -1)
                + 1, f"a row with an address of 10.9.{net}.x", limit, 0.5) - 1
    w.idle()
    same(w.widget("button-connect")["label"], "gtk-disconnect", "the button")
    shown = w.rows()[row][4][len("Connected\nIP Address:"):]
    have = re.findall(r"inet ([0-9.]+)/", run("ip", "-4", "addr", "show", "dev", "wlan0"))
    same(have, [shown], "the interface's address, as shown,")
    same([i for i, one in enumerate(w.rows()) if one[4].startswith("Connected")], [row],
         "the rows called connected")
    run("ping", "-c", "1", "-W", "10", f"10.9.{net}.1")
    return row


def answer_encrypted(key, remember=None, index=0, alias=""):
    """Fill the dialog for the key: INDEX 1 of the first list is WPA. REMEMBER None: not asked."""
    box = w.dialog("Encrypted Network")
    kind = next(one for one in w.walk(box) if one.get("items") == ["WEP", "WPA-PSK/WPA2-PSK"])
    if kind["active"] != index:
        w.choose(kind, index)
    if key is not None:
        w.fill(w.find(box, "GtkEntry"), key)
    w.press_in(box, "gtk-ok")
    if remember is not None:
        prompt = w.dialog("Do you want to add this configuration to the preferred network?")
        if remember:
            w.fill(w.find(prompt, "GtkEntry"), alias)
        w.press_in(prompt, "gtk-yes" if remember else "gtk-no")


def wanted_row(name):
    """The row of a network by its name, after as many refreshes as it takes to show it."""
    rows = w.refresh_until(lambda now: name in [one[0] for one in now], f"{name!r} is listed")
    return [one[0] for one in rows].index(name)


def press_button(label):
    """Press the button below the list once it says what it is to do."""
    until(lambda: w.widget("button-connect")["label"] == label, f"the button says {label}", 20)
    w.press(w.widget("button-connect"))


def press_connect(name, nth=0):
    row = wanted_row(name) + nth
    w.select_surely(row)
    w.notices()
    press_button("gtk-connect")
    return row


def followed(*numbers, limit=20):
    """The notices since the connect was pressed are these, in this order."""
    got = []

    def all_there():
        got.extend(w.notices())
        return len(got) >= len(numbers)

    try:
        until(all_there, "notices", limit)
    except TimeoutError:
        pass
    same(got, list(numbers), "the notices to the desktop")


def linked():
    """The address of the access point that the kernel is associated with, or None."""
    found = re.search(r"Connected to ([0-9a-f:]+)", run("iw", "dev", "wlan0", "link", check=False))
    return found and found.group(1)


# ---- join: every kind of network ---------------------------------------------------------------


def join():
    air.radios(5)
    air.access_point(1, 1, [
        network(b"Market", net=1),
        network(b"Home Net", key="correct horse", net=2),
        network(UTF8_NAME.encode(), net=3),
        network(SHELL_NAME, key=SHELL_KEY, net=4),
        network(b"Cellar", key="hidden treasure", hidden=True, net=5),
    ])
    air.access_point(2, 6, [network(b"Twins", net=6)])
    air.access_point(3, 11, [network(b"Twins", net=7),
                             network(b"Old School", wep="0102030405", net=8)])
    air.addresses(*range(1, 9))
    w.begin()
    w.idle()


def the_list_shows_every_network():
    wanted = {"Market": "off", "Home Net": "on", UTF8_NAME: "off", SHELL_NAME.decode(): "on",
              "": "on", "Twins": "off", "Old School": "on"}
    rows = w.refresh_until(
        lambda now: {one[0] for one in now} == set(wanted)
        and [one[0] for one in now].count("Twins") == 2 and len(now) == 8, "eight networks")
    w.photograph("list")
    for name, mode, key, quality, state in rows:
        same(key, wanted[name], f"the key of {name!r}")
        check(mode in ("Master", "Managed"), f"the mode of {name!r} is {mode!r}")
        check(re.fullmatch(r"\d+/\d+", quality), f"the quality of {name!r} is {quality!r}")
        same(state, "Disconnect", f"the state of {name!r}")
    w.notices()
    w.refresh()
    followed("5")


def an_open_network_gives_an_address():
    row = press_connect("Market")
    same(connected_to(1), row, "the connected row")
    followed("2", "3", "4")
    w.photograph("open")


def a_refresh_finds_the_connected_network_again():
    w.refresh()
    row = until(lambda: next((i + 1 for i, one in enumerate(w.rows())
                              if one[4].startswith("Connected\nIP Address:10.9.1.")), 0),
                "the connected row", 10) - 1
    same(w.rows()[row][0], "Market", "the connected network")


def disconnect_leaves_the_network():
    w.select_surely(wanted_row("Market"))
    w.notices()
    press_button("gtk-disconnect")
    until(lambda: all(one[4] == "Disconnect" for one in w.rows()), "no row is connected")
    followed("2")
    until(lambda: w.widget("button-connect")["label"] == "gtk-connect", "the button")
    until(lambda: not linked(), "the interface is not associated", 20)
    same(run("ip", "-4", "-o", "addr", "show", "dev", "wlan0"), "", "the address")
    check(run("pidof", "wpa_supplicant", check=False) == "", "the supplicant still runs")


def wpa2_with_a_blank_in_its_name():
    row = press_connect("Home Net")
    answer_encrypted("correct horse", remember=True, index=1, alias="At home")
    same(connected_to(2), row, "the connected row")
    followed("2", "3", "4")
    same(linked(), "02:00:00:00:01:01", "the access point")
    with open("/etc/wireless-user.conf") as file:
        check("correct horse" in file.read(), "the preferred network's key was not kept")
    w.refresh()
    w.photograph("wpa2")


def its_key_is_for_root_alone():
    for pid in filter(str.isdigit, os.listdir("/proc")):
        try:
            with open(f"/proc/{pid}/cmdline", "rb") as file:
                check(b"correct horse" not in file.read(), f"process {pid} was given the key")
        except FileNotFoundError:
            pass
    for top in ("/etc", "/run", "/tmp", "/var"):
        found = run("grep", "-rlsI", "correct horse", top, check=False).split()
        for path in found:
            if path.startswith(("/tmp/hostapd", "/tmp/screen")):
                continue
            hidden = os.stat(path).st_mode & 0o077 == 0
            check(hidden, f"{path}, which holds the key, has mode {os.stat(path).st_mode:o}")
            check(not path.startswith("/var/log"), f"{path} holds the key")


def a_remembered_network_by_double_click():
    w.select_surely(wanted_row("Home Net"))
    press_button("gtk-disconnect")
    until(lambda: all(one[4] == "Disconnect" for one in w.rows()), "no row is connected")
    w.notices()
    w.select(wanted_row("Home Net"), times=2)
    answer_encrypted(None, index=1)
    connected_to(2)
    followed("2", "3", "4")


def from_one_network_straight_to_another():
    row = press_connect("Market")
    same(connected_to(1), row, "the connected row")
    followed("2", "3", "4")


def wep_with_the_first_key():
    press_connect("Old School")
    answer_encrypted("0102030405", remember=False)
    connected_to(8)
    followed("2", "3", "4")


def a_hidden_network_by_the_name_typed():
    press_connect("")
    box = w.dialog("The essid is empty")
    w.fill(w.find(box, "GtkEntry"), "Cellar")
    w.press_in(box, "gtk-yes")
    answer_encrypted("hidden treasure", remember=False, index=1)
    connected_to(5)
    followed("2", "3", "4")
    same(linked(), "02:00:00:00:01:04", "the access point")


def a_utf8_name():
    press_connect(UTF8_NAME)
    connected_to(3)
    same(linked(), "02:00:00:00:01:02", "the access point")
    w.photograph("utf8")


def a_name_and_a_key_of_shell_characters():
    press_connect(SHELL_NAME.decode())
    answer_encrypted(SHELL_KEY, remember=True, index=1, alias="`id`")
    connected_to(4)
    same(linked(), "02:00:00:00:01:03", "the access point")
    for name in ("x", "y"):
        check(not os.path.exists(f"/tmp/{name}"), "the name was run as a command")
    with open("/tmp/essid_tmp", "rb") as file:
        same(file.read(), SHELL_NAME + b"\n", "/tmp/essid_tmp")
    with open("/tmp/key_tmp") as file:
        same(file.read(), SHELL_KEY + "\n", "/tmp/key_tmp")
    same(os.stat("/tmp/key_tmp").st_mode & 0o777, 0o600, "the mode of /tmp/key_tmp")


def two_access_points_of_one_name():
    w.refresh_until(lambda now: [one[0] for one in now].count("Twins") == 2, "both are listed")
    press_connect("Twins")
    until(lambda: any(one[4].startswith("Connected\nIP Address:10.9.") and one[0] == "Twins"
                      for one in w.rows()), "one of them gives an address", 90, 0.5)
    w.idle()
    w.refresh_until(lambda now: [one[0] for one in now].count("Twins") == 2, "both are listed")
    state = [one[4] for one in w.rows() if one[0] == "Twins"]
    # The address tells which of the two it is.
    net = {"02:00:00:00:02:00": 6, "02:00:00:00:03:00": 7}[linked()]
    check(sorted(one.startswith(f"Connected\nIP Address:10.9.{net}.") for one in state)
          == [False, True], f"their states are {state}")


def the_window_closes_with_status_0():
    same(w.end(), 0, "the status")


# ---- trouble: what goes wrong in the air --------------------------------------------------------


def trouble():
    air.radios(5)
    air.access_point(1, 1, [network(b"Home Net", key="correct horse", net=2),
                            network(b"Silence")])
    trouble.goer = air.access_point(2, 6, [network(b"Goer", net=3)])
    air.addresses(2, 3)
    w.begin()
    w.idle()


def a_wrong_key_is_not_connected():
    row = press_connect("Home Net")
    answer_encrypted("wrong horse", remember=False, index=1)
    until(lambda: w.rows()[row][4] == "Not Connect", "Not Connect", 120, 1)
    followed("2", "2")
    w.idle()
    w.photograph("wrong-key")


def the_right_key_after_it():
    press_connect("Home Net")
    answer_encrypted("correct horse", remember=False, index=1)
    connected_to(2)
    followed("2", "3", "4")


def without_addresses_the_address_is_invalid():
    row = press_connect("Silence")
    until(lambda: w.rows()[row][4] == "Connected\nAcquire IP address...", "the association", 60, 1)
    until(lambda: w.rows()[row][4] == "Connected\nIP address invalid", "giving up", 120, 1)
    followed("2", "3")
    w.idle()
    same(w.widget("button-connect")["label"], "gtk-disconnect", "the button")
    w.photograph("no-address")


def an_access_point_that_goes_away():
    press_connect("Goer")
    connected_to(3)
    trouble.goer.terminate()
    trouble.goer.wait()
    # Its last beacons are remembered for half a minute.
    w.refresh_until(lambda now: "Goer" not in [one[0] for one in now], "it leaves the list")
    check(all(not one[4].startswith("Connected") for one in w.rows()), "a row is called connected")
    check(w.alive(), "the program ended")


def an_access_point_that_comes_back():
    # The supplicant goes on looking for its network; a refresh finds it joined again.
    trouble.goer = air.access_point(2, 6, [network(b"Goer", net=3)])
    w.refresh_until(lambda now: any(one[0] == "Goer" and one[4].startswith("Connected\n")
                                    for one in now), "it is joined again")


def an_access_point_that_is_gone_before_the_press():
    passer = air.access_point(3, 11, [network(b"Passer", net=4)])
    row = wanted_row("Passer")
    passer.terminate()
    passer.wait()
    w.select_surely(row)
    w.notices()
    press_button("gtk-connect")
    until(lambda: w.rows()[row][4] == "Not Connect", "Not Connect", 120, 1)
    followed("2", "2")
    w.idle()


# ---- settings: addresses by hand, a network of one's own ---------------------------------------


def settings():
    air.radios(3)
    air.access_point(1, 1, [network(b"Market", net=1), network(b"Silence", net=9)])
    air.addresses(1)
    w.begin()
    w.idle()


def open_settings():
    w.press(w.widget("button-wifi-settings"))
    return w.dialog("WLAN Setting")


def tick(box, kind, label, active=True):
    """Press a radio or check button unless it is as wanted."""
    button = w.find(box, kind, label=label)
    if button["active"] != active:
        w.press(button)
        until(lambda: w.again(button)["active"] == active, f"{label} is {active}", 20)


def write_addresses(box, *values):
    tick(box, "GtkRadioButton", "static")
    for name, value in zip(("address", "netmask", "broadcast", "gateway"), values):
        w.fill(w.find(box, "GtkEntry", name), value)


def static_addresses_reach_beyond_the_gateway():
    press_connect("Market")
    connected_to(1)
    box = open_settings()
    write_addresses(box, "10.9.1.77", "255.255.255.0", "10.9.1.255", "10.9.1.1")
    w.photograph("settings")
    w.notices()
    w.press_in(box, "gtk-ok")
    w.gone(box)
    until(lambda: "inet 10.9.1.77/24 brd 10.9.1.255" in
          run("ip", "-4", "addr", "show", "dev", "wlan0"), "the address is set", 60)
    until(lambda: "default via 10.9.1.1" in run("ip", "route"), "the gateway is set", 30)
    run("ping", "-c", "1", "-W", "10", air.BEYOND)
    followed("2", "4")
    w.idle()


def static_addresses_serve_a_network_without_any():
    # The same addresses for the next network: nobody there gives any.
    box = open_settings()
    write_addresses(box, "10.9.9.77", "255.255.255.0", "10.9.9.255", "10.9.9.1")
    w.notices()
    w.press_in(box, "gtk-ok")
    w.gone(box)
    followed("2", "4")
    press_connect("Silence")
    until(lambda: ["Silence", "Connected\nIP Address:10.9.9.77"] in
          [[one[0], one[4]] for one in w.rows()], "the address", 90, 0.5)
    until(lambda: "default via 10.9.9.1" in run("ip", "route"), "the gateway is set", 30)
    run("ping", "-c", "1", "-W", "10", air.BEYOND)
    followed("2", "3", "4")
    w.idle()


def dhcp_again():
    w.select_surely(wanted_row("Silence"))
    press_button("gtk-disconnect")
    until(lambda: all(one[4] == "Disconnect" for one in w.rows()), "no row is connected")
    box = open_settings()
    tick(box, "GtkRadioButton", "dhcp")
    w.press_in(box, "gtk-ok")
    w.gone(box)
    press_connect("Market")
    connected_to(1)


def an_invalid_address_is_refused():
    before = open("/etc/wireless.conf").read()
    box = open_settings()
    write_addresses(box, "10.9.1.300", "255.255.255.0", "10.9.1.255", "10.9.1.1")
    w.press_in(box, "gtk-ok")
    message = w.dialog("Settings invalid")
    w.press_in(message, "gtk-ok")
    w.gone(message)
    w.press_in(box, "gtk-cancel")
    w.gone(box)
    same(open("/etc/wireless.conf").read(), before, "/etc/wireless.conf")


def a_hosted_network_is_seen_and_joined_by_a_second_station():
    box = open_settings()
    write_addresses(box, "10.9.77.1", "255.255.255.0", "10.9.77.255", "10.9.77.1")
    tick(box, "GtkCheckButton", "Ad-Hoc Host")
    w.press_in(box, "gtk-preferences")
    details = w.dialog("Ad-Hoc Information")
    w.fill(w.find(details, "GtkEntry"), "Our own")
    w.press_in(details, "gtk-ok")
    w.gone(details)
    w.notices()
    w.press_in(box, "gtk-ok")
    w.gone(box)
    until(lambda: w.title() == "Ad-Hoc Host Mode", "the title says so")
    followed("3")
    check(not w.widget("button-connect")["usable"], "Connect is sensitive")
    w.photograph("hosting")
    run("ip", "link", "set", "wlan2", "up", netns=FAR)

    def seen():
        found = run("iw", "dev", "wlan2", "scan", netns=FAR, check=False)
        return any("SSID: Our own" in one and "IBSS" in one for one in found.split("BSS ")) or \
            ("SSID: Our own" in found and "IBSS" in found)

    until(seen, "a second station sees it", 90, 1)
    run("ip", "link", "set", "wlan2", "down", netns=FAR)
    run("iw", "dev", "wlan2", "set", "type", "ibss", netns=FAR)
    run("ip", "link", "set", "wlan2", "up", netns=FAR)
    frequency = re.search(r"channel \d+ \((\d+) MHz", run("iw", "dev", "wlan0", "info")).group(1)
    run("iw", "dev", "wlan2", "ibss", "join", "Our own", frequency, netns=FAR)
    run("ip", "addr", "add", "10.9.77.2/24", "dev", "wlan2", netns=FAR)
    until(lambda: "1 received" in run("ping", "-c", "1", "-W", "2", "10.9.77.1", netns=FAR,
                                      check=False), "it answers", 60)


def from_hosting_back_to_a_network():
    run("iw", "dev", "wlan2", "ibss", "leave", netns=FAR)
    box = open_settings()
    tick(box, "GtkCheckButton", "Ad-Hoc Host", False)
    tick(box, "GtkRadioButton", "dhcp")
    w.press_in(box, "gtk-ok")
    w.gone(box)
    until(lambda: w.widget("button-refresh")["usable"], "the window is idle", 90)
    w.refresh()
    press_connect("Market")
    connected_to(1)


# ---- crowd: more networks than the list holds --------------------------------------------------


def crowd():
    air.radios(7)
    number = 0
    for radio, channel, count in ((1, 1, 33), (2, 4, 33), (3, 6, 33), (4, 9, 33), (5, 11, 31)):
        names = [b"Network %03d" % (number + one) for one in range(count)]
        number += count
        air.access_point(radio, channel, [network(name, net=1 if name.endswith(b"000") else None)
                                          for name in names], beacon=200)
    air.addresses(1)
    w.begin()
    w.idle()


def of_163_networks_128_are_listed():
    found = until(lambda: run("iwlist", "wlan0", "scan", check=False).count("ESSID:") >= 163,
                  "163 networks are on the air", 60)
    check(found, "no networks")
    w.refresh()
    listed = [one[0] for one in w.rows()]
    same(len(listed), 128, "the number of rows")
    same(len(set(listed)), 128, "the number of different rows")
    check(all(re.fullmatch(r"Network \d{3}", one) for one in listed), f"the rows are {listed}")
    # All of them can be scrolled to: the list measures its rows little by little.
    until(lambda: w.widget("view-press")["rect"][3] > 128 * 12, "the list is as high as its rows")
    w.photograph("crowd")


def one_of_them_is_joined():
    press_connect("Network 000")
    connected_to(1)


# ---- late: a radio that appears after the program ----------------------------------------------


def late():
    w.begin()


def without_a_radio_it_says_so():
    box = w.dialog("No Wireless Device")
    w.photograph("no-device")
    w.press_in(box, "gtk-close")
    w.gone(box)
    same(w.title(), "No Wireless Device", "the title")
    same(w.rows(), [], "the list")


def an_absent_radio_is_waited_for_and_missed():
    # The marker of a built-in radio: the program switches it on and looks again 6 s later.
    open("/etc/build_in_wifi", "w").close()
    w.press(w.widget("button-active-device"))
    w.dialog("Checking,please wait...")
    box = w.dialog("Can not found any WIFI device.")
    w.press_in(box, "gtk-ok")
    w.gone(box)


def a_radio_that_appears_late_is_found():
    w.press(w.widget("button-active-device"))
    w.dialog("Checking,please wait...")
    air.radios(3)
    air.access_point(1, 1, [network(b"Market", net=1)])
    air.addresses(1)
    until(lambda: not any("Checking,please wait..." in w.texts(one) for one in w.windows()),
          "the checking window closes", 60)
    # The search began before the window closed.
    w.idle()
    press_connect("Market")
    connected_to(1)


GROUPS = {
    join: [
        the_list_shows_every_network,
        an_open_network_gives_an_address,
        a_refresh_finds_the_connected_network_again,
        disconnect_leaves_the_network,
        wpa2_with_a_blank_in_its_name,
        its_key_is_for_root_alone,
        a_remembered_network_by_double_click,
        from_one_network_straight_to_another,
        wep_with_the_first_key,
        a_hidden_network_by_the_name_typed,
        a_utf8_name,
        a_name_and_a_key_of_shell_characters,
        two_access_points_of_one_name,
        the_window_closes_with_status_0,
    ],
    trouble: [
        a_wrong_key_is_not_connected,
        the_right_key_after_it,
        without_addresses_the_address_is_invalid,
        an_access_point_that_goes_away,
        an_access_point_that_comes_back,
        an_access_point_that_is_gone_before_the_press,
    ],
    settings: [
        static_addresses_reach_beyond_the_gateway,
        static_addresses_serve_a_network_without_any,
        dhcp_again,
        an_invalid_address_is_refused,
        a_hosted_network_is_seen_and_joined_by_a_second_station,
        from_hosting_back_to_a_network,
    ],
    crowd: [of_163_networks_128_are_listed, one_of_them_is_joined],
    late: [
        without_a_radio_it_says_so,
        an_absent_radio_is_waited_for_and_missed,
        a_radio_that_appears_late_is_found,
    ],
}


def look(name):
    """Keep what helps to find out why a scenario failed."""
    w.photograph(f"failed-{name}")
    with open(f"{air.LOGS}/failed-{name}.txt", "w") as file:
        for command in (("iw", "dev"), ("iw", "dev", "wlan0", "link"), ("ip", "addr"),
                        ("ip", "route"), ("ps", "-ef"), ("cat", "/proc/net/wireless"),
                        ("cat", "/etc/wireless.conf"), ("dmesg",)):
            file.write(f"$ {' '.join(command)}\n{run(*command, check=False)}\n")


def recover():
    """After a failure: no dialog in the way of the next scenario, and a program that runs."""
    for _ in range(4):
        if len(w.windows()) > 1:
            run("xdotool", "key", "Escape", check=False)
            time.sleep(1)
    if not w.alive():
        w.begin()
    until(lambda: w.widget("button-connect")["usable"] or w.title() == "Ad-Hoc Host Mode",
          "the window is idle", 100, 1)


def main():
    wanted = sys.argv[1]
    only = sys.argv[2:]
    prepare, scenarios = next((p, s) for p, s in GROUPS.items() if p.__name__ == wanted)
    names = [scenario.__name__ for scenario in scenarios]
    results = open(f"{air.LOGS}/results", "a", buffering=1)
    # Where it hangs, if it hangs, is in console.log.
    faulthandler.dump_traceback_later(200, repeat=True)
    begun = time.monotonic()
    try:
        prepare()
    except Exception as reason:
        traceback.print_exc()
        for name in names:
            results.write(f"not ok {wanted}: {name.replace('_', ' ')}: not begun, {reason}\n")
        look(wanted)
        return
    print(f"{wanted}: prepared after {time.monotonic() - begun:.0f} s")
    for scenario in scenarios:
        name = scenario.__name__
        if only and name not in only:
            continue
        begun = time.monotonic()
        try:
            scenario()
            verdict = f"ok {wanted}: {name.replace('_', ' ')}"
        except Exception as reason:
            traceback.print_exc()
            first = str(reason).strip().replace("\n", "\\n")
            verdict = f"not ok {wanted}: {name.replace('_', ' ')}: {first}"
        results.write(f"{verdict} ({time.monotonic() - begun:.0f} s)\n")
        print(verdict)
        if verdict.startswith("not"):
            try:
                look(name)
                recover()
            except Exception:
                traceback.print_exc()


main()
