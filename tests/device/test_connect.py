# SPDX-License-Identifier: MIT
"""Connecting and disconnecting: what the device is told, what the user sees."""

import os
import stat

from connecting import (ACQUIRING, CONNECTING, HIDDEN, IDLE, LOCKED, address_of, answer_key, arrive,
                        children, connect, connected, idle, pass_time, poll_address, poll_link,
                        preferred, refresh, settle, type_answer, wait_commands)

PRINTABLE = "".join(map(chr, range(0x21, 0x7F)))


def told(d):
    """The last iwset as the device received it."""
    return d.commands("iwset")[-1].argv


def files(d):
    return d.file("/tmp/essid_tmp"), d.file("/tmp/key_tmp")


def test_every_kind_of_network(device):
    d, app = idle(device, "open", ("wep", "on"), ("WPA net", "on"),
                  ("friend", "off", "7", "Ad-Hoc"), ("shout", "off", "7", "MASTER"),
                  ("odd", "wep", "7", "Managed"), ("bare", "on"))
    count = 0

    def join(row, argv, printed, essid_file, key_file, **answers):
        nonlocal count
        count += 1
        before = len(app.stdout())
        connect(app, row)
        if answers:
            answer_key(app, **answers)
        wait_commands(d, app, count)
        assert told(d) == ["/sbin/iwset"] + argv
        assert files(d) == (essid_file, key_file)
        assert app.stdout()[before:].endswith(printed + "\r\n")
        arrive(d, app, row)

    join(0, ["wlan0", "essid", "open", "mode", "Managed", "key", "off", "enc", "off", "[1]"],
         'iwset cmd=/sbin/iwset "wlan0" essid "open" mode "Managed" key "off" enc "off" "[1]"',
         b"open\n", b"off\n")
    for index in range(4):
        join(1, ["wlan0", "essid", "wep", "mode", "Managed", "key", f"abcd{index}", "enc", "open",
                 f"[{index + 1}]"],
             f'key_mgmt=0\ndo connect key_index={index}\niwset cmd=/sbin/iwset "wlan0" essid "wep" '
             f'mode "Managed" key "abcd{index}" enc "open" "[{index + 1}]"',
             b"wep\n", b"abcd%d\n" % index, key=f"abcd{index}", index=index)
        # The same network again is a disconnect first.
        connect(app, 1)
        app.wait_printed("now is link down.\n", index + 1)
        settle(app)
        pass_time(d, app, 100)
        app.wait_state(1, "Disconnect")
    # A WPA pass phrase travels as the key, with two blanks before "wpa" and no index.
    join(2, ["wpa", "wlan0", "essid", "WPA net", "mode", "Managed", "key", "correct horse", "enc",
             "open"],
         'key_mgmt=1\ndo connect key_index=0\nwpa_supplicant cmd=/sbin/iwset  wpa "wlan0" essid '
         '"WPA net" mode "Managed" key "correct horse" enc "open"',
         b"WPA net\n", b"correct horse\n", key="correct horse", authentication=1)
    join(3, ["wlan0", "essid", "friend", "mode", "Ad-Hoc", "key", "off", "enc", "off", "[1]"],
         'iwset cmd=/sbin/iwset "wlan0" essid "friend" mode "Ad-Hoc" key "off" enc "off" "[1]"',
         b"friend\n", b"off\n")
    join(4, ["wlan0", "essid", "shout", "mode", "Managed", "key", "off", "enc", "off", "[1]"],
         'iwset cmd=/sbin/iwset "wlan0" essid "shout" mode "Managed" key "off" enc "off" "[1]"',
         b"shout\n", b"off\n")
    # Whatever the scan says but "on": an open network.
    join(5, ["wlan0", "essid", "odd", "mode", "Managed", "key", "off", "enc", "off", "[1]"],
         'iwset cmd=/sbin/iwset "wlan0" essid "odd" mode "Managed" key "off" enc "off" "[1]"',
         b"odd\n", b"off\n")
    # No key typed: "off", for a network with a key too.
    join(6, ["wlan0", "essid", "bare", "mode", "Managed", "key", "off", "enc", "open", "[1]"],
         'iwset cmd=/sbin/iwset "wlan0" essid "bare" mode "Managed" key "off" enc "open" "[1]"',
         b"bare\n", b"off\n", key="")


TWO = ("first", ("home net", "on"))


