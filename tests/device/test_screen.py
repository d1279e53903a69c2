# SPDX-License-Identifier: MIT
"""The screens that boards have: small, turned, with large type, in other languages."""

import json
import os

import pytest

import screens
from harness import wait_until
from harness.device import TOP
from preferred import LIST
from screens import DPI, LANGUAGES, SIZES, faults, steady, visit

GEOMETRY = f"{TOP}/tests/device/geometry-1024x768.json"
SETTINGS = "WLAN Setting"
# Of every size, type and language one at least; `every-screen` takes them all.
SOME = (((800, 480), 96, "en"), ((640, 480), 120, "de"), ((480, 272), 96, "en"),
        ((480, 272), 160, "long"), ((320, 480), 96, "rtl"), ((1024, 768), 160, "long"),
        ((800, 480), 160, "de"), ((1024, 768), 96, "zh"), ((320, 480), 160, "long"))
ALL = tuple((size, dpi, language) for size in SIZES for dpi in DPI for language in LANGUAGES)


def name_of(value):
    return "x".join(map(str, value)) if isinstance(value, tuple) else str(value)


def screen(device, size, language="en", **more):
    return device("street", scan=screens.air(), size=name_of(size),
                  files=screens.files(language), **more)


@pytest.mark.parametrize("size, dpi, language",
                         ALL if "EVERY_SCREEN" in os.environ else SOME, ids=name_of)
def test_every_control_can_be_seen(device, size, dpi, language):
    found = visit(screen(device, size, language), dpi, language)
    assert not any(found.values()), "\n".join(f"{window}: {fault}" for window, all in found.items()
                                              for fault in all)
    assert len(found) == 11


def test_a_large_screen_shows_what_it_always_did(device):
    with open(GEOMETRY, encoding="utf-8") as file:
        wanted = json.load(file)
    app = screens.start(screen(device, (1024, 768)))
    for name, pane in screens.tour(app):
        shown = [[one["type"], one["name"] if one["name"] != one["type"] else "", *one["rect"]]
                 for one in steady(pane).walk() if one["mapped"]]
        assert shown == wanted.pop(name), name
    assert not wanted


def whole(pane, *names):
    """Whether these widgets are in sight with all that they are, in all windows around them."""
    for name in names:
        widget = pane.find(name)
        around = widget.parent
        while around is not None:
            if around["type"] == "GtkViewport" and \
                    not screens.inside(widget["rect"], around["rect"]):
                return False
            around = around.parent
    return True


def test_what_is_in_sight_at_once(device):
    d = screen(device, (1024, 768))
    d.display.turn(800, 480)
    app = screens.start(d)
    window = steady(app)
    assert not [bar for bar in window.walk() if bar["type"] in screens.SCROLL_BARS and
                bar["mapped"] and not bar.parent.all("view-press")], "nothing has to be scrolled"
    assert window["frame"] == [0, 0, 800, 480]
    buttons = ("button-refresh", "button-wifi-settings", "button-network-configure",
               "button-active-device")
    assert whole(app, "title-label", "button-connect", *buttons)
    app.kill()

    d.display.turn(640, 480)
    app = screens.start(d)
    assert steady(app)["frame"] == [0, 0, 640, 480]
    assert whole(app, "title-label", "button-connect")
    app.kill()

    d.display.turn(480, 272)
    app = screens.start(d)
    assert steady(app)["frame"] == [0, 0, 480, 272]
    assert whole(app, "title-label", "button-connect")
    app.refresh()
    for name, title in zip(buttons[1:], (SETTINGS, LIST)):  # scrolled to
        app.press(name)
        dialog = app.dialog(title)
        app.key("Escape")
        dialog.wait_gone()


