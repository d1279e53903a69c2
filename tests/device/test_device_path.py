# SPDX-License-Identifier: MIT
"""A device that knows more than a board does: why a command failed, the access point where the
kernel does not tell it, and the kind of a network's key."""

import errno

from connecting import (CONNECTING, IDLE, INVALID, address_of, arrive, children, connect, idle,
                        pass_time, poll_address, poll_link, preferred, settle, wait_commands)
from harness import wait_until

REASON = "/run/wireless-lan/reason"
AP_ADDRESS = "/usr/lib/wireless-lan/device/ap-address"
LINKED = "WIRELESS-LAN-DEBUG: Detect Linked Acess Pointer:"
NOBODY = "WIRELESS-LAN-DEBUG: AP MAC[]:Disconnected\n"


def install(d, script):
    """The device's command that tells the access point; it notes what it is asked."""
    # Moved into its place: the program may be about to run the former one.
    d.write(f"{AP_ADDRESS}.new", f"#!/bin/sh\necho \"$*\" >>/device/state/asked\n{script}\n")
    d.sh(f"chmod 755 {AP_ADDRESS}.new && mv {AP_ADDRESS}.new {AP_ADDRESS}")


def refuse(d, error):
    """The kernel answers the request for the access point with an error."""
    d.put("ap-error", str(error))


def asked(d):
    return d.state_file("asked").decode().splitlines()


def disconnect(d, app, row=0):
    """Leaves the network of a row that is connected."""
    count = len(d.commands("lnk-ifdown")) + 1
    connect(app, row)
    app.wait_printed("WIRELESS-LAN-DEBUG: now is link down.\n", count)
    pass_time(d, app, 100)
    d.wait_command("lnk-ifdown", count)
    d.address(None)
    settle(app)


def fail_to_connect(d, app, row=0):
    connect(app, row)
    wait_commands(d, app, len(d.commands("iwset")) + 1)
    poll_link(d, app, 21)


def test_the_access_point_where_the_kernel_does_not_tell_it(device):
    d, app = idle(device, "one", "two", device_path=True)
    install(d, "echo 02:00:00:00:00:02")
    # On an interface that answers nobody else is asked.
    fail_to_connect(d, app, 1)
    assert asked(d) == []

    for error in (errno.EOPNOTSUPP, errno.ENOTTY, errno.EINVAL):
        refuse(d, error)
        connect(app, 1)
        wait_commands(d, app, len(d.commands("iwset")) + 1)
        before = app.stderr().count(LINKED + address_of(1) + "\n")
        poll_link(d, app)
        assert app.stderr().count(LINKED + address_of(1) + "\n") == before + 1
        assert asked(d)[-1] == "wlan0"
        d.address("192.168.7.23")
        poll_address(d, app)
        app.wait_state(1, "Connected\nIP Address:192.168.7.23")
        disconnect(d, app, 1)

    # Another error is an answer: no such device, no rights.
    count = len(asked(d))
    for error in (errno.ENODEV, errno.EPERM):
        refuse(d, error)
        connect(app, 0)
        wait_commands(d, app, len(d.commands("iwset")) + 1)
        poll_link(d, app, 21)
    assert len(asked(d)) == count
    assert settle(app) == IDLE


