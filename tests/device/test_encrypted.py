# SPDX-License-Identifier: MIT
"""The dialog of an encrypted network, and the offer to keep its key."""

import re

import pytest

from connecting import (OFFER, answer_key, arrive, connect, idle, preferred, type_answer,
                        wait_commands)
from harness import wait_until
from preferred import FILE, Network, file_of

TEXT = "Encrypted Network,Please enter the key."
HOME = ("home net", "on")


def key_dialog(app, row=0):
    connect(app, row)
    return app.dialog("Encrypted Network")


def cancel(dialog):
    dialog.press("gtk-cancel")
    dialog.wait_gone()


def answers(dialog):
    """Key, whether it can be read, authentication, key index."""
    key = dialog.find("connect_key")
    return (key["text"], key["visibility"], dialog.find("Authentication_ComboBox")["active"],
            dialog.find("Key_Index_ComboBox")["active"])


def stored(dialog):
    """The combo of the preferred networks, the one without a name of its own."""
    return dialog.find("GtkComboBox", "GtkComboBox")


def frame_of(dialog, title):
    return dialog.find(type="GtkFrame", label=title)


def test_an_unknown_network(device):
    d, app = idle(device, HOME)
    dialog = key_dialog(app)
    assert "WIRELESS-LAN-DEBUG: create_ComboBox match_count=0\n" in app.stderr()
    assert answers(dialog) == ("", True, 0, 0)
    assert stored(dialog)["items"] == [] and not stored(dialog)["sensitive"]
    assert dialog.find("Authentication_ComboBox")["items"] == ["WEP", "WPA-PSK/WPA2-PSK"]
    assert dialog.find("Key_Index_ComboBox")["items"] == ["1", "2", "3", "4"]
    for key in ("Authentication_ComboBox", "Key_Index_ComboBox", "connect_key"):
        assert app.registry(key)["id"] == dialog.find(key)["id"]

    # The window.
    window = dialog.props(dialog.tree())["properties"]
    assert window["title"] == "Encrypted Network"
    assert window["default-width"] == 400 and window["default-height"] == 320
    assert not window["resizable"] and not window["allow-shrink"] and not window["allow-grow"]
    assert window["can-default"]
    assert window["type-hint"] == "dialog"
    assert d.display.stacking()[-1] == "Encrypted Network"
    assert [one["label"] for one in dialog.all(type="GtkButton")] == ["gtk-cancel", "gtk-ok"]
    assert dialog.find("connect_key")["focus"]

    # The table, row by row.
    table = dialog.find(type="GtkTable")
    properties = dialog.props(table)["properties"]
    assert (properties["n-rows"], properties["n-columns"]) == (4, 2)
    assert properties["border-width"] == 5
    children = {tuple(dialog.props(one)["packing"][edge] for edge in
                      ("top-attach", "bottom-attach", "left-attach", "right-attach")): one
                for one in table["children"]}
    assert children[0, 1, 0, 1]["type"] == "GtkImage"
    image = dialog.props(children[0, 1, 0, 1])["properties"]
    assert image["stock"] == "gtk-dialog-authentication" and image["icon-size"] == 6
    assert children[0, 1, 1, 2]["text"] == TEXT
    assert dialog.props(children[0, 1, 1, 2])["properties"]["wrap"]
    for row, title, inside in ((1, "Authentication", "Authentication_ComboBox"),
                               (2, "Preferred Network", "GtkComboBox"),
                               (3, "Key", "connect_key"), (3, "Key", "Key_Index_ComboBox")):
        frame = children[row, row + 1, 0, 2]
        assert frame["type"] == "GtkFrame" and frame["label"] == title
        assert dialog.props(frame)["properties"]["shadow-type"] == "etched-out"
        assert frame.find(inside)
    assert dialog.props("connect_key")["size-request"] == [280, 30]
    assert dialog.props("connect_key")["properties"]["editable"]
    index = dialog.find("Key_Index_ComboBox")
    assert dialog.props(index)["size-request"] == [40, 30]
    assert dialog.props(index.parent)["size-request"] == [120, 30]
    assert " Key index: " in [one.get("text") for one in index.parent["children"]]

    # Only WEP keys have an index.
    assert dialog.sensitive("Key_Index_ComboBox")
    dialog.choose("Authentication_ComboBox", "WPA-PSK/WPA2-PSK")
    assert not dialog.sensitive("Key_Index_ComboBox")
    dialog.choose("Authentication_ComboBox", "WEP")
    assert dialog.sensitive("Key_Index_ComboBox")

    # A key that can be read is edited as any text.
    dialog.type("connect_key", "abcd")
    app.key("BackSpace")
    wait_until(lambda: answers(dialog)[:2] == ("abc", True), "one letter less")

    # Enter in the key is OK.
    app.key("Return")
    app.dialog(text=OFFER).press("gtk-no")
    wait_commands(d, app)
    assert d.commands("iwset")[0].argv[6:8] == ["key", "abc"]