def test_a_connect_is_told_and_sent_after_a_moment(device):
    d, app = idle(device, *TWO)
    d.address("10.0.0.9")
    refresh(d, app)
    d.wait_states(5, 5)
    app.wait_listed()
    d.clear_commands()
    connect(app, 1)
    dialog = app.dialog("Encrypted Network")
    assert "WIRELESS-LAN-DEBUG: Choice to Connect index[1],count[2]\n" in app.stderr()
    assert d.states() == [5, 5]
    answer_key(app, "correct horse", authentication=1)

    # Scheduled: nothing but the notice and the texts yet.
    app.wait_title(CONNECTING)
    assert not dialog.exists()
    d.wait_states(5, 5, 2)
    assert [row[4] for row in app.networks()] == ["Disconnect", CONNECTING]
    for name in LOCKED + ("button-active-device",):
        assert not app.sensitive(name)
    assert app.sensitive("view-press")
    assert app.selected("view-press") == [1]
    assert [one.name for one in d.commands()] == ["cat", "cat"]

    # 100 ms later the device is told, its old address cleared first.
    pass_time(d, app, 99)
    assert d.commands("iwset") == []
    pass_time(d, app, 1)
    d.wait_command("iwset")
    settle(app)
    assert [one.argv for one in d.commands()[2:]] == [
        ["/sbin/ifconfig", "wlan0", "up"],
        ["/sbin/iwset", "wpa", "wlan0", "essid", "home net", "mode", "Managed", "key",
         "correct horse", "enc", "open"]]
    assert "inet " not in d.sh("ip -4 addr show dev wlan0")
    assert ("WIRELESS-LAN-DEBUG: essid to set:home net\n"
            "WIRELESS-LAN-DEBUG: interface:wlan0\n") in app.stderr()


def associated(device):
    """A device and the program on it, just told of the access point of "first"."""
    d, app = idle(device, *TWO)
    d.command("lnk-ifup", hook="until [ -e /device/state/go ]; do :; done")
    connect(app, 0)
    wait_commands(d, app)
    d.associate(address_of(0))
    poll_link(d, app)
    return d, app


def test_an_access_point_starts_the_address_script(device):
    d, app = associated(device)
    assert settle(app) == ACQUIRING
    app.wait_state(0, ACQUIRING)
    d.wait_states(5, 2, 3)
    for name in LOCKED:
        assert not app.sensitive(name)
    # Nobody's child.
    d.wait_command("lnk-ifup", ended=False)
    d.put("go", "")
    script = d.wait_command("lnk-ifup")
    assert script.path == "/sbin/lnk-ifup" and script.argv == ["lnk-ifup", "wlan0"]
    assert script.end_parent == 1
    assert children(app.pid) == []
    printed = app.stderr()
    assert "WIRELESS-LAN-DEBUG: link connected,then we will require ip address.\n" in printed
    wait = printed.partition("WIRELESS-LAN-DEBUG: wait fPID=")[2].partition("\n")[0]
    first, _, second = wait.partition(",exPID=")
    assert first == second and int(first) > 0



def test_an_address_ends_the_chain(device):
    d, app = associated(device)
    d.put("go", "")
    d.wait_command("lnk-ifup")
    d.address("192.168.7.23")
    poll_address(d, app)
    app.wait_state(0, connected("192.168.7.23"))
    assert settle(app) == IDLE
    assert [row[4] for row in app.networks()] == [connected("192.168.7.23"), "Disconnect"]
    d.wait_states(5, 2, 3, 4)
    for name in LOCKED:
        assert app.sensitive(name)
    assert not app.sensitive("button-active-device")
    assert app.label("button-connect") == "gtk-disconnect"
    assert "WIRELESS-LAN-DEBUG: acquire address successed.\n" in app.stderr()
    assert "WIRELESS-LAN-DEBUG: address:192.168.7.23\n" in app.stderr()

    # Time brings nothing more.
    d.clear_commands()
    polls = app.stderr().count("detect_network_interface_state")
    pass_time(d, app, 60000)
    assert app.stderr().count("detect_network_interface_state") == polls
    assert d.commands() == []



def test_the_button_takes_the_same_network_down(device):
    d, app = idle(device, *TWO)
    connect(app, 0)
    wait_commands(d, app)
    arrive(d, app, 0)
    d.clear_commands()
    connect(app, 0)
    app.wait_printed("WIRELESS-LAN-DEBUG: now is link down.\n")
    settle(app)
    assert app.sensitive("button-connect") and settle(app) == IDLE
    app.wait_state(0, connected("192.168.7.23"))
    pass_time(d, app, 100)
    app.wait_state(0, "Disconnect")
    assert [one.argv for one in d.commands()] == [["cat", "/proc/net/wireless"],
                                                  ["/sbin/lnk-ifdown", "wlan0"]]
    d.wait_states(5, 2, 3, 4, 2)
    assert [row[4] for row in app.networks()] == ["Disconnect", "Disconnect"]
    assert app.label("button-connect") == "gtk-connect"
    assert app.quit() == 0


