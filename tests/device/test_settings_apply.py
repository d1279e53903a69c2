# SPDX-License-Identifier: MIT
"""OK in the settings dialog: what is refused, written, run, told and shown."""

import os

import pytest

from harness import wait_until
from settings_page import ADDRESSES, CONF, PREFIXES, Settings, dhcp, static

LIST_KEYS = ("view-press", "button-connect", "button-refresh")
OTHER_KEYS = ("button-wifi-settings", "button-network-configure")
ACQUIRE = "Connected\nAcquire IP address..."
DISCONNECTED = "WIRELESS-LAN-DEBUG: Current state:Disconnected\n"
DISCOVERY = ("/usr/bin/cat", ["cat", "/proc/net/wireless"])
UP = ("/usr/sbin/ifconfig", ["ifconfig", "wlan0", "up"])
IF_UP = ("/sbin/lnk-ifup", ["lnk-ifup", "wlan0"])


def iwset(essid, enc="off"):
    return ("/sbin/iwset", ["/sbin/iwset", "wlan0", "essid", essid, "mode", "Ad-Hoc",
                            "key", "off", "enc", enc])


def commands(device):
    return [(one.path, one.argv) for one in device.commands()]


def printed_since(app, mark):
    return app.stdout()[mark[0]:], app.stderr()[mark[1]:]


def mark(app):
    """Forgets the commands; gives how far the output is and the states sent so far."""
    app.tree()  # answered when nothing is left to do
    app.device.clear_commands()
    return len(app.stdout()), len(app.stderr()), app.device.states()


# --- refusals

@pytest.mark.parametrize("prefix, text", [
    ("address", ""), ("netmask", ""), ("broadcast", ""), ("gateway", ""),
    ("address", "192.168.1.300"), ("address", "192.168.1"), ("netmask", "255.255.255.0/24"),
    ("broadcast", "192.168.01.255"), ("gateway", " 192.168.1.1"), ("gateway", "fe80::1"),
])
def test_refused(app, prefix, text):
    before = static()
    settings = Settings(app, before)
    settings.pane.type(prefix, text)
    typed = settings.texts()
    at = mark(app)
    settings.refused()
    assert settings.texts() == typed
    assert printed_since(app, at) == ("", "inet_pton: Invalid argument\n")
    wait_until(lambda: settings.pane.find(prefix)["focus"], "the focus on what was refused")
    # Corrected, it is taken.
    settings.pane.type(prefix, "10.1.2.3")
    assert app.device.file(CONF).decode() == before
    assert (commands(app.device), app.device.states()) == ([], at[2])
    settings.ok()
    assert app.device.file(CONF).decode() == static(
        ["10.1.2.3" if one == prefix else old for one, old in zip(PREFIXES, ADDRESSES)])


def test_only_the_form_counts(app):
    """Addresses that make no sense together are the person's business."""
    nonsense = ("255.255.255.255", "0.0.0.0", "1.2.3.4", "224.0.0.1")
    settings = Settings(app, static())
    for prefix, text in zip(PREFIXES, nonsense):
        settings.pane.type(prefix, text)
    settings.ok()
    assert app.device.file(CONF).decode() == static(nonsense)


def test_refusal_keeps_what_came_before(app):
    """In memory, that is: a stanza without readable addresses leaves it to be seen."""
    settings = Settings(app, static())
    settings.pane.type("address", "10.0.0.9")
    settings.pane.type("netmask", "255.0.0.0")
    settings.pane.type("broadcast", "10.0.0")
    settings.pane.type("gateway", "10.0.0.1")
    settings.toggle("adhoc-host")
    settings.refused()
    settings.cancel()
    unread = static().replace("\nbroadcast", "\nxbroadcast")
    for prefix in PREFIXES:
        unread = unread.replace(f"\n{prefix} ", f"\nx{prefix} ")
    settings = Settings(app, unread)
    assert settings.texts() == ("10.0.0.9", "255.0.0.0") + ADDRESSES[2:]
    settings.cancel()


def test_dhcp_ignores_the_entries(app):
    settings = Settings(app, static())
    settings.cancel()
    settings = Settings(app, dhcp())
    settings.toggle("static")
    settings.pane.type("address", "nonsense")
    settings.toggle("dhcp")
    at = mark(app)
    settings.ok()
    assert "inet_pton" not in printed_since(app, at)[1]
    assert app.device.file(CONF).decode() == dhcp("auto")
    # The addresses of the last static stanza are still there.
    unread = static()
    for prefix in PREFIXES:
        unread = unread.replace(f"\n{prefix} ", f"\nx{prefix} ")
    settings = Settings(app, unread)
    assert settings.texts() == ADDRESSES
    settings.cancel()