def test_two_stored_networks_of_one_name(device):
    d, app = idle(device, HOME, ("other", "on"), files=preferred(
        ("Upstairs", "home net", 0, 1, "first-key"), ("", "elsewhere", 0, 3, "foreign"),
        ("", "home net", 1, 2, "second-key")))
    assert app.stdout().count("build_user_cell_clist, ftext[LIST_KEY_INDEX] = ") == 3
    before = len(app.stdout())
    dialog = key_dialog(app)
    assert "WIRELESS-LAN-DEBUG: create_ComboBox match_count=2\n" in app.stderr()
    # Column 5 of each match, in order.
    assert app.stdout()[before:].endswith("0\n1\n")
    # The alias, or the name where there is none; the first one's key, the last one's settings.
    assert stored(dialog)["items"] == ["Upstairs", "home net"]
    assert stored(dialog)["active"] == 0 and stored(dialog)["sensitive"]
    assert answers(dialog) == ("first-key", False, 1, 2)
    assert not dialog.sensitive("Key_Index_ComboBox")

    # Another one: its key, hidden again, the settings as they are shown.
    dialog.click("connect_key")
    app.key("BackSpace")
    wait_until(lambda: answers(dialog)[:2] == ("", True), "an empty key in clear")
    d.display.type("typed")
    wait_until(lambda: answers(dialog)[:2] == ("typed", True), "the typed key in clear")
    dialog.choose("GtkComboBox", 1)
    wait_until(lambda: answers(dialog) == ("second-key", False, 1, 2),
               lambda: dialog.tree().sketch())
    cancel(dialog)

    # What was shown has gone into the records: the next look at the lists has it.
    app.press("button-network-configure")
    lists = app.dialog("Preferred Network Setting")
    lists.press("gtk-ok")
    lists.wait_gone()
    assert re.findall(rb"^(?:KMGMT|KINDEX) (\d+)$", d.file(FILE), re.M) == [
        b"1", b"2", b"0", b"3", b"1", b"2"]

    # A network of another name knows nothing of them.
    dialog = key_dialog(app, 1)
    assert answers(dialog) == ("", True, 0, 0) and not stored(dialog)["sensitive"]


@pytest.mark.parametrize("key, authentication, index, offered", [
    (None, None, None, False),          # nothing changed
    ("other-key", None, None, True),
    ("first-key", None, None, False),   # typed anew, the same
    (None, 1, None, True),
    (None, None, 3, True),
    ("", 1, None, True)], ids=["same", "key", "retyped", "authentication", "index", "emptied"])
