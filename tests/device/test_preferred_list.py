# SPDX-License-Identifier: MIT
"""The list of preferred networks: its dialog, the order, deletion, OK and Cancel."""

import os
import subprocess

import assistive
from harness import wait_until

from preferred import (ADD, BACKEND, DELETE, FILE, FRONT, LIST, PROPERTIES, Network, change, close,
                       file_of, names, open_list, printed, select, start)

EXPAND, FILL = 1, 4  # GtkAttachOptions

HOME = Network("kitchen", "Home", wpa=1, enc="open", key="passphrase")
CAFE = Network("cafe", index=3, enc="restricted", key="abcde")
DESK = Network("desk", "Office", mode="Ad-Hoc")


def props(dialog, widget):
    return dialog.props(widget)["properties"]


def place(dialog, widget):
    """Edges of a widget in its table: left, right, top, bottom."""
    packing = dialog.props(widget)["packing"]
    return [packing[edge + "-attach"] for edge in ("left", "right", "top", "bottom")]


def test_widgets(device):
    d, app = start(device, HOME, CAFE, DESK)
    dialog = open_list(app)
    tree = dialog.tree()
    own = props(dialog, tree)
    assert (own["transient-for"], own["destroy-with-parent"], own["modal"]) == (None, True, True)
    assert (own["type-hint"], own["default-width"], own["default-height"]) == ("dialog", 480, 320)

    ok, cancel = tree.find(label="gtk-ok"), tree.find(label="gtk-cancel")
    assert dialog.props(ok)["packing"]["position"] < dialog.props(cancel)["packing"]["position"]
    assert props(dialog, cancel)["can-default"]
    assert props(dialog, cancel)["has-default"]

    outer, inner = tree.all(type="GtkFrame")
    frame = props(dialog, outer)
    assert (frame["label"], frame["label-xalign"], frame["shadow-type"], frame["border-width"]) == \
        (LIST, 0, "etched-out", 5)
    assert abs(frame["label-yalign"] - 0.6) < 0.01
    assert dialog.props(outer)["packing"]["expand"]
    frame = props(dialog, inner)
    assert (frame["label"], frame["shadow-type"], frame["border-width"]) == (None, "etched-out", 5)
    assert place(dialog, inner)[2:] == [1, 2]
    for option in ("x-options", "y-options"):
        assert dialog.props(inner)["packing"][option] == EXPAND | FILL

    table, inner_table = tree.all(type="GtkTable")
    assert [props(dialog, table)[name] for name in
            ("n-rows", "n-columns", "border-width")] == [4, 2, 5]
    assert [props(dialog, inner_table)[name] for name in ("n-rows", "n-columns")] == [2, 2]
    text = tree.find(text="Automatic connect to one of the network \n"
                          "following the order in the list below")
    assert place(dialog, text) == [0, 2, 0, 1]
    assert (props(dialog, text)["xalign"], props(dialog, text)["yalign"]) == (0, 0.5)

    window = tree.find(type="GtkScrolledWindow")
    assert place(dialog, window) == [0, 1, 0, 2]
    own = props(dialog, window)
    assert (own["hscrollbar-policy"], own["vscrollbar-policy"], own["border-width"]) == \
        ("automatic", "automatic", 5)
    assert tree.find(FRONT).parent["type"] == "GtkViewport"
    up, down = tree.find(label="gtk-go-up"), tree.find(label="gtk-go-down")
    assert up.parent is down.parent and up.parent["type"] == "GtkVButtonBox"
    assert up["rect"][1] < down["rect"][1] and up["rect"][0] > window["rect"][0]

    box = tree.find("preferred_button_add").parent
    own = props(dialog, box)
    assert (box["type"], own["homogeneous"], own["spacing"]) == ("GtkHBox", True, 5)
    assert place(dialog, box)[2:] == [2, 3]
    buttons = [tree.find(f"preferred_button_{what}") for what in ("add", "delete", "properties")]
    assert [one["label"] for one in buttons] == ["gtk-add", "gtk-delete", "gtk-properties"]
    assert [one["rect"][0] for one in buttons] == sorted(one["rect"][0] for one in buttons)
    assert len({tuple(one["rect"][2:]) for one in buttons}) == 1
    for key in ["preferred_button_add", "preferred_button_delete", "preferred_button_properties",
                FRONT, BACKEND]:
        assert app.registry(key)["name"] == key

    assert dialog.rows(FRONT) == [["Home"], ["cafe"], ["Office"]]
    assert dialog.selected(FRONT) == []
    assert app.registered_rows(BACKEND) == [HOME.row(), CAFE.row(), DESK.row()]
    assert printed(app, "build_user_cell_clist, ftext[LIST_KEY_INDEX] = 3\n") == 2

    # Nothing is selected, so three of the buttons have nothing to act on.
    for button in ("gtk-go-up", "gtk-go-down", "preferred_button_delete",
                   "preferred_button_properties"):
        dialog.press(button)
    select(dialog, 0)
    assert names(app) == ["Home", "cafe", "Office"]
    assert [title for title, _ in app.dialogs()] == [LIST]
    assert app.stderr().count("select row") == 1
    # The window's close button is a Cancel.
    d.display.close_window(LIST)
    dialog.wait_gone()
    assert "OK,we will connect" not in app.stderr()
    assert d.file(FILE) == file_of(HOME, CAFE, DESK)
    assert app.registered_rows(FRONT) == [["Home"], ["cafe"], ["Office"]]
    assert app.quit() == 0