def test_static_stores_the_greyed_tick(app):
    settings = Settings(app, dhcp("auto"))
    settings.toggle("static")
    for prefix, text in zip(PREFIXES, ADDRESSES):
        settings.pane.type(prefix, text)
    settings.ok()
    assert app.device.file(CONF).decode() == static()
    # A static stanza says nothing of it, and its box starts without a tick: OK stores that.
    settings = Settings(app)
    assert settings.active("auto_dns") == [False]
    settings.ok()
    settings = Settings(app, dhcp().replace("dns auto", "xdns"))
    assert settings.active("dhcp", "auto_dns") == [True, False]
    settings.cancel()


def test_manual_dns(app):
    settings = Settings(app, dhcp("auto"))
    settings.toggle("auto_dns")
    settings.ok()
    assert app.device.file(CONF).decode() == dhcp("manual")


# --- the hosted network

@pytest.mark.parametrize("encryption", ["off", "open", "restricted"])
def test_host_on(app, encryption):
    device = app.device
    settings = Settings(app, dhcp(essid="board", key="secret", encryption=encryption))
    settings.toggle("adhoc-host")
    device.write("/tmp/essid_tmp", "an old one\n")
    at = mark(app)
    settings.ok()
    assert device.file(CONF).decode() == \
        dhcp(host=1, essid="board", key="secret", encryption=encryption)
    device.wait_command("lnk-ifup")
    assert commands(device) == [UP, iwset("board", encryption), IF_UP]
    assert device.file("/tmp/essid_tmp") == b"board\n"
    assert device.file("/tmp/key_tmp") is None
    out, error = printed_since(app, at)
    assert out == ('essid_buf = echo "board" >/tmp/essid_tmp \n'
                   'cmd=/sbin/iwset "wlan0" essid "board" mode "Ad-Hoc" key "off" '
                   f'enc "{encryption}"\r\n')
    lines = error.splitlines()
    assert lines[:2] == ["WIRELESS-LAN-DEBUG: isdhcp",
                         "WIRELESS-LAN-DEBUG: send_atom_to_desktop [_NET_WIFI_CHANGE_STATUS]"]
    number = lines[2].split("fPID=")[1].split(",")[0]
    assert lines[2:] == [f"WIRELESS-LAN-DEBUG: wait fPID={number},exPID={number}"]
    device.wait_states(*at[2], 3)
    assert app.text("title-label") == "Ad-Hoc Host Mode"
    assert [app.sensitive(key) for key in LIST_KEYS] == [False] * 3
    assert [app.sensitive(key) for key in OTHER_KEYS] == [True] * 2
    assert len(app.networks()) == 8  # only greyed


def test_detached(app):
    """The script is nobody's child, and no dead process waits for the program."""
    device = app.device
    device.command("lnk-ifup", delay=0.2)
    settings = Settings(app, dhcp(host=1, essid="board"))
    mark(app)
    settings.ok()
    script = device.wait_command("lnk-ifup")
    assert script.end_parent == 1
    assert [one.argv[0] for one in device.commands()] == ["ifconfig", "/sbin/iwset", "lnk-ifup"]
    with open(f"/proc/{app.pid}/task/{app.pid}/children", encoding="ascii") as children:
        assert children.read() == ""
    device.command("lnk-ifup")


def test_host_off_gives_the_window_back(app):
    device = app.device
    device.dissociate()
    settings = Settings(app, static(host=1, essid="board"))
    settings.ok()
    assert app.text("title-label") == "Ad-Hoc Host Mode"
    settings = Settings(app)
    settings.toggle("adhoc-host")
    at = mark(app)
    settings.ok()
    assert app.text("title-label") == "Wireless network selection"
    assert [app.sensitive(key) for key in LIST_KEYS] == [True] * 3
    device.wait_states(*at[2], 2)
    assert device.file(CONF).decode() == static(essid="board")
    assert commands(device) == []
    out, error = printed_since(app, at)
    assert out == ""
    assert error == ("WIRELESS-LAN-DEBUG: isstatic\n"
                     "WIRELESS-LAN-DEBUG: send_atom_to_desktop [_NET_WIFI_CHANGE_STATUS]\n"
                     "WIRELESS-LAN-DEBUG: Detect Linked Acess Pointer:00:00:00:00:00:00\n"
                     + DISCONNECTED)