def test_two_disconnects_at_once(device):
    d, app = idle(device, "one", "two")
    d.associate(address_of(0))
    d.address("192.168.7.23")
    refresh(d, app)
    app.wait_state(0, connected("192.168.7.23"))
    connect(app, 0)
    app.wait_printed("now is link down.\n")
    app.press("button-connect")
    app.wait_printed("now is link down.\n", 2)
    pass_time(d, app, 100)
    d.wait_command("lnk-ifdown", 2)
    # The second finds no network to leave, still runs the script and resets the button.
    d.wait_states(5, 5, 2, 2)
    assert [row[4] for row in app.networks()] == ["Disconnect", "Disconnect"]
    assert app.label("button-connect") == "gtk-connect"


def test_preconditions(device):
    d, app = idle(device, "one")
    windows = app.window_count()

    # Nothing selected.
    app.press("button-connect")
    notice = app.dialog(text="Select a Network First")
    assert notice.tree()["type"] == "GtkMessageDialog"
    assert [one["label"] for one in notice.all(type="GtkButton")] == ["gtk-close"]
    notice.press("gtk-close")
    notice.wait_gone()
    assert "WIRELESS-LAN-DEBUG: Choice to Connect index[-1],count[1]\n" in app.stderr()

    # No device any more: nothing to be seen, nothing left over.
    app.click_row("view-press", 0)
    d.set_interfaces()
    app.press("button-connect")
    app.wait_printed("Choice to Connect index[0],count[1]\n")
    settle(app)
    assert app.dialogs() == [] and app.window_count() == windows
    assert settle(app) == IDLE and app.sensitive("button-connect")

    # No network in the list.
    d.set_interfaces("wlan0")
    d.set_scan("wlan0     No scan results\n")
    refresh(d, app)
    app.dialog(text="No Network").press("gtk-close")
    app.wait_title(IDLE)
    app.press("button-connect")
    notice = app.dialog(text="No Network in Local Area")
    assert [one["label"] for one in notice.all(type="GtkButton")] == ["gtk-close"]
    notice.press("gtk-close")
    notice.wait_gone()
    assert app.window_count() == windows
    assert d.commands("iwset") == [] and d.states() == [5, 5]
    assert settle(app) == IDLE


def test_hidden_names(device):
    d, app = idle(device, ("", "off"), ("", "on"), "cafe")
    windows = app.window_count()
    connect(app, 0)
    question = app.dialog(text=HIDDEN)
    assert sorted(one["label"] for one in question.all(type="GtkButton")) == ["gtk-no", "gtk-yes"]
    assert "Essid:" in question.texts()
    # A name that fights back, and is typed.
    name = 'a"b $HOME `id` \\ $(touch /tmp/x) ";touch /tmp/x;"'
    type_answer(app, question, name)
    question.press("gtk-yes")
    wait_commands(d, app)
    assert told(d)[1:5] == ["wlan0", "essid", name, "mode"]
    assert files(d) == (name.encode() + b"\n", b"off\n")
    assert f"input essid = {name} \n" in app.stdout()
    assert app.networks()[0][0] == name
    assert d.file("/tmp/x") is None
    assert app.window_count() == windows
    arrive(d, app, 0)

    # Enter is Yes. What follows knows the name: the key is asked for.
    connect(app, 1)
    type_answer(app, app.dialog(text=HIDDEN), "Büro")
    app.key("Return")
    answer_key(app, "12345")
    wait_commands(d, app, 2)
    assert told(d)[1:] == ["wlan0", "essid", "Büro", "mode", "Managed", "key", "12345",
                           "enc", "open", "[1]"]
    arrive(d, app, 1)

    # No: the name stays empty and the connect goes on.
    refresh(d, app)
    app.wait_listed()
    connect(app, 0)
    app.dialog(text=HIDDEN).press("gtk-no")
    wait_commands(d, app, 3)
    assert told(d)[1:5] == ["wlan0", "essid", "", "mode"]
    assert d.file("/tmp/essid_tmp") == b"\n"
    assert app.stdout().count("input essid = ") == 2


# Each as the name and as the stored key of a network. A stored key has no blanks.
FIGHTERS = [
    b'";touch${IFS}/tmp/x;"', b"$HOME", b"`id`", b"\\", b"\\t\\n\\c", b"$(touch${IFS}/tmp/x)",
    b"-n", b"-e", b"--help", b"%s%n%d", b"'", b"!$#&|<>*?[]{}~;()", b"caf\xe9\xff\xfe",
    "☕".encode() * 42, b'"' * 63, PRINTABLE[:63].encode(), PRINTABLE[63:].encode(),
]


