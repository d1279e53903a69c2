# SPDX-License-Identifier: MIT
"""Adding a preferred network, and editing one: the form, its toggles, what it refuses."""

import pytest

from harness import wait_until

from preferred import (ADD, BACKEND, FILE, FRONT, LIST, NO_ESSID, NO_KEY, PROPERTIES, Network,
                       change, close, file_of, names, open_list, printed, select, start, warned)

HOME = Network("kitchen", "Home", wpa=1, enc="open", key="passphrase")
CAFE = Network("cafe", index=3, enc="restricted", key="abcde")
DESK = Network("desk", "Office", mode="Ad-Hoc")

# Registry keys of the two forms.
ADD_KEYS = {
    "alias": "add_alias", "essid": "add_essid", "wep": "add_wep", "wpa": "add_wpa",
    "modes": "mode_container", "managed": "add_mode_managed", "adhoc": "add_mode_ad-hoc",
    "states": "wep_container", "off": "add_enc_off", "open": "add_enc_open",
    "restricted": "add_enc_restricted", "key_row": "add_key_hbox", "key": "add_key",
    "index": "add_key_index",
}
PROPERTIES_KEYS = {
    "alias": "properties_alias", "essid": "properties_essid", "wep": "properties_add_wep",
    "wpa": "properties_add_wpa", "modes": "properties_mode_container",
    "managed": "properties_mode_managed", "adhoc": "properties_mode_ad-hoc",
    "states": "properties_wep_container", "off": "properties_enc_off",
    "open": "properties_enc_open", "restricted": "properties_enc_restricted",
    "key_row": "properties_key_hbox", "key": "properties_key", "index": "properties_key_index",
}
FORMS = {ADD: ADD_KEYS, PROPERTIES: PROPERTIES_KEYS}


def open_form(app, dialog, title):
    dialog.press("preferred_button_add" if title == ADD else "preferred_button_properties")
    return app.dialog(title)


def chosen(form, keys):
    """What is chosen, and whether mode row, key state row, key and key index can be used."""
    tree = form.tree()
    radios = [name for name in ("wep", "wpa", "managed", "adhoc", "off", "open", "restricted")
              if tree.find(keys[name])["active"]]
    return " ".join(radios), [tree.find(keys[name])["usable"]
                              for name in ("modes", "states", "key", "index")]


def wait_chosen(form, keys, radios, usable):
    wait_until(lambda: chosen(form, keys) == (radios, usable),
               lambda: f"{radios} {usable}; it is {chosen(form, keys)}")


@pytest.mark.parametrize("title", FORMS)
def test_widgets(device, title):
    keys = FORMS[title]
    _, app = start(device, DESK._replace(mode="Managed"))
    dialog = open_list(app)
    select(dialog, 0)
    form = open_form(app, dialog, title)
    tree = form.tree()

    def own(widget):
        return form.props(widget)["properties"]

    def place(widget):
        packing = form.props(widget)["packing"]
        return [packing[edge + "-attach"] for edge in ("left", "right", "top", "bottom")]

    window = own(tree)
    assert window["transient-for"]["id"] == dialog.tree()["id"]
    assert (window["destroy-with-parent"], window["type-hint"], window["modal"]) == \
        (True, "dialog", True)
    assert (window["allow-shrink"], window["allow-grow"]) == (False, False)
    assert window["can-default"] and window["has-default"]
    ok, cancel = tree.find(label="gtk-ok"), tree.find(label="gtk-cancel")
    assert form.props(ok)["packing"]["position"] < form.props(cancel)["packing"]["position"]

    frame = tree.find(type="GtkFrame")
    assert (own(frame)["label"], own(frame)["label-xalign"]) == ("WiFi Network", 0)
    assert abs(own(frame)["label-yalign"] - 0.6) < 0.01
    assert (own(frame)["shadow-type"], own(frame)["border-width"]) == ("etched-out", 10)
    assert form.props(frame)["packing"]["expand"]
    table = tree.find(type="GtkTable")
    assert [own(table)[name] for name in ("n-rows", "n-columns", "border-width")] == [8, 2, 5]

    for row, text in enumerate(["Alias", "ESSID", "Encryption", "Mode", "Key state", "Key"]):
        label = tree.find(text=text)
        assert place(label) == [0, 1, row, row + 1]
        assert own(label)["xalign"] == 0
    rows = [keys["alias"], keys["essid"], None, keys["modes"], keys["states"], keys["key_row"]]
    for row, key in enumerate(rows):
        if key is not None:
            assert place(tree.find(key)) == [1, 2, row, row + 1]
    assert place(tree.find(keys["wep"]).parent) == [1, 2, 2, 3]
    for box, texts, names_ in [(tree.find(keys["wep"]).parent, ["WEP", "WPA"], ["wep", "wpa"]),
                               (tree.find(keys["modes"]), ["Managed", "Ad-Hoc"],
                                ["managed", "adhoc"]),
                               (tree.find(keys["states"]), ["off", "open", "restricted"],
                                ["off", "open", "restricted"])]:
        assert box["type"] == "GtkHBox"
        assert [(one["name"], one["label"]) for one in box["children"]] == \
            list(zip([keys[name] for name in names_], texts))
    key_row = tree.find(keys["key_row"])
    assert [one["type"] for one in key_row["children"]] == ["GtkEntry", "GtkLabel", "GtkComboBox"]
    assert key_row["children"][1]["text"] == " Key index:"
    assert tree.find(keys["key"])["visibility"] is False
    assert tree.find(keys["index"])["items"] == ["1", "2", "3", "4"]
    for key in keys.values():
        assert app.registry(key)["name"] == key
    # The other form's keys are nobody's.
    for key in next(other for name, other in FORMS.items() if name != title).values():
        assert app.registry(key) is None

    assert chosen(form, keys) == ("wep managed off", [True, True, False, False])
    assert tree.find(keys["index"])["active"] == 0
    wanted = ("", "", "") if title == ADD else ("Office", "desk", "off")
    assert tuple(form.text(keys[name]) for name in ("alias", "essid", "key")) == wanted
    close(form, "gtk-cancel")
    for key in keys.values():
        assert app.registry(key) is None