def test_answers_that_are_no_address(device):
    d, app = idle(device, "one", device_path=True)
    refuse(d, errno.EOPNOTSUPP)
    connect(app, 0)
    wait_commands(d, app)
    poll_link(d, app)  # no such command
    before = app.descriptors()
    for answer in ("", "echo", "echo Not connected.", "echo 02:00:00:00:00", "exit 1",
                   "echo 02:00:00:00:00:01:02", "echo 02-00-00-00-00-01", "echo 0g:00:00:00:00:01",
                   "head -c 100000 /dev/zero", "yes"):
        install(d, answer)
        count = app.stderr().count(NOBODY)
        poll_link(d, app)
        assert app.stderr().count(NOBODY) == count + 1, answer
    assert app.descriptors() == before
    assert settle(app) == CONNECTING

    # What hangs is ended with all that it started, and the window goes on.
    install(d, "echo 02:00\nsleep 1000 & echo $! >/device/state/child\nwait")
    count = app.stderr().count(NOBODY)
    pass_time(d, app, 1900)
    d.clock.rate = 0.05  # 40 s to begin in, on a busy machine too, before its 2 s are over
    wait_until(lambda: d.state_file("child").endswith(b"\n"), "the command to hang")
    assert app.stderr().count(NOBODY) == count
    install(d, "printf '02:00:00:00:00:ab'")
    d.clock.rate = 1
    app.wait_printed(NOBODY, count + 1)
    # The next look is due at once, since this one took as long as the pause between two.
    d.clock.rate = 0
    app.wait_printed(LINKED + "02:00:00:00:00:AB\n")
    wait_until(lambda: not any(b"1000" in line for _, line in children(d.init)),
               "all that the command started to be gone")


def test_without_such_a_device_nobody_is_asked(device):
    d, app = idle(device, ("one", "on"))
    install(d, "echo 02:00:00:00:00:01")
    refuse(d, errno.EOPNOTSUPP)
    d.write(REASON, "wrong-key\n")
    connect(app, 0)
    dialog = app.dialog("Encrypted Network")
    assert dialog.find("Authentication_ComboBox")["active"] == 0
    dialog.type("connect_key", "abcde")
    dialog.press("gtk-ok")
    app.dialog(text="Do you want to add this configuration to the preferred network?").press(
        "gtk-no")
    wait_commands(d, app)
    poll_link(d, app, 21)
    assert settle(app) == IDLE
    assert asked(d) == [] and app.dialogs() == []


REASONS = [
    (b"wrong-key\n", "The access point refuses the key."),
    (b"not-found\n", "The network is out of reach."),
    (b"refused\n", "The access point refuses the connection."),
    (b"rfkill-soft\n", "The radio is switched off and cannot be switched on."),
    (b"rfkill-hard\n", "A switch on the device has turned the radio off."),
    (b"not-root\n", "Only an administrator can set the wireless network up."),
    (b"no-interface\n", "The wireless device is gone."),
    (b"no-driver\n", "The system has no driver for the wireless device."),
    (b"no-answer\n", "The wireless device does not answer."),
    (b"no-scan\n", "The system does not permit a search for networks."),
    (b"no-wep\n", "The system can no longer use WEP keys."),
    (b"no-hosting\n", "The wireless device cannot host a network."),
    (b"no-dhcp\n", "No DHCP client is installed."),
    (b"no-lease\n", "No DHCP server has given an address."),
    (b"bad-name\n", "A network's name has 1 to 32 bytes."),
    (b"bad-wep-key\n", "A WEP key has 5 or 13 characters, or 10 or 26 hexadecimal digits."),
    (b"bad-wpa-key\n", "A WPA key has 8 to 63 characters, or 64 hexadecimal digits."),
    (b"busy\n", "Another command keeps the wireless device busy."),
    (b"missing-tool iw\n", "A tool is missing and has to be installed: iw"),
    # Words that nobody has translated are shown as they are, and are safe to look at.
    (b"wrong-keys\n", "wrong-keys"),
    (b"100% <b>of</b> it\x1b[1m\xff_x\n", "100% <b>of</b> it [1m\ufffd_x"),
    ("das Netz schläft".encode(), "das Netz schläft"),
    (b"a\x00b", "a"),
    (b"long " * 1000, ("long " * 51).strip()),
]


def test_the_reason_of_a_search_without_result(device):
    d, app = idle(device, "one", device_path=True)
    d.set_scan(b"")
    d.clock.rate = 50
    for text, sentence in REASONS:
        d.write(REASON, text)
        app.press("button-refresh")
        notice = app.dialog(text="No Network")
        assert notice.tree().texts().count(sentence) == 1, (sentence, notice.tree().texts())
        notice.press("gtk-close")
        notice.wait_gone()
    for text in (b"", b"\n", b"  \n", None):
        if text is None:
            d.remove(REASON)
        else:
            d.write(REASON, text)
        app.press("button-refresh")
        notice = app.dialog(text="No Network")
        assert notice.tree().texts() == ["No Network", "Close"]
        notice.press("gtk-close")
        notice.wait_gone()


