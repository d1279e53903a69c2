# SPDX-License-Identifier: MIT
"""The window by keys alone."""

from connecting import CONNECTING, idle, pass_time, settle
from harness import wait_until
from preferred import DELETE, FRONT, LIST, PROPERTIES, Network, names, open_list, start
from test_selection import presses, selections

NETWORKS = ("one", "two", "three", "four")


def focused(pane, name):
    wait_until(lambda: pane.find(name)["focus"], lambda: f"the focus on {name}")


def chosen(app, row):
    """The highlighted row is the one that Connect joins."""
    wait_until(lambda: app.selected("view-press") == [row],
               lambda: f"row {row}; selected is {app.selected('view-press')}")
    settle(app)
    assert selections(app)[-1][1] == row


def test_what_is_highlighted_is_what_connect_joins(device):
    d, app = idle(device, *NETWORKS)
    focused(app, "view-press")  # at first
    assert app.selected("view-press") == []
    app.click_row("view-press", 0)
    chosen(app, 0)
    app.key("Down")
    chosen(app, 1)
    assert presses(app) == [(4, -1, 1), (4, 0, 1)]
    for key, row in (("End", 3), ("Home", 0), ("Page_Down", 3), ("Page_Up", 0), ("Down", 1)):
        app.key(key)
        chosen(app, row)
    app.display.type("thr")  # a row is found by its name
    chosen(app, 2)
    app.key("Escape")
    assert app.label("button-connect") == "gtk-connect"
    app.press("button-connect")
    app.wait_title(CONNECTING)
    pass_time(d, app, 100)
    assert d.wait_command("iwset").argv[3] == "three"
    # The rows are built anew, and the row is highlighted as before.
    wait_until(lambda: app.selected("view-press") == [2], "the row again")


def test_nothing_is_chosen_without_a_device(device):
    d, app = idle(device, *NETWORKS)
    app.click_row("view-press", 0)
    chosen(app, 0)
    d.set_interfaces()
    app.press("button-connect")  # looks for the device, and finds none
    app.wait_printed("Choice to Connect index[0],count[4]")
    app.key("shift+Tab")
    focused(app, "view-press")
    app.key("End")
    app.key("Tab")  # once this is done the other was
    focused(app, "button-connect")
    assert selections(app)[-1][1] == 0 and app.selected("view-press") == [0]
    assert len(selections(app)) == 1


def test_keys_do_what_the_buttons_do(device):
    d, app = idle(device, *NETWORKS)
    for count, key in enumerate(("Return", "KP_Enter", "space"), 1):
        focused(app, "view-press")
        app.key("Home")
        app.key("Down")
        chosen(app, 1)
        app.key(key)
        app.wait_title(CONNECTING)
        app.key(key)  # a connect runs: the button is grey, and so is the key
        pass_time(d, app, 100)
        assert d.wait_command("iwset", count).argv[3] == "two"
        for _ in range(21):
            pass_time(d, app, 2000)
        wait_until(lambda: app.sensitive("button-connect"), "the controls")
        assert len(d.commands("iwset")) == count
        assert app.selected("view-press") == [1]

    scans = len(d.commands("iwlist"))
    app.key("F5")
    app.wait_title("Searching...")
    pass_time(d, app, 100)
    d.wait_command("iwlist", scans + 1)
    wait_until(lambda: app.sensitive("view-press"), "the list")
    focused(app, "view-press")  # back where it was
    assert app.selected("view-press") == []


def test_the_focus_comes_back_to_the_button(device):
    d, app = idle(device, *NETWORKS)
    app.press("button-refresh")
    app.wait_title("Searching...")
    pass_time(d, app, 100)
    d.wait_command("iwlist", 2)
    wait_until(lambda: app.sensitive("view-press"), "the list")
    focused(app, "button-refresh")


def test_the_preferred_list(device):
    _, app = start(device, *(Network(name) for name in NETWORKS))
    dialog = open_list(app)
    wait_until(lambda: dialog.tree()["active"], "the dialog")
    while not dialog.find(FRONT)["focus"]:
        before = [one["id"] for one in dialog.tree().walk() if one["focus"]]
        app.key("Tab")
        wait_until(lambda: [one["id"] for one in dialog.tree().walk() if one["focus"]] != before,
                   "the focus to move")

    def selected(row):
        wait_until(lambda: dialog.selected(FRONT) == [row],
                   lambda: f"row {row}; selected is {dialog.selected(FRONT)}")

    for key, row in (("Up", 0), ("Down", 1), ("Up", 0), ("End", 3), ("Home", 0), ("Down", 1)):
        app.key(key)
        selected(row)
    app.key("alt+Down")
    wait_until(lambda: names(app) == ["one", "three", "two", "four"], "the row to move")
    app.key("alt+Up")
    wait_until(lambda: names(app) == list(NETWORKS), "the row to move back")
    app.key("Return")
    form = app.dialog(PROPERTIES)
    assert form.text("properties_essid") == "two"
    form.type("properties_essid", "zwei")
    app.key("Return")  # OK, in an entry
    form.wait_gone()
    wait_until(lambda: names(app) == ["one", "zwei", "three", "four"], "the new name")
    app.key("Delete")
    question = app.dialog(DELETE)
    app.key("alt+o")
    question.wait_gone()
    wait_until(lambda: names(app) == ["one", "three", "four"], "the row to go")
    app.key("Escape")
    dialog.wait_gone()
    assert LIST not in [title for title, _ in app.dialogs()]


def test_a_typed_key_can_be_shown(device):
    stored = Network("stored", wpa=1, enc="open", key="secret")
    _, app = start(device, stored)
    dialog = open_list(app)
    app.key("Up")
    wait_until(lambda: dialog.selected(FRONT) == [0], "the row")
    app.key("Return")
    form = app.dialog(PROPERTIES)

    def turn(shown):
        app.key("shift+F10")
        wait_until(lambda: [one for one in app.windows()
                            if one["mapped"] and one.all("GtkMenu")], "the menu")
        for key in ("Home", "Return"):
            app.display.key(key)
        wait_until(lambda: form.find("properties_key")["visibility"] == shown, f"shown: {shown}")

    form.click("properties_key")
    focused(form, "properties_key")
    x, y, width, height = form.find("properties_key")["rect"]
    app.display.click(x + width - 12, y + height // 2)
    app.key("End")
    form.type("properties_key", "x", replace=False)
    wait_until(lambda: form.text("properties_key") == "secretx", "the letter")
    assert not form.find("properties_key")["visibility"]  # some of it is the stored key

    form.type("properties_key", "typed anew")
    assert not form.find("properties_key")["visibility"]
    app.display.click(x + width - 12, y + height // 2)
    wait_until(lambda: form.find("properties_key")["visibility"], "the key to be seen")
    turn(False)
    turn(True)
    app.key("Escape")
    form.wait_gone()