@pytest.mark.parametrize("title", FORMS)
def test_toggles(device, title):
    """Every way from one choice to another, in the order in which GTK+ tells of them."""
    keys = FORMS[title]
    _, app = start(device, Network("desk"))
    dialog = open_list(app)
    select(dialog, 0)
    form = open_form(app, dialog, title)
    line = f"WIRELESS-LAN-DEBUG: user_data:{keys['key_row']}\n"
    at_first = app.stderr().count(line)
    # What each state looks like, and how often a step there prints its line from off, open or
    # restricted, and from WPA.
    usable = {"off": [True, True, False, False], "open": [True] * 4, "restricted": [True] * 4,
              "wpa": [False, False, True, False]}
    lines = at_first
    form.press(keys["adhoc"])
    now = "off"
    path = ["open", "restricted", "open", "off", "restricted", "off", "wpa", "wpa", "wep",
            "wep", "open", "wpa", "wep", "restricted", "wep", "wpa", "wep"]
    for step in path:
        form.press(keys[step])
        if step == "wep" and now != "wpa":
            pass  # chosen already: nothing is told
        elif step == "wep":
            now, lines = "off", lines + 1
        elif step == "wpa" and now == "wpa":
            pass
        elif step == "wpa":
            # The button that loses the choice is told first and sets "off", then WPA sets "open".
            lines += 1 if now == "off" else 2
            now = "wpa"
        else:
            now, lines = step, lines + 1
        radios = "wpa adhoc open" if now == "wpa" else f"wep adhoc {now}"
        wait_chosen(form, keys, radios, usable[now])
        assert app.stderr().count(line) == lines, step
    close(form, "gtk-cancel")


