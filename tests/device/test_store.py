# SPDX-License-Identifier: MIT
"""The preferred networks between file, records and lists: what start-up reads, what a save leaves,
and what happens when it cannot be written."""

import os
import stat

import pytest

from harness import wait_until

from preferred import (ADD, BACKEND, FILE, FRONT, LIST, Network, close, file_of, names, open_list,
                       printed, select, start)

HOME = Network("kitchen", "Home", wpa=1, enc="open", key="passphrase")
CAFE = Network("cafe \udcff", index=3, enc="restricted", key="ab\udce9")
DESK = Network("desk", "Office", mode="Ad-Hoc")
FAILED = "The preferred networks could not be saved."
QUESTION = ("{} could not be read whole.\nReplace it? The old file is kept beside it, with "
            "\".old\" at the end of its name.")
UNREADABLE = f"Could not access file: {FILE}\n"


def mode_of(d, path=FILE):
    return stat.S_IMODE(os.stat(d.outer(path)).st_mode)


def add(app, dialog, essid):
    dialog.press("preferred_button_add")
    form = app.dialog(ADD)
    form.type("add_essid", essid)
    close(form, "gtk-ok")


def save_fails(app, dialog):
    """Presses OK, reads the message away, and sees that the program goes on."""
    dialog.press("gtk-ok")
    box = app.dialog(text=FAILED)
    close(box, "gtk-ok")
    dialog.wait_gone()
    close(open_list(app), "gtk-cancel")


def test_start_up_builds_both_lists(device):
    d, app = start(device, HOME, CAFE, DESK)
    # They are there without having been shown, and every network's key index was told.
    assert app.registry(FRONT)["name"] == FRONT
    assert app.registry(BACKEND)["name"] == BACKEND
    assert app.registered_rows(FRONT) == [["Home"], ["cafe \ufffd"], ["Office"]]
    assert app.registered_rows(BACKEND) == [HOME.row(), CAFE.row(), DESK.row()]
    lines = [line for line in app.stdout().splitlines() if line.startswith("build_user")]
    assert lines == [f"build_user_cell_clist, ftext[LIST_KEY_INDEX] = {n}" for n in (0, 3, 0)]
    # Bytes that are no UTF-8 come back out as they came in.
    close(open_list(app), "gtk-ok")
    assert d.file(FILE) == file_of(HOME, CAFE, DESK)
    assert mode_of(d) == 0o644
    # A cancelled dialog builds in silence; an opened one tells every row.
    count = printed(app, "build_user_cell_clist")
    dialog = open_list(app)
    assert printed(app, "build_user_cell_clist") == count + 3
    close(dialog, "gtk-cancel")
    assert printed(app, "build_user_cell_clist") == count + 3
    assert app.quit() == 0


def test_missing_file(device):
    d = device("street")
    app = d.start()
    app.wait_listed()
    assert UNREADABLE in app.stderr()
    assert (app.registered_rows(FRONT), app.registered_rows(BACKEND)) == ([], [])
    dialog = open_list(app)
    add(app, dialog, "first")
    close(dialog, "gtk-cancel")
    assert d.file(FILE) is None
    # An empty list is an empty file. It holds keys later, so it is its owner's alone.
    close(open_list(app), "gtk-ok")
    d.wait_file(FILE, b"")
    assert mode_of(d) == 0o600
    dialog = open_list(app)
    add(app, dialog, "first")
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(Network("first")))
    assert mode_of(d) == 0o600


@pytest.mark.parametrize("make", [
    f"mkdir {FILE}",
    f"ln -s {FILE} {FILE}",
])
def test_what_is_no_file(device, make):
    """A directory under the file's name, and a link that leads to itself."""
    d = device("street")
    d.sh(make)
    app = d.start()
    app.wait_listed()
    assert UNREADABLE in app.stderr()
    dialog = open_list(app)
    add(app, dialog, "first")
    dialog.press("gtk-ok")
    app.dialog(text=QUESTION.format(FILE)).press("gtk-yes")
    close(app.dialog(text=FAILED), "gtk-ok")
    dialog.wait_gone()
    assert os.path.islink(d.outer(FILE)) or os.path.isdir(d.outer(FILE))
    assert d.sh("ls /etc | grep -c '^.*wireless-user' || true").strip() == "1"
    # The program itself keeps the network until it ends.
    assert names(app) == ["first"]
    assert app.quit() == 0


def test_through_a_link(device):
    d = device("street", files={"/home/real.conf": file_of(HOME)})
    d.sh(f"mkdir -p /home; chmod 640 /home/real.conf; ln -s ../home/real.conf {FILE}")
    app = d.start()
    app.wait_listed()
    dialog = open_list(app)
    assert names(app) == ["Home"]
    add(app, dialog, "second")
    close(dialog, "gtk-ok")
    d.wait_file("/home/real.conf", file_of(HOME, Network("second")))
    assert os.path.islink(d.outer(FILE))
    assert mode_of(d, "/home/real.conf") == 0o640


def test_read_only(device):
    """A file that is mounted over: first writable, then not."""
    d = device("street", files={FILE: file_of(HOME, DESK)})
    d.sh(f"mount --bind {FILE} {FILE}")
    app = d.start()
    app.wait_listed()
    dialog = open_list(app)
    add(app, dialog, "third")
    close(dialog, "gtk-ok")
    d.wait_file(FILE, file_of(HOME, DESK, Network("third")))
    d.sh(f"mount -o remount,ro,bind {FILE}")
    dialog = open_list(app)
    select(dialog, 0)
    dialog.press("gtk-go-down")
    wait_until(lambda: names(app)[0] == "Office", "the row to move")
    save_fails(app, dialog)
    assert d.file(FILE) == file_of(HOME, DESK, Network("third"))
    d.sh(f"mount -o remount,rw,bind {FILE}")
    close(open_list(app), "gtk-ok")
    d.wait_file(FILE, file_of(DESK, HOME, Network("third")))
    assert app.quit() == 0


def test_full_disk(device):
    """A disk without room keeps the old file, and nothing beside it."""
    long = [Network(f"net {number}", "a" * 100, enc="open", key="k" * 120) for number in range(20)]
    d = device("street")
    d.sh(f"mkdir -p /small; mount -t tmpfs -o size=8k tmpfs /small; ln -s /small/conf {FILE}")
    d.write("/small/conf", file_of(*long))
    app = d.start()
    app.wait_listed()
    dialog = open_list(app)
    add(app, dialog, "one more")
    save_fails(app, dialog)
    assert d.file("/small/conf") == file_of(*long)
    assert d.sh("ls -A /small").split() == ["conf"]


def test_more_than_fit(device):
    networks = [Network(f"net {number}") for number in range(70)]
    d, app = start(device, *networks)
    assert names(app) == [f"net {number}" for number in range(64)]
    # The file holds more than the list, so it is kept.
    old, dialog = d.file(FILE), open_list(app)
    dialog.press("gtk-ok")
    app.dialog(text=QUESTION.format(FILE)).press("gtk-yes")
    dialog.wait_gone()
    assert d.file(FILE + ".old") == old
    d.wait_file(FILE, file_of(*networks[:64]))


def test_openings_leave_nothing(device):
    d, app = start(device, HOME, DESK)
    close(open_list(app), "gtk-cancel")
    descriptors = app.descriptors()
    windows = app.window_count()
    for number in range(10):
        close(open_list(app), "gtk-ok" if number % 2 else "gtk-cancel")
    assert app.descriptors() == descriptors
    assert app.window_count() == windows
    assert d.file(FILE) == file_of(HOME, DESK)
    assert [title for title, _ in app.dialogs()].count(LIST) == 0
