# SPDX-License-Identifier: MIT
"""The window's pictures are those that the toolkit finds by searching its icon themes, whether one
has been chosen or not; where none has been the directories are not searched."""

import os
import re
import struct
import subprocess

import pytest
from Xlib import X
from Xlib import display as xdisplay

from harness import wait_until

# Lets the program search as it would by itself.
SEARCH = """
void gtk_icon_theme_set_search_path(void *theme, const char **path, int count)
{
    (void)theme;
    (void)path;
    (void)count;
}
"""
SYSTEM = "/usr/local/share:/usr/share"
LONE = "/device/state/data"  # with the fallback theme alone
THEME = "Tango"
LOOKS = 12  # without a change


@pytest.fixture(scope="module", name="street")
def fixture_street(shared_device):
    d = shared_device("street", rate=50)
    d.display.move(1023, 767)  # over the list it may bring a tooltip
    d.sh(f"mkdir -p {LONE}/icons && cp -R /usr/share/icons/hicolor {LONE}/icons")
    for name in (THEME, "none-of-that-name"):
        d.put(f"{name}.rc", f'gtk-icon-theme-name = "{name}"\n')
    return d


def picture(d, app):
    """What the window shows, as text that can be compared: without the frame, which the window
    manager draws when it comes to it."""
    path = d.display.screenshot(f"{d.state}/screen.png")
    x, y, width, height = app.tree()["rect"]
    return subprocess.run(["identify", "-quiet", "-format", "%#",
                           f"{path}[{width}x{height}+{x}+{y}]"], check=True,
                          stdout=subprocess.PIPE, text=True).stdout


def settled_picture(d, app, known=None):
    """The picture once the list is filled: `known`, or with none the first that stays."""
    app.wait_listed()
    wait_until(lambda: app.tree()["active"], "the window manager to show the window")
    if known is not None:
        wait_until(lambda: picture(d, app) == known, lambda: "the same picture")
        return known
    last, alike = [None], [0]

    # What comes by itself in its first half minute has come: the clock goes 50 times as fast.
    def stays():
        before, last[0] = last[0], picture(d, app)
        alike[0] = alike[0] + 1 if before == last[0] else 0
        return alike[0] >= LOOKS
    wait_until(stays, "the picture to stay")
    return last[0]


def environment(data, rc):
    # The toolkit forgets to free the file name of an icon that a chosen theme's search ends with.
    return {"ASAN_OPTIONS": os.environ.get("ASAN_OPTIONS", "") + ":detect_leaks=0",
            "XDG_DATA_DIRS": data, "XDG_DATA_HOME": "/nowhere",
            "GTK2_RC_FILES": "/dev/null" if rc is None else f"/device/state/{rc}.rc"}


@pytest.mark.parametrize("data, rc", [
    pytest.param("/nowhere", None, id="no theme installed"),
    pytest.param(LONE, None, id="the fallback theme alone"),
    pytest.param(SYSTEM, None, id="none chosen"),
    pytest.param(SYSTEM, THEME, id="a full theme chosen"),
    pytest.param(SYSTEM, "none-of-that-name", id="one chosen that is missing")])
def test_the_same_pixels(street, data, rc):
    settings = environment(data, rc)
    app = street.start(environment={**settings, **street.preload("search", SEARCH)})
    expected = settled_picture(street, app)
    assert app.quit() == 0
    app = street.start(environment=settings)
    settled_picture(street, app, expected)
    assert app.quit() == 0


def directories_read(street, settings):
    """Files of icon themes that a start opens."""
    app = street.start(environment={**settings, **street.preload("opened", OPENED)})
    app.wait_listed()
    app.quit()
    return re.findall(r"^.*icons.*$", street.state_file("opened").decode(), re.M)


OPENED = r"""
#define _GNU_SOURCE
#include <dlfcn.h>
#include <dirent.h>
#include <stdio.h>

DIR *opendir(const char *name)
{
    static DIR *(*next)(const char *);
    FILE *note = fopen("/device/state/opened", "ae");

    if (next == NULL)
        next = (DIR *(*)(const char *))dlsym(RTLD_NEXT, "opendir");
    if (note != NULL) {
        fprintf(note, "%s\n", name);
        fclose(note);
    }
    return next(name);
}
"""


def test_nothing_is_searched_where_no_theme_is_chosen(street):
    # So that the theme's directories have to be read one by one.
    street.sh(f"rm -f {LONE}/icons/hicolor/icon-theme.cache")
    assert directories_read(street, environment(LONE, None)) == []
    assert directories_read(street, environment(LONE, "none-of-that-name")) != []


class Manager:
    """A settings manager with one setting
    (https://specifications.freedesktop.org/xsettings-spec)."""

    def __init__(self, name):
        self.display = xdisplay.Display(name)
        self.screen = self.display.screen()
        self.window = self.screen.root.create_window(-1, -1, 1, 1, 0, X.CopyFromParent)
        self.serial = 0

    def set(self, theme):
        self.serial += 1
        key, value = b"Net/IconThemeName", theme.encode()
        padded = [text + bytes(-len(text) % 4) for text in (key, value)]
        content = (struct.pack("<BxxxII", 0, self.serial, 1) +
                   struct.pack("<BxH", 1, len(key)) + padded[0] +
                   struct.pack("<II", self.serial, len(value)) + padded[1])
        settings = self.display.intern_atom("_XSETTINGS_SETTINGS")
        self.window.change_property(settings, settings, 8, content)
        self.display.sync()

    def begin(self):
        selection = self.display.intern_atom(f"_XSETTINGS_S{self.display.get_default_screen()}")
        self.window.set_selection_owner(selection, X.CurrentTime)
        self.display.sync()

    def close(self):
        self.display.close()


def test_a_theme_chosen_while_the_program_runs(street):
    app = street.start(environment=environment(SYSTEM, THEME))
    themed = settled_picture(street, app)
    assert app.quit() == 0
    app = street.start(environment=environment(SYSTEM, None))
    plain = settled_picture(street, app)
    assert plain != themed
    assert app.quit() == 0

    manager = Manager(street.display.name)
    try:
        manager.set("hicolor")
        manager.begin()
        app = street.start(environment=environment(SYSTEM, None))
        settled_picture(street, app, plain)
        manager.set(THEME)
        settled_picture(street, app, themed)
        manager.set("hicolor")
        settled_picture(street, app, plain)
        manager.set(THEME)
        settled_picture(street, app, themed)
        assert app.quit() == 0
    finally:
        manager.close()