def test_add(device):
    d, app = start(device, HOME)
    dialog = open_list(app)
    k = ADD_KEYS

    # Nothing but a name.
    form = open_form(app, dialog, ADD)
    form.type("add_essid", "plain")
    close(form, "gtk-ok")
    plain = Network("plain", key="")
    assert app.registered_rows(BACKEND)[1:] == [plain.row()]
    assert (names(app), dialog.selected(FRONT)) == (["Home", "plain"], [1])
    assert app.stderr().endswith("WIRELESS-LAN-DEBUG: select row [1],column [0]\n"
                                 "WIRELESS-LAN-DEBUG: user_wifi_count=1\n")
    assert app.stdout().endswith("ftext[LIST_KEY_INDEX] = 0\n")

    # Refused entries keep the form as it is; a Cancel then adds nothing.
    form = open_form(app, dialog, ADD)
    form.type("add_alias", "Alias 100% <b>")
    warned(app, form, "gtk-ok", NO_ESSID)
    assert form.text("add_alias") == "Alias 100% <b>"
    form.type("add_essid", "two words")
    form.press(k["open"])
    warned(app, form, "gtk-ok", NO_KEY)
    assert chosen(form, k) == ("wep managed open", [True] * 4)
    assert (form.text("add_alias"), form.text("add_essid")) == ("Alias 100% <b>", "two words")
    close(form, "gtk-cancel")
    assert names(app) == ["Home", "plain"]

    # WEP with a key and its index.
    form = open_form(app, dialog, ADD)
    assert form.text("add_essid") == ""
    form.type("add_alias", "Alias 100% <b>")
    form.type("add_essid", "two words")
    form.press(k["restricted"])
    form.type("add_key", "abcde")
    form.choose("add_key_index", "3")
    close(form, "gtk-ok")
    wep = Network("two words", "Alias 100% <b>", index=2, enc="restricted", key="abcde")
    assert app.stdout().endswith("ftext[LIST_KEY_INDEX] = 2\n")

    # WPA keeps the mode and the key index that were chosen before it, and needs a key.
    form = open_form(app, dialog, ADD)
    form.type("add_essid", "bureau é")
    form.press(k["adhoc"])
    form.press(k["open"])
    form.choose("add_key_index", "2")
    form.press(k["wpa"])
    wait_chosen(form, k, "wpa adhoc open", [False, False, True, False])
    assert form.find("add_key_index")["active"] == 1
    warned(app, form, "gtk-ok", NO_KEY)
    form.type("add_key", "pass phrase")
    close(form, "gtk-ok")
    wpa = Network("bureau é", mode="Ad-Hoc", wpa=1, index=1, enc="open", key="pass phrase")

    # A key that was typed and is of no use any more is kept in the row, not in the file.
    form = open_form(app, dialog, ADD)
    form.type("add_essid", "plain")
    form.press(k["open"])
    form.type("add_key", "left over")
    form.press(k["off"])
    close(form, "gtk-ok")
    off = Network("plain", key="left over")

    assert app.registered_rows(BACKEND) == [one.row() for one in (HOME, plain, wep, wpa, off)]
    assert names(app) == ["Home", "plain", "Alias 100% <b>", "bureau é", "plain"]
    # The new network is the selected one.
    change(dialog, "gtk-go-up", ["Home", "plain", "Alias 100% <b>", "plain", "bureau é"])
    assert d.file(FILE) == file_of(HOME)
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(HOME, plain, wep, off, wpa))
    assert app.quit() == 0
    # Read back: the key is one word there, and without encryption it is "off".
    app = d.start()
    assert app.registered_rows(BACKEND) == [one.row() for one in (
        HOME, plain._replace(key="off"), wep, off._replace(key="off"), wpa._replace(key="pass"))]


def test_full(device):
    networks = [Network(f"net {number}") for number in range(63)]
    d, app = start(device, *networks)
    dialog = open_list(app)
    form = open_form(app, dialog, ADD)
    form.type("add_essid", "the 64th")
    close(form, "gtk-ok")
    assert len(names(app)) == 64
    form = open_form(app, dialog, ADD)
    form.type("add_alias", "one")
    form.type("add_essid", "too many")
    warned(app, form, "gtk-ok", "The list is full: it holds 64 networks.")
    assert (form.text("add_alias"), form.text("add_essid")) == ("one", "too many")
    close(form, "gtk-cancel")
    assert len(names(app)) == len(app.registered_rows(BACKEND)) == 64
    assert dialog.selected(FRONT) == [63]
    dialog.press("preferred_button_delete")
    close(app.dialog("Delete Network"), "gtk-ok")
    form = open_form(app, dialog, ADD)
    form.type("add_essid", "in its place")
    close(form, "gtk-ok")
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(*networks, Network("in its place")))


def test_long_texts_are_cut_where_they_are_typed(device):
    d, app = start(device)
    dialog = open_list(app)
    form = open_form(app, dialog, ADD)
    form.type("add_essid", "x" * 120)
    app.key("End")
    d.display.type("y" * 15)
    wait_until(lambda: len(form.text("add_essid")) == 127, "the entry to be full")
    close(form, "gtk-ok")
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(Network("x" * 120 + "y" * 7)))