def test_the_reason_of_a_failed_connect(device):
    d, app = idle(device, "one", device_path=True)
    d.write(REASON, "wrong-key\n")
    fail_to_connect(d, app)
    notice = app.dialog(text="The access point refuses the key.")
    # All is as it is without a reason, but for the box.
    assert app.networks()[0][4] == "Not Connect"
    assert app.text("title-label") == IDLE
    assert d.states() == [5, 2, 2]
    assert app.label("button-connect") == "gtk-connect"
    notice.press("gtk-close")
    notice.wait_gone()

    d.associate(address_of(0))
    d.write(REASON, "no-lease\n")
    connect(app, 0)
    wait_commands(d, app, 2)
    poll_link(d, app)
    poll_address(d, app, 21)
    notice = app.dialog(text="No DHCP server has given an address.")
    assert app.networks()[0][4] == INVALID
    assert app.label("button-connect") == "gtk-disconnect"
    notice.press("gtk-close")
    notice.wait_gone()

    # Success has none.
    d.remove(REASON)
    disconnect(d, app)
    d.dissociate()
    connect(app, 0)
    wait_commands(d, app, 3)
    arrive(d, app, 0)
    assert app.dialogs() == []


NO_RIGHTS = "unsigned geteuid(void) { return 1000; }"


def test_without_the_rights_of_root(device):
    d = device("street")
    preload = d.preload("rights", NO_RIGHTS)
    app = d.start(environment=preload, device_path=True)
    notice = app.dialog(text="Only an administrator can set the wireless network up.")
    assert d.commands("iwlist") == []
    notice.press("gtk-close")
    app.wait_listed()
    assert app.quit() == 0

    # A board's own commands may well be for everybody.
    app = d.start(environment=preload)
    app.wait_listed()
    assert app.dialogs() == []


def announced(*networks):
    """A scan as the device prints it: (name, key, kind) of each network."""
    text = b""
    for number, (name, key, kind) in enumerate(networks, 1):
        text += (f"          Cell {number:02d} - Address: {address_of(number - 1)}\n"
                 f'                    ESSID:"{name}"\n'
                 "                    Mode:Master\n                    Frequency:2.437 GHz\n"
                 f"                    Quality:70/100\n                    Encryption key:{key}\n"
                 + (f"                    Authentication:{kind}\n" if kind else "") +
                 "                    Bit Rates:54 Mb/s\n").encode()
    return text


def test_the_kind_of_a_key(device):
    networks = announced(("new", "on", "WPA"), ("old", "on", "WEP"), ("mute", "on", None),
                         ("Authentication:WPA", "on", "WEP"), ("open", "off", None),
                         ("stored", "on", "WPA"), ("strange", "on", "WPA3000"))
    d = device("none", rate=50, scan=networks, files=preferred(("", "stored", 0, 2, "abcde")))
    app = d.start(device_path=True)
    app.wait_listed()
    assert [row[0] for row in app.networks()] == \
        ["new", "old", "mute", "Authentication:WPA", "open", "stored", "strange"]
    for row, active in ((0, 1), (1, 0), (2, 0), (3, 0), (5, 0), (6, 0)):
        connect(app, row)
        dialog = app.dialog("Encrypted Network")
        assert dialog.find("Authentication_ComboBox")["active"] == active, row
        # Only WEP keys have an index.
        assert dialog.sensitive("Key_Index_ComboBox") is (active == 0)
        dialog.press("gtk-cancel")
        dialog.wait_gone()
    assert app.quit() == 0

    # A board says nothing of it, whatever its tool prints.
    app = d.start()
    app.wait_listed()
    connect(app, 0)
    dialog = app.dialog("Encrypted Network")
    assert dialog.find("Authentication_ComboBox")["active"] == 0