def test_presses_that_a_window_manager_holds_back_keep_their_places(device):
    d, app = start(device, HOME, CAFE)
    dialog = open_list(app)
    places = [dialog.find(f"preferred_button_{what}")["rect"] for what in ("delete", "properties")]
    with d.display.window_manager_asleep() as wake_after:
        wake_after(0.5)
        for x, y, *_ in places + [dialog.cell(FRONT, 0, 0)]:
            d.display.click(x + 10, y + 5)
    wait_until(lambda: dialog.selected(FRONT) == [0], "the first row to be selected")
    assert app.stderr().count("select row") == 1
    close(dialog, "gtk-cancel")


def test_order(device):
    d, app = start(device, HOME, CAFE, DESK)
    dialog = open_list(app)
    select(dialog, 1)
    # A second click takes the highlight away for a moment only: the buttons act on the row still.
    # It comes long after the first, so that the two are no double click.
    x, y, width, height = dialog.cell(FRONT, 1)
    d.display.click(x + 3 * width // 4, y + height // 2)
    change(dialog, "gtk-go-down", ["Home", "Office", "cafe"])
    assert dialog.selected(FRONT) == [2]
    dialog.press("gtk-go-down")  # at the end already
    change(dialog, "gtk-go-up", ["Home", "cafe", "Office"])
    assert dialog.selected(FRONT) == [1]
    change(dialog, "gtk-go-up", ["cafe", "Home", "Office"])
    dialog.press("gtk-go-up")  # at the top already
    # What is highlighted is what is edited.
    assert dialog.selected(FRONT) == [0]
    dialog.press("preferred_button_properties")
    properties = app.dialog(PROPERTIES)
    assert properties.text("properties_essid") == "cafe"
    close(properties, "gtk-cancel")
    assert names(app) == ["cafe", "Home", "Office"]
    assert app.registered_rows(BACKEND) == [CAFE.row(), HOME.row(), DESK.row()]
    # Moves print nothing, and neither did the second click.
    assert app.stderr().count("WIRELESS-LAN-DEBUG: select row [1],column [0]\n") == 1
    assert app.stderr().count("select row") == 1
    assert d.file(FILE) == file_of(HOME, CAFE, DESK)
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(CAFE, HOME, DESK))
    assert printed(app, "WIRELESS-LAN-DEBUG: OK,we will connect network by this order.\n") == 1

    # A new order that is cancelled is gone at once, not only at the next opening.
    dialog = open_list(app)
    assert (names(app), dialog.selected(FRONT)) == (["cafe", "Home", "Office"], [])
    select(dialog, 2)
    change(dialog, "gtk-go-up", ["cafe", "Office", "Home"])
    close(dialog, "gtk-cancel")
    assert app.registered_rows(BACKEND) == [CAFE.row(), HOME.row(), DESK.row()]
    assert names(app) == ["cafe", "Home", "Office"]

    # The keyboard chooses too; and an OK without a change writes the same content.
    dialog = open_list(app)
    assert (names(app), dialog.selected(FRONT)) == (["cafe", "Home", "Office"], [])
    before = os.stat(d.outer(FILE)).st_ino
    wait_until(lambda: dialog.find(FRONT)["focus"] and dialog.tree()["active"], "the focus")
    app.key("Down")
    app.key("space")
    wait_until(lambda: dialog.selected(FRONT) == [1], "the second row")
    close(dialog, "gtk-ok")
    wait_until(lambda: os.stat(d.outer(FILE)).st_ino != before, "the file to be written")
    assert d.file(FILE) == file_of(CAFE, HOME, DESK)
    assert app.quit() == 0


NAMED = Network("net", "<b>&amp;</b> %s _x")


def ask_delete(dialog, row):
    """Selects a row and presses Delete; the question."""
    select(dialog, row)
    dialog.press("preferred_button_delete")
    return dialog.app.dialog(DELETE)