def test_what_is_offered(device, key, authentication, index, offered):
    before = preferred(("Upstairs", "home net", 0, 1, "first-key"))
    d, app = idle(device, HOME, files=before)
    dialog = key_dialog(app)
    if key is not None:
        dialog.click("connect_key")
        app.key("BackSpace")
        wait_until(lambda: answers(dialog)[:2] == ("", True), "an empty key in clear")
        d.display.type(key)
        wait_until(lambda: answers(dialog)[0] == key, "the key")
    if index is not None:
        dialog.choose("Key_Index_ComboBox", index)
    if authentication is not None:
        dialog.choose("Authentication_ComboBox", authentication)
    dialog.press("gtk-ok")
    if offered:
        question = app.dialog(text=OFFER)
        # The key dialog is out of the way meanwhile, and no command has run.
        assert not dialog.exists() and d.commands("iwset") == []
        question.press("gtk-no")
    wait_commands(d, app)
    assert app.dialogs() == []
    argv = d.commands("iwset")[0].argv
    assert argv[argv.index("key") + 1] == ("first-key" if key is None else key or "off")
    assert argv[-1] == (
        "open" if authentication == 1 else f"[{(1 if index is None else index) + 1}]")
    assert d.file(FILE) == before[FILE]
    assert app.stdout().count("key_mgmt=") == app.stdout().count("do connect key_index=") == 1


# What is done to a hidden stored key, and what the entry shows then.
TOUCHES = [
    (["NEW"], "NEW"),
    (["Home", "NEW"], "NEW"),
    (["End", "NEW"], "NEW"),
    (["End", "Left", "Left", "NEW"], "NEW"),
    (["Home", "Right", "NEW"], "NEW"),
    (["Home", "shift+Right", "NEW"], "NEW"),
    (["click", "NEW"], "NEW"),
    (["ctrl+a", "NEW"], "NEW"),
    (["End", "ctrl+v"], "PASTED"),
    (["shift+Insert"], "PASTED"),
    (["Home", "ctrl+v", "NEW"], "PASTEDNEW"),
    (["BackSpace"], ""),
    (["Home", "BackSpace", "NEW"], "NEW"),
    (["Home", "Delete", "NEW"], "NEW"),
    (["End", "Left", "Delete"], ""),
    (["End", "ctrl+BackSpace"], ""),
    (["ctrl+a", "Delete", "NEW"], "NEW"),
]


def touch(d, dialog, hand):
    if hand == "click":
        dialog.click("connect_key")
    elif hand == "NEW":
        d.display.type(hand)
    else:
        d.display.key(hand)


def test_a_hidden_key_is_replaced_whole(device):
    """Whatever is done to it, no text is ever a mixture of it and what was typed."""
    d, app = idle(device, HOME, files=preferred(("Upstairs", "home net", 0, 0, "storedkey"),
                                                ("Attic", "home net", 0, 0, "x" * 127)))
    # For the clipboard.
    dialog = key_dialog(app)
    dialog.type("connect_key", "PASTED")
    app.key("ctrl+a")
    app.key("ctrl+c")
    cancel(dialog)
    for other in (False, True):
        for hands, shown in TOUCHES[::3] if other else TOUCHES:
            dialog = key_dialog(app)
            assert answers(dialog)[:2] == ("storedkey", False)
            assert dialog.find("connect_key")["focus"]
            if other:
                # Another stored network: the focus stays with the choice, a click takes it back.
                dialog.choose("GtkComboBox", 1)
                wait_until(lambda: answers(dialog)[:2] == ("x" * 127, False), "the other key")
                dialog.click("connect_key")
                wait_until(lambda: dialog.find("connect_key")["focus"], "the focus on the key")
            for hand in hands:
                touch(d, dialog, hand)
            wait_until(lambda: answers(dialog)[:2] == (shown, True),
                       lambda: f"{shown} after {hands}; it is {answers(dialog)}")
            cancel(dialog)

    # A key that is only looked at is sent; a mistyped one is not kept by a second press on Enter.
    before = d.file(FILE)
    dialog = key_dialog(app)
    for hand in ("Home", "Right", "End", "click"):
        touch(d, dialog, hand)
    assert answers(dialog)[:2] == ("storedkey", False)
    d.display.key("ctrl+a")
    d.display.type("NEW")
    d.display.key("Return")
    question = app.dialog(text=OFFER)
    app.key("Return")
    app.key("Return")
    type_answer(app, question, "Attic")
    for _ in "Attic":
        app.key("BackSpace")
    app.key("Return")
    wait_until(lambda: question.find(type="GtkEntry")["text"] == "", "an empty alias")
    assert question.exists() and d.file(FILE) == before and d.commands("iwset") == []
    type_answer(app, question, "Cellar")
    app.key("Return")
    wait_commands(d, app)
    assert d.commands("iwset")[0].argv[6:8] == ["key", "NEW"]
    assert re.findall(rb"^(?:ALIAS|KEY) (.*)$", d.file(FILE), re.M)[-2:] == [b"Cellar", b"NEW"]