def test_properties(device):
    # Rows as other writers of the file may leave them: WPA with "restricted", a mode of its own, a
    # key index beyond the four, bytes that are no UTF-8.
    office = Network("office", "Büro", wpa=1, index=2, enc="restricted", key="pass")
    access = Network("caf\udce9", mode="Master", index=9)
    d, app = start(device, office, CAFE, access, DESK)
    dialog = open_list(app)
    k = PROPERTIES_KEYS
    lines = printed(app, "user_wifi_count=")

    # WPA counts as "open", and is stored so.
    select(dialog, 0)
    form = open_form(app, dialog, PROPERTIES)
    assert app.stdout().endswith("KEY_INDEX = 2 \n")
    assert chosen(form, k) == ("wpa managed open", [False, False, True, False])
    assert [form.text(k[name]) for name in ("alias", "essid", "key")] == ["Büro", "office", "pass"]
    assert form.find(k["index"])["active"] == 2
    close(form, "gtk-ok")
    office = office._replace(enc="open")
    assert app.registered_rows(BACKEND)[0] == office.row()

    # WEP with "restricted"; the fourth key.
    select(dialog, 1)
    form = open_form(app, dialog, PROPERTIES)
    assert app.stdout().endswith("KEY_INDEX = 3 \n")
    assert chosen(form, k) == ("wep managed restricted", [True] * 4)
    assert form.find(k["index"])["items"][form.find(k["index"])["active"]] == "4"
    form.type(k["alias"], "Café")
    form.press(k["open"])
    form.choose(k["index"], "1")
    close(form, "gtk-ok")
    cafe = CAFE._replace(alias="Café", index=0, enc="open")
    assert app.registered_rows(BACKEND)[1] == cafe.row()
    assert names(app)[1] == "Café"

    # The stored mode is none of the two; what is not touched keeps its bytes.
    select(dialog, 2)
    form = open_form(app, dialog, PROPERTIES)
    assert chosen(form, k) == ("wep managed off", [True, True, False, False])
    assert form.text(k["essid"]) == "caf\ufffd"
    assert form.find(k["index"])["active"] == 0
    close(form, "gtk-ok")
    access = access._replace(mode="Managed", index=0)
    assert app.registered_rows(BACKEND)[2] == access.row()
    assert names(app)[2] == "caf\ufffd"

    # An empty alias shows the name.
    select(dialog, 3)
    form = open_form(app, dialog, PROPERTIES)
    assert chosen(form, k) == ("wep adhoc off", [True, True, False, False])
    form.type(k["alias"], "")
    close(form, "gtk-ok")
    desk = DESK._replace(alias="")
    assert app.registered_rows(BACKEND)[3] == desk.row()
    assert names(app) == ["Büro", "Café", "caf\ufffd", "desk"]

    # Nothing was selected or counted anew.
    assert dialog.selected(FRONT) == [3]
    assert app.stderr().count("select row") == 4
    assert printed(app, "user_wifi_count=") == lines
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(office, cafe, access, desk))


def test_properties_refused(device):
    """What comes before a refused entry is in the row already, also when the form is cancelled."""
    d, app = start(device, HOME, CAFE)
    dialog = open_list(app)
    k = PROPERTIES_KEYS
    select(dialog, 1)
    form = open_form(app, dialog, PROPERTIES)
    form.type(k["alias"], "renamed")
    form.type(k["essid"], "")
    warned(app, form, "gtk-ok", NO_ESSID)
    assert form.text(k["alias"]) == "renamed"
    assert app.registered_rows(BACKEND)[1] == CAFE._replace(alias="renamed").row()
    assert names(app) == ["Home", "cafe"]

    form.type(k["essid"], "other")
    form.press(k["adhoc"])
    form.press(k["open"])
    form.choose(k["index"], "2")
    form.type(k["key"], "")
    warned(app, form, "gtk-ok", NO_KEY)
    left = Network("other", "renamed", mode="Ad-Hoc", index=1, enc="open", key="abcde")
    assert app.registered_rows(BACKEND)[1] == left.row()
    assert names(app) == ["Home", "renamed"]
    assert [form.text(k[name]) for name in ("alias", "essid", "key")] == ["renamed", "other", ""]
    close(form, "gtk-cancel")
    assert app.registered_rows(BACKEND)[1] == left.row()
    assert d.file(FILE) == file_of(HOME, CAFE)
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(HOME, left))
    # Another network's form does not show what the last one held.
    dialog = open_list(app)
    select(dialog, 0)
    form = open_form(app, dialog, PROPERTIES)
    assert [form.text(k[name]) for name in ("alias", "essid", "key")] == \
        ["Home", "kitchen", "passphrase"]
    assert [title for title, _ in app.dialogs()].count(LIST) == 1
    close(form, "gtk-cancel")
    close(dialog, "gtk-cancel")
    assert app.quit() == 0