@pytest.mark.parametrize("manager", (True, False), ids=("managed", "alone"))
def test_the_screen_turns_while_it_runs(device, manager):
    d = screen(device, (1024, 768), window_manager=manager)
    app = screens.start(d)
    as_opened = steady(app)["rect"]

    def fits(pane):
        area = d.display.work_area()
        wait_until(lambda: screens.inside(pane.tree()["frame"], area),
                   lambda: f"{pane.tree()['frame']} to fit into {area}")
        assert faults(steady(pane), area) == []

    def turn(width, height):
        d.display.turn(width, height)
        wait_until(lambda: d.display.work_area()[2:] == [width, height], "the work area")

    for width, height in ((480, 272), (320, 480), (800, 480)):
        turn(width, height)
        # A smaller one fits already.
        wait_until(lambda: app.tree()["frame"] == [0, 0, width, height],
                   lambda: app.tree()["frame"])
        fits(app)
        assert steady(app)["frame"] == [0, 0, width, height]
    app.press("button-wifi-settings")
    settings = app.dialog(SETTINGS)
    turn(480, 272)
    fits(settings)
    turn(1024, 768)
    wait_until(lambda: app.tree()["rect"][2:] == as_opened[2:], "the window's first size")
    fits(settings)
    d.display.wait_window_manager_done()
    settings.press("gtk-cancel")
    settings.wait_gone()
    if manager:
        turn(480, 272)
        d.display.panel(40)
        fits(app)
        assert steady(app)["frame"] == [0, 0, 480, 232]


def test_a_size_from_before_the_turn_is_not_kept(device):
    """A busy window manager says it when more has been asked for since."""
    d = screen(device, (1024, 768))
    app = screens.start(d)
    as_opened = steady(app)["rect"]
    for _ in range(5):
        d.display.turn(800, 480)
        wait_until(lambda: app.tree()["frame"] == [0, 0, 800, 480], lambda: app.tree()["frame"])
        with d.display.window_manager_asleep():
            for size in ((480, 272), (1024, 768)):
                d.display.turn(*size)
                for _ in range(2):
                    d.display.set_work_area(0, 0, *size)
                    app.tree()  # once it has answered it has asked for its size
        wait_until(lambda: app.tree()["rect"][2:] == as_opened[2:], lambda: app.tree()["rect"])


def test_a_smaller_screen_that_is_gone_again(device):
    """The window asks a busy window manager for a smaller size, then for the one that it has."""
    d = screen(device, (1024, 768))
    app = screens.start(d)
    as_opened = steady(app)["rect"]
    for _ in range(5):
        with d.display.window_manager_asleep():
            for size in ((480, 272), (1024, 768)):
                d.display.set_work_area(0, 0, *size)
                app.tree()  # once it has answered it has asked for its size
        # Each answers what the other one said before.
        for _ in range(3):
            d.display.wait_window_manager_done()
            app.tree()
        wait_until(lambda: app.tree()["rect"][2:] == as_opened[2:], lambda: app.tree()["rect"])


# A window that loses ten pixels after a look at its frame, twice.
SHRINKING = r"""
#define _GNU_SOURCE
#include <dlfcn.h>
#include <unistd.h>

void gdk_window_get_frame_extents(void *window, void *frame)
{
    static int width = -1;
    void (*next)(void *, void *) = dlsym(RTLD_NEXT, "gdk_window_get_frame_extents");
    void (*resize)(void *, int, int) = dlsym(RTLD_DEFAULT, "gdk_window_resize");
    void (*flush)(void) = dlsym(RTLD_DEFAULT, "gdk_flush");

    next(window, frame);
    if (unlink("/device/state/shrink") == 0)
        width = 800;
    if (width > 780) {
        width -= 10;
        resize(window, width, 480);
        flush();
        (void)!write(2, "shrunk\n", 7);
    }
}
"""


def test_a_window_that_is_resized_while_it_is_measured(device):
    d = screen(device, (1024, 768), window_manager=False)
    app = d.start(environment=d.preload("shrinking", SHRINKING))
    app.wait_listed()
    d.display.turn(800, 480)
    wait_until(lambda: app.tree()["frame"] == [0, 0, 800, 480], lambda: app.tree()["frame"])
    d.write("/device/state/shrink", "")
    d.display.turn(700, 480)
    wait_until(lambda: app.stderr().count("shrunk") == 2, "the window to shrink")
    wait_until(lambda: app.tree()["frame"] == [0, 0, 700, 480], lambda: app.tree()["frame"])