@pytest.mark.parametrize("essid, quoted", [
    ('a "b" $(touch /tmp/run) `id` \\n', r'a \"b\" \$(touch /tmp/run) \`id\` \\n'),
    ("'; touch /tmp/run; '", "'; touch /tmp/run; '"),
    ("-n %s%n ü☕", "-n %s%n ü☕"),
    ("&" * 127, "&" * 127),
])
def test_hosted_names_are_data(app, essid, quoted):
    device = app.device
    settings = Settings(app, dhcp(host=1, essid="board"))
    information = settings.open_group()
    information.type("GtkEntry", essid)  # the only one, without a name of its own
    information.press("gtk-ok")
    information.wait_gone()
    at = mark(app)
    settings.ok()
    device.wait_command("lnk-ifup")
    assert commands(device) == [UP, iwset(essid), IF_UP]
    assert device.file("/tmp/essid_tmp").decode() == essid + "\n"
    assert device.file("/tmp/run") is None
    writer = "echo" if quoted == essid and essid[0] != "-" else "printf '%s\\n'"
    assert printed_since(app, at)[0] == (
        f'essid_buf = {writer} "{quoted}" >/tmp/essid_tmp \n'
        f'cmd=/sbin/iwset "wlan0" essid "{quoted}" mode "Ad-Hoc" key "off" enc "off"\r\n')
    assert device.file(CONF).decode() == dhcp(host=1, essid=essid)


def test_planted_link_is_not_followed(app):
    device = app.device
    device.write("/tmp/precious", "stays\n")
    device.sh("rm -f /tmp/essid_tmp; ln -s precious /tmp/essid_tmp")
    settings = Settings(app, dhcp(host=1, essid="board"))
    settings.ok()
    assert device.file("/tmp/precious") == b"stays\n"
    assert device.file("/tmp/essid_tmp") == b"board\n"
    assert not os.path.islink(device.outer("/tmp/essid_tmp"))


def test_commands_that_fail_change_nothing(app):
    device = app.device
    device.command("ifconfig", status=1)
    device.command("iwset", status=9)
    device.command("lnk-ifup", missing=True)
    settings = Settings(app, dhcp(host=1, essid="board"))
    at = mark(app)
    settings.ok()
    assert app.text("title-label") == "Ad-Hoc Host Mode"
    device.wait_states(*at[2], 3)
    app.wait_printed("WIRELESS-LAN-DEBUG: wait fPID=")
    for name in ("ifconfig", "iwset", "lnk-ifup"):
        device.command(name)


# --- a file that cannot be written

def test_failed_write_is_told(app):
    device = app.device
    before = dhcp(essid="board")
    settings = Settings(app, before)
    settings.toggle("adhoc-host")
    # Neither the file nor its directory can be written.
    device.sh("mount --bind /etc /etc && mount -o remount,ro,bind /etc")
    at = mark(app)
    try:
        settings.pane.press("gtk-ok")
        message = app.dialog(text="The settings could not be saved.")
        assert message.tree()["modal"]
        assert printed_since(app, at)[1].startswith(
            "WIRELESS-LAN-DEBUG: File /etc/wireless.conf cannot be open.\n")
        assert commands(device) == []
        message.press("gtk-ok")
        settings.pane.wait_gone()
    finally:
        device.sh("umount /etc")
    # What cannot be kept is applied all the same.
    assert app.text("title-label") == "Ad-Hoc Host Mode"
    device.wait_command("lnk-ifup")
    assert commands(device) == [UP, iwset("board"), IF_UP]
    assert device.file(CONF).decode() == before


# --- the hosted network off

def test_off_without_networks(device):
    empty = device("none")
    program = empty.start()
    program.dialog(text="No Network").press("gtk-close")
    program.wait_title("Wireless network selection")
    settings = Settings(program, dhcp())
    at = mark(program)
    settings.ok()
    empty.wait_states(*at[2], 2)
    assert commands(empty) == []
    # Not even the access point is asked for.
    assert printed_since(program, at) == (
        "", "WIRELESS-LAN-DEBUG: isdhcp\n"
        "WIRELESS-LAN-DEBUG: send_atom_to_desktop [_NET_WIFI_CHANGE_STATUS]\n")
    assert [program.sensitive(key) for key in LIST_KEYS] == [True] * 3
    assert program.text("title-label") == "Wireless network selection"