def test_no_text_is_cut_in_silence(device):
    """An entry takes what its field holds, in bytes: what was left out is seen at once."""
    d, app = idle(device, HOME)
    dialog = key_dialog(app)
    dialog.click("connect_key")
    d.display.type("\u00fc" * 70)
    d.display.type("ab")
    wait_until(lambda: answers(dialog)[0] == "\u00fc" * 63 + "a", lambda: answers(dialog)[0])
    # Pasted too, and what fits of it is whole characters.
    app.key("ctrl+a")
    app.key("ctrl+c")
    app.key("Left")
    app.key("Delete")
    app.key("End")
    app.key("BackSpace")
    wait_until(lambda: answers(dialog)[0] == "\u00fc" * 62, lambda: answers(dialog)[0])
    app.key("ctrl+v")
    wait_until(lambda: answers(dialog)[0] == "\u00fc" * 63, lambda: answers(dialog)[0])
    dialog.press("gtk-ok")
    question = app.dialog(text=OFFER)
    d.display.type("\u7f51" * 43)
    wait_until(lambda: question.find(type="GtkEntry")["text"] == "\u7f51" * 42, "a full alias")
    app.key("Return")
    wait_commands(d, app)
    assert d.file("/tmp/key_tmp") == ("\u00fc" * 63).encode() + b"\n"
    assert "ALIAS {}\n".format("\u7f51" * 42).encode() in d.file(FILE)


def offer(app, key, authentication=None, index=None):
    answer_key(app, key, authentication=authentication, index=index, offer=None)
    return app.dialog(text=OFFER)


def test_keeping_networks(device):
    d, app = idle(device, ("home net", "on", "7", "mAsTeR"), ("friend", "on", "7", "Ad-Hoc"))
    connect(app, 0)
    question = offer(app, "secret one", authentication=1)
    assert "Alias:" in question.texts()
    assert sorted(one["label"] for one in question.all(type="GtkButton")) == ["gtk-no", "gtk-yes"]
    type_answer(app, question, "At home")
    question.press("gtk-yes")
    wait_commands(d, app)
    first = Network("home net", "At home", wpa=1, enc="open", key="secret one")
    assert d.file(FILE) == file_of(first)
    assert app.registered_rows("user_cell_list_backend") == [
        ["At home", "home net", "Managed", "ENC_OPEN", "secret one", "1", "0"]]
    assert app.registered_rows("user_cell_list_front") == [["At home"]]
    arrive(d, app, 0)

    # Without an alias the front list shows the name, the other one keeps the empty alias.
    connect(app, 1)
    offer(app, "12345", index=2).press("gtk-yes")
    wait_commands(d, app, 2)
    second = Network("friend", mode="Ad-Hoc", index=2, enc="open", key="12345")
    assert d.file(FILE) == file_of(first, second)
    assert app.registered_rows("user_cell_list_backend")[1] == [
        "", "friend", "Ad-Hoc", "ENC_OPEN", "12345", "0", "2"]
    assert app.registered_rows("user_cell_list_front") == [["At home"], ["friend"]]
    arrive(d, app, 1)

    # The kept key is in the dialog at once; a changed one makes another row.
    connect(app, 0)
    dialog = app.dialog("Encrypted Network")
    assert answers(dialog) == ("secret one", False, 1, 0)
    assert stored(dialog)["items"] == ["At home"]
    dialog.click("connect_key")
    app.key("BackSpace")
    d.display.type("secret two")
    dialog.press("gtk-ok")
    app.dialog(text=OFFER).press("gtk-yes")
    wait_commands(d, app, 3)
    assert [row[4] for row in app.registered_rows("user_cell_list_backend")] == [
        "secret one", "12345", "secret two"]

    # They are there after a new start.
    assert app.quit() == 0
    d.dissociate()
    app = d.start()
    wait_until(lambda: app.registered_rows("user_cell_list_front") == [
        ["At home"], ["friend"], ["home net"]], "the kept networks")