def test_question_before_a_delete(device):
    d, app = start(device, HOME, CAFE, NAMED, DESK)
    dialog = open_list(app)
    question = ask_delete(dialog, 2)
    tree = question.tree()
    own = props(question, tree)
    assert own["transient-for"]["id"] == dialog.tree()["id"]
    assert (own["destroy-with-parent"], own["type-hint"], own["has-separator"]) == \
        (True, "dialog", False)
    assert (own["default-width"], own["default-height"]) == (120, 120)
    state = subprocess.run(["xprop", "-display", d.display.name, "-name", DELETE, "_NET_WM_STATE"],
                           stdout=subprocess.PIPE, check=True, text=True).stdout
    assert "_NET_WM_STATE_ABOVE" in state
    ok, cancel = tree.find(label="gtk-ok"), tree.find(label="gtk-cancel")
    assert question.props(ok)["packing"]["position"] < question.props(cancel)["packing"]["position"]
    assert props(question, cancel)["has-default"]
    table = tree.find(type="GtkTable")
    assert [props(question, table)[name] for name in ("n-rows", "n-columns", "border-width")] == \
        [4, 2, 5]
    image = next(one for one in table["children"] if one["type"] == "GtkImage")
    assert place(question, image) == [0, 1, 1, 2]
    assert props(question, image)["stock"] == "gtk-dialog-warning"
    # The name is there as it was typed.
    label = tree.find(text="Do you want to detele the network\n<b>&amp;</b> %s _x?")
    assert place(question, label) == [1, 2, 1, 2]
    own = props(question, label)
    assert (own["justify"], own["wrap"], own["use-markup"], own["xalign"], own["yalign"]) == \
        ("center", True, True, 0, 0.5)



def test_cancel_and_the_close_button_delete_nothing(device):
    d, app = start(device, HOME, CAFE, NAMED, DESK)
    dialog = open_list(app)
    close(ask_delete(dialog, 2), "gtk-cancel")
    dialog.press("preferred_button_delete")
    question = app.dialog(DELETE)
    d.display.close_window(DELETE)
    question.wait_gone()
    assert names(app) == ["Home", "cafe", NAMED.alias, "Office"]
    assert dialog.selected(FRONT) == [2]


def test_delete_selects_a_neighbour(device):
    d, app = start(device, HOME, CAFE, NAMED, DESK)
    dialog = open_list(app)
    select(dialog, 2)

    def delete(wanted, selected):
        dialog.press("preferred_button_delete")
        close(app.dialog(DELETE), "gtk-ok")
        assert names(app) == wanted
        assert len(app.registered_rows(BACKEND)) == len(wanted)
        assert dialog.selected(FRONT) == selected

    # A middle row: the next one takes its place. The last: the one before. The first: the new one.
    delete(["Home", "cafe", "Office"], [2])
    assert app.stderr().count("select row [2],column [0]\n") == 2
    delete(["Home", "cafe"], [1])
    assert app.stderr().count("select row [1],column [0]\n") == 1
    select(dialog, 0)
    delete(["cafe"], [0])
    # One network: nowhere to move it.
    dialog.press("gtk-go-up")
    dialog.press("gtk-go-down")
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(CAFE))
    assert app.quit() == 0


def test_an_emptied_list(device):
    """Nothing is selected in it; records beyond the count are used again by the next save."""
    d, app = start(device, CAFE)
    dialog = open_list(app)
    close(ask_delete(dialog, 0), "gtk-ok")
    assert (names(app), app.registered_rows(BACKEND), dialog.selected(FRONT)) == ([], [], [])
    dialog.press("preferred_button_delete")
    dialog.press("preferred_button_properties")
    dialog.press("preferred_button_add")
    form = app.dialog(ADD)
    assert [title for title, _ in app.dialogs()].count(DELETE) == 0
    close(form, "gtk-cancel")
    close(dialog, "gtk-ok")
    d.wait_file(FILE, b"")
    dialog = open_list(app)
    for name in ("one", "two"):
        dialog.press("preferred_button_add")
        form = app.dialog(ADD)
        form.type("add_essid", name)
        close(form, "gtk-ok")
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(Network("one"), Network("two")))
    assert app.quit() == 0


def test_long_name_in_the_question(device):
    """A name of one long word breaks anywhere, so that the buttons stay on the screen."""
    name = "w" * 120
    d, app = start(device, Network(name))
    dialog = open_list(app)
    select(dialog, 0)
    dialog.press("preferred_button_delete")
    question = app.dialog(DELETE)
    assert question.find(text=f"Do you want to detele the network\n{name}?")
    left, _, width, _ = question.tree()["rect"]
    assert left >= 0 and left + width <= d.display.width
    close(question, "gtk-ok")
    assert names(app) == []