def test_names_and_keys_that_fight_back(device):
    texts = [text.decode("utf-8", "surrogateescape") for text in FIGHTERS]
    d, app = idle(device, *[(text, "on") for text in FIGHTERS],
                  files=preferred(*[("", text, number % 2, 0, text)
                                    for number, text in enumerate(FIGHTERS)]))
    for row, text in enumerate(texts):
        connect(app, row)
        # The key is in the dialog already, and is not offered again.
        answer_key(app, None, offer=None)
        wait_commands(d, app, row + 1)
        assert told(d) == ["/sbin/iwset"] + (["wpa"] if row % 2 else []) + [
            "wlan0", "essid", text, "mode", "Managed", "key", text, "enc", "open"] + (
                [] if row % 2 else ["[1]"])
        assert files(d) == (FIGHTERS[row] + b"\n", FIGHTERS[row] + b"\n")
        arrive(d, app, row)
    assert d.file("/tmp/x") is None
    # All that the shell ran were the commands of a connect.
    assert {one.name for one in d.commands()} <= {"cat", "ifconfig", "iwlist", "iwset", "lnk-ifup"}


def test_typed_keys_that_fight_back(device):
    d, app = idle(device, ("home", "on"))
    for count, key in enumerate([PRINTABLE[:63], " " + PRINTABLE[63:], "Schlüßel ☕",
                                 "ÿ" * 63], 1):
        connect(app, 0)
        answer_key(app, key, authentication=1)
        wait_commands(d, app, count)
        assert told(d)[8] == key
        assert d.file("/tmp/key_tmp") == key.encode() + b"\n"
        arrive(d, app, 0)
        refresh(d, app)
        d.dissociate()
        app.wait_listed()
        refresh(d, app)
        app.wait_state(0, "Disconnect")


def test_files_for_scripts_are_made_anew(device):
    d, app = idle(device, ("home", "on"))
    d.sh("echo precious >/tmp/target; chmod 666 /tmp/target; ln -s /tmp/target /tmp/key_tmp;"
         "ln -s /tmp/nowhere /tmp/essid_tmp")
    connect(app, 0)
    answer_key(app, "secret")
    wait_commands(d, app)
    assert files(d) == (b"home\n", b"secret\n")
    assert d.file("/tmp/target") == b"precious\n" and d.file("/tmp/nowhere") is None
    for name, mode in (("essid_tmp", 0o644), ("key_tmp", 0o600)):
        status = os.lstat(d.outer(f"/tmp/{name}"))
        assert stat.S_ISREG(status.st_mode) and stat.S_IMODE(status.st_mode) == mode
    arrive(d, app, 0)

    # A file that was there, open to all, does not stay so.
    d.sh("chmod 666 /tmp/key_tmp")
    refresh(d, app)
    d.dissociate()
    app.wait_listed()
    refresh(d, app)
    app.wait_state(0, "Disconnect")
    connect(app, 0)
    answer_key(app, "another")
    wait_commands(d, app, 2)
    assert d.file("/tmp/key_tmp") == b"another\n"
    assert stat.S_IMODE(os.lstat(d.outer("/tmp/key_tmp")).st_mode) == 0o600


def test_a_cancelled_key_leaves_no_trace(device):
    d, app = idle(device, ("home", "on"), "cafe")
    windows = app.window_count()
    for leave in ("gtk-cancel", "Escape"):
        connect(app, 0)
        dialog = app.dialog("Encrypted Network")
        dialog.type("connect_key", "never told")
        if leave == "Escape":
            app.key("Escape")
        else:
            dialog.press(leave)
        dialog.wait_gone()
        assert settle(app) == IDLE and app.sensitive("button-connect")
        assert [row[4] for row in app.networks()] == ["Disconnect", "Disconnect"]
        assert app.window_count() == windows
        for key in ("connect_key", "Authentication_ComboBox", "Key_Index_ComboBox"):
            assert app.registry(key) is None
    assert d.commands("iwset") == [] and d.states() == [5]
    pass_time(d, app, 60000)
    assert d.commands("iwset") == []
    # The next dialog starts afresh.
    connect(app, 0)
    dialog = app.dialog("Encrypted Network")
    assert dialog.text("connect_key") == ""


def test_connects_leave_no_descriptors_and_no_children(device):
    d, app = idle(device, "one", "two")
    counts = []
    for row in (0, 1, 0):
        connect(app, row)
        d.dissociate()
        wait_commands(d, app, len(counts) + 1)
        poll_link(d, app, 5)
        arrive(d, app, row)
        counts.append(sorted(app.descriptors().items()))
    assert len(counts[1]) == len(counts[2])
    assert children(app.pid) == []