def test_off_without_an_answer(device):
    """An interface that the kernel does not know has no access point at all."""
    odd = device("street")
    program = odd.start()
    program.wait_listed()
    settings = Settings(program, dhcp())
    odd.sh("ip link delete wlan0")
    at = mark(program)
    settings.ok()
    assert printed_since(program, at)[1].endswith(
        "send_atom_to_desktop [_NET_WIFI_CHANGE_STATUS]\n" + DISCONNECTED)
    odd.wait_states(*at[2], 2)
    assert commands(odd) == []


@pytest.fixture
def connected(device):
    one = device("connected", rate=20)
    one.command("lnk-ifup", hook=":")
    program = one.start()
    program.wait_listed()
    program.wait_state(1, "Connected\nIP Address:192.168.7.23")
    return program


def test_off_associated(connected):
    app, device = connected, connected.device
    acquiring = [ACQUIRE if row == 1 else "Disconnect" for row in range(len(app.networks()))]
    settings = Settings(app, static())
    device.clock.rate = 0
    device.address(None)
    at = mark(app)
    settings.pane.press("gtk-ok")
    device.wait_command("lnk-ifup")
    wait_until(lambda: app.networks()[1][4] == ACQUIRE, ACQUIRE)
    assert [row[4] for row in app.networks()] == acquiring
    assert app.text("title-label") == "Wireless network selection"
    assert [app.sensitive(key) for key in LIST_KEYS] == [True] * 3
    assert commands(device) == [IF_UP]
    device.wait_states(*at[2], 2)
    error = printed_since(app, at)[1].splitlines()
    assert error[:3] == [
        "WIRELESS-LAN-DEBUG: isstatic",
        "WIRELESS-LAN-DEBUG: send_atom_to_desktop [_NET_WIFI_CHANGE_STATUS]",
        "WIRELESS-LAN-DEBUG: Detect Linked Acess Pointer:02:00:00:00:00:02"]
    assert error[3].startswith("WIRELESS-LAN-DEBUG: wait fPID=") and len(error) == 4

    poll = "detect_network_interface_state ..."
    device.clock.advance(3900)
    assert [row[4] for row in app.networks()] == acquiring
    assert poll not in printed_since(app, at)[1]
    device.clock.advance(200)
    app.wait_printed(poll, 1)
    # The next looks are 4000 ms apart too.
    device.clock.advance(3900)
    app.networks()
    assert app.stderr().count(poll) == 1
    device.address("192.168.1.2")
    device.clock.advance(200)
    app.wait_printed(poll, 2)
    app.wait_state(1, "Connected\nIP Address:192.168.1.2")
    device.wait_states(*at[2], 2, 4)
    assert app.label("button-connect") == "gtk-disconnect"
    settings.pane.wait_gone()


def test_off_associated_without_an_address(connected):
    app, device = connected, connected.device
    settings = Settings(app, dhcp())
    device.address(None)
    at = mark(app)
    device.clock.rate = 200
    settings.ok()
    app.wait_state(1, "Connected\nIP address invalid")
    assert printed_since(app, at)[1].count("detect_network_interface_state ...") == 21
    device.wait_states(*at[2], 2)
    assert commands(device).count(IF_UP) == 1


# --- the interface goes while the dialog is open

def test_interface_gone_meanwhile(connected):
    """A poll that ends under the open dialog finds no interface: nothing is written, nothing run
    for a name that is none."""
    app, device = connected, connected.device
    device.clock.rate = 0
    settings = Settings(app, static(host=1, essid="board"))
    settings.toggle("adhoc-host")
    settings.ok()
    settings = Settings(app)
    before = device.file(CONF)
    settings.pane.type("address", "10.9.8.7")
    device.set_interfaces()
    device.clock.advance(4000)
    app.wait_printed("acquire address successed.")
    wait_until(lambda: app.sensitive("button-active-device"), "the discovery")
    at = mark(app)
    settings.pane.press("gtk-ok")
    message = app.dialog(text="The settings could not be saved.")
    message.press("gtk-ok")
    settings.pane.wait_gone()
    assert device.file(CONF) == before
    assert [one for one in commands(device) if one != DISCOVERY] == []
    skipped = [line for line in printed_since(app, at)[1].splitlines() if "skipping" in line]
    assert skipped[0] == \
        "WIRELESS-LAN-DEBUG: no usable interface name, skipping saving the settings"