def test_cancelled_edits_reach_nobody(device):
    """All is deleted and cancelled; then a network joins the list from the main window."""
    d, app = start(device, HOME, CAFE)
    dialog = open_list(app)
    for _ in range(2):
        select(dialog, 0)
        dialog.press("preferred_button_delete")
        close(app.dialog(DELETE), "gtk-ok")
    assert names(app) == []
    close(dialog, "gtk-cancel")
    assert names(app) == ["Home", "cafe"]
    assert d.file(FILE) == file_of(HOME, CAFE)

    app.click_row("view-press", 1)
    app.press("button-connect")
    encrypted = app.dialog("Encrypted Network")
    encrypted.type("connect_key", "secret77")
    encrypted.press("gtk-ok")
    close(app.dialog(text="Do you want to add this configuration to the preferred network?"),
          "gtk-yes")
    d.wait_file(FILE, file_of(HOME, CAFE, Network("Haus 12", enc="open", key="secret77")))
    assert app.registered_rows(FRONT) == [["Home"], ["cafe"], ["Haus 12"]]


def test_long_list_stays_in_sight(device):
    # One name is wider than the dialog, so that the list has its full width from the beginning.
    networks = [Network(f"net {number}", "m" * 100 if number == 7 else "") for number in range(40)]
    _, app = start(device, *networks)
    dialog = open_list(app)

    def in_sight(row):
        _, top, _, height = dialog.find(type="GtkViewport")["rect"]
        _, y, _, cell_height = dialog.cell(FRONT, row)
        return top <= y and y + cell_height <= top + height

    dialog.press("preferred_button_add")
    form = app.dialog(ADD)
    form.type("add_essid", "last")
    close(form, "gtk-ok")
    assert dialog.selected(FRONT) == [40]
    wait_until(lambda: in_sight(40), "the new row to come in sight")
    for row in range(39, 29, -1):
        dialog.press("gtk-go-up")
        wait_until(lambda: dialog.selected(FRONT) == [row], f"row {row}")
        wait_until(lambda: in_sight(row), f"row {row} to come in sight")
    # The keyboard's row as well.
    dialog.click_row(FRONT, 30)
    wait_until(lambda: dialog.find(FRONT)["focus"], "the focus")
    for _ in range(25):
        app.key("Up")
    wait_until(lambda: in_sight(5), "the sixth row to come in sight")
    app.key("space")
    wait_until(lambda: dialog.selected(FRONT) == [5], "the sixth row")
    close(dialog, "gtk-cancel")


def test_resizing_leaves_the_view_where_it_is(device):
    d, app = start(device, *[Network(f"net {number}") for number in range(40)])
    dialog = open_list(app)

    def edges():
        """How far the list reaches over the upper and the lower edge of the view, whose own shadow
        has two pixels."""
        front = dialog.find(FRONT)
        _, top, _, height = front.parent["rect"]
        return (top + 2 - front["rect"][1],
                front["rect"][1] + front["rect"][3] - (top + height - 2))

    select(dialog, 39)
    wait_until(lambda: edges()[1] == 0, lambda: f"the last row as a whole; {edges()}")
    select(dialog, 0)
    wait_until(lambda: edges()[0] == 0, lambda: f"the first row; {edges()}")
    left, top, width, height = dialog.find(FRONT).parent["rect"]
    d.display.click(left + width // 2, top + height // 2, 5, count=30)
    wait_until(lambda: edges()[1] == 0, lambda: f"the end; {edges()}")
    for change in (-40, 30):
        before = dialog.tree()["rect"]
        d.display.resize_window(LIST, height=before[3] + change)
        wait_until(lambda: dialog.tree()["rect"][3] != before[3], "the new height")
        assert edges()[0] > height, edges()


def test_a_row_that_has_gone_meanwhile(device):
    """Two questions for one row, the second by assistive technology: one network is deleted."""
    d = device("street", files={**assistive.settings()["files"], FILE: file_of(HOME, CAFE)})
    app = d.start(environment=assistive.settings()["environment"])
    app.wait_listed()
    dialog = open_list(app)
    select(dialog, 1)
    dialog.press("preferred_button_delete")
    app.dialog(DELETE)
    assistive.press(d, "preferred_button_delete")
    wait_until(lambda: len([one for one in app.dialogs() if one[0] == DELETE]) == 2, "two")
    for left in (1, 0):
        wait_until(lambda: any(one["active"] for one in app.windows() if one["title"] == DELETE),
                   "the question in front")
        app.key("alt+o")
        wait_until(lambda: len([one for one in app.dialogs() if one[0] == DELETE]) == left,
                   "a question to go")
    assert names(app) == ["Home"]
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(HOME))