def test_a_full_list_takes_no_more(device):
    files = preferred(*[("", f"net {number}", 0, 0, "k") for number in range(64)])
    d, app = idle(device, HOME, files=files)
    connect(app, 0)
    offer(app, "secret").press("gtk-yes")
    notice = app.dialog(text="The list is full: it holds 64 networks.")
    notice.press("gtk-close")
    # The connect goes on all the same.
    wait_commands(d, app)
    assert d.commands("iwset")[0].argv[6:8] == ["key", "secret"]
    assert d.file(FILE) == files[FILE]
    assert len(app.registered_rows("user_cell_list_backend")) == 64


def test_rows_that_a_cancelled_edit_left(device):
    d, app = idle(device, HOME, files=preferred(("Upstairs", "home net", 1, 0, "first-key")))
    # A network added and not saved: no dialog knows it, and it reaches the file with no other.
    app.press("button-network-configure")
    lists = app.dialog("Preferred Network Setting")
    lists.press("gtk-add")
    form = app.dialog("Add WiFi Network")
    form.type("add_essid", "home net")
    form.type("add_alias", "never saved")
    form.press("gtk-ok")
    form.wait_gone()
    app.key("Escape")
    lists.wait_gone()
    dialog = key_dialog(app)
    assert stored(dialog)["items"] == ["Upstairs"]
    assert answers(dialog) == ("first-key", False, 1, 0)
    cancel(dialog)
    connect(app, 0)
    dialog = app.dialog("Encrypted Network")
    dialog.click("connect_key")
    app.key("BackSpace")
    d.display.type("new-key")
    dialog.press("gtk-ok")
    app.dialog(text=OFFER).press("gtk-yes")
    wait_commands(d, app)
    assert b"never saved" not in d.file(FILE)
    assert re.findall(rb"^KEY (.*)$", d.file(FILE), re.M) == [b"first-key", b"new-key"]


def test_stored_numbers_that_name_nothing(device):
    d, app = idle(device, HOME, ("twice", "on"), files=preferred(
        ("", "home net", 7, 9, "k"), ("", "twice", -1, -5, "k")))
    for row in (0, 1):
        dialog = key_dialog(app, row)
        assert answers(dialog) == ("k", False, 0, 0)
        cancel(dialog)
    connect(app, 0)
    answer_key(app, None, offer=None)
    wait_commands(d, app)
    assert d.commands("iwset")[0].argv[6:] == ["key", "k", "enc", "open", "[1]"]


def test_a_stored_name_and_key_that_are_no_text(device):
    d, app = idle(device, (b"caf\xe9", "on"), files=preferred(
        (b"\xff alias", b"caf\xe9", 1, 0, b"k\xfe\xff<b>%s_x")))
    dialog = key_dialog(app)
    assert stored(dialog)["items"] == ["\ufffd alias"]
    assert answers(dialog)[0] == "k\ufffd\ufffd<b>%s_x"
    dialog.press("gtk-ok")
    wait_commands(d, app)
    assert d.file("/tmp/key_tmp") == b"k\xfe\xff<b>%s_x\n"
    assert d.file("/tmp/essid_tmp") == b"caf\xe9\n"
