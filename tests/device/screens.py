# SPDX-License-Identifier: MIT
"""A tour through every window and dialog of the program, and a look at each: which control lies
outside the screen, over another, or shows less than its text needs."""

import ctypes
import functools
import re
import subprocess
import time

from harness import CATALOGUES, wait_until
from harness.device import TOP, scan_text
from preferred import FILE, FRONT, Network, file_of
from settings_page import CONF, static

SIZES = ((1024, 768), (800, 480), (640, 480), (480, 272), (320, 480))
DPI = (96, 120, 160)
LANGUAGES = ("en", "de", "zh", "long", "rtl")
SPOKEN = {"en": "en", "de": "de", "zh": "zh_CN", "long": "xx", "rtl": "he"}

# What a person looks at, reads or presses. A control in one of these belongs to it.
CONTROLS = ("GtkButton", "GtkToggleButton", "GtkCheckButton", "GtkRadioButton", "GtkEntry",
            "GtkComboBox", "GtkLabel", "GtkImage", "GtkTreeView", "GtkCList", "GtkAccelLabel")
SCROLL_BARS = ("GtkHScrollbar", "GtkVScrollbar")
LONG_NAME = "A network of the longest name 32"
AIR = (("Corner Cafe", "off", "88/100"), (LONG_NAME, "on", "71/100"),
       ("Haus 14", "on", "64/100"), ("", "on", "40/100"), ("Library", "off", "52/100"),
       *((f"Flat {number}", "on", "30/100") for number in range(12)))
STORED, NAMELESS = 1, 3
KNOWN = (Network(LONG_NAME, "An alias as long as people make them", wpa=1, enc="open",
                 key="secret"),
         *(Network(f"Flat {number}") for number in range(12)))


@functools.lru_cache(maxsize=None)
def _messages(path):
    """The (context, text) pairs of a catalogue."""
    text = subprocess.run(["msgcat", "--no-wrap", path], check=True, stdout=subprocess.PIPE,
                          encoding="utf-8").stdout
    return re.findall(r'^(?:msgctxt "(.*)"\n)?msgid "(.+)"$', re.sub(r'"\n"', "", text), re.M)


def _catalogue(pairs):
    source = 'msgid ""\nmsgstr "Content-Type: text/plain; charset=UTF-8\\n"\n'
    for context, text, translation in pairs:
        source += (f'\nmsgctxt "{context}"' if context else "")
        source += f'\nmsgid "{text}"\nmsgstr "{translation}"\n'
    return subprocess.run(["msgfmt", "-o", "-", "-"], input=source.encode(), check=True,
                          stdout=subprocess.PIPE).stdout


def _twice(text):
    """Every line of the text twice as long, with its blanks at both ends and its mnemonic."""
    def line(part):
        inner = part.strip(" ")
        again = re.sub("[_%]", "", inner)
        return part.replace(inner, f"{inner} {again}") if inner and "%" not in inner else part
    return "\\n".join(line(part) for part in text.split("\\n"))


class _StockItem(ctypes.Structure):
    _fields_ = [("id", ctypes.c_char_p), ("label", ctypes.c_char_p), ("modifier", ctypes.c_uint),
                ("key", ctypes.c_uint), ("domain", ctypes.c_char_p)]


class _Names(ctypes.Structure):
    _fields_ = [("name", ctypes.c_char_p), ("next", ctypes.c_void_p)]


def _stock_labels():
    """The labels of the toolkit's stock items, in English: its catalogues are not everywhere."""
    toolkit = ctypes.CDLL("libgtk-x11-2.0.so.0")
    toolkit.gtk_stock_list_ids.restype = ctypes.POINTER(_Names)
    left, item = toolkit.gtk_stock_list_ids(), _StockItem()
    labels = set()
    while left:
        if toolkit.gtk_stock_lookup(left.contents.name, ctypes.byref(item)) and item.label:
            labels.add(item.label.decode())
        left = ctypes.cast(left.contents.next, ctypes.POINTER(_Names))
    return sorted(labels)


@functools.lru_cache(maxsize=None)
def catalogues(language):
    """{path on the device: content} for one of LANGUAGES."""
    own = [pair for pair in _messages(f"{TOP}/po/wireless-lan.pot") if pair[1]]
    if SPOKEN[language] in ("de", "zh_CN"):
        content = subprocess.run(["msgfmt", "-o", "-", f"{TOP}/po/{SPOKEN[language]}.po"],
                                 check=True, stdout=subprocess.PIPE).stdout
        return {f"{CATALOGUES}/{SPOKEN[language]}/LC_MESSAGES/wireless-lan.mo": content}
    if language == "long":
        return {f"{CATALOGUES}/xx/LC_MESSAGES/wireless-lan.mo":
                _catalogue((context, text, _twice(text)) for context, text in own),
                "/usr/share/locale/xx/LC_MESSAGES/gtk20.mo":
                _catalogue(("Stock label", text, _twice(text)) for text in _stock_labels())}
    return {}


def files(language):
    """What the device holds so that every window has something to show."""
    return {**catalogues(language), CONF: static(), FILE: file_of(*KNOWN)}


def start(d, dpi=96, language="en"):
    """The program in a language, with type as large as a screen of that many dots an inch has."""
    d.display.set_dpi(dpi)
    app = d.start(environment={"LANGUAGE": SPOKEN[language]})
    wait_until(lambda: app.networks() and app.sensitive("view-press"), "the list")
    return app


def air():
    return scan_text(*AIR)


# --- the look ---------------------------------------------------------------------------------

def _cut(a, b):
    """What two rectangles have in common, None for nothing."""
    left, top = max(a[0], b[0]), max(a[1], b[1])
    right, bottom = min(a[0] + a[2], b[0] + b[2]), min(a[1] + a[3], b[1] + b[3])
    return (left, top, right - left, bottom - top) if right > left and bottom > top else None


def inside(inner, outer):
    """Whether one rectangle lies in the other."""
    return _cut(inner, outer) == tuple(inner)


def _said(widget):
    text = widget.get("label") or widget.get("text") or widget["name"]
    return f"{widget['type'][3:]} {text!r}"


def _scrolled(viewport):
    """The axes (0, 1) along which the viewport's window scrolls now."""
    window = viewport.parent
    if window is None or window["type"] != "GtkScrolledWindow":
        return ()
    bars = [bar["type"] for bar in window["children"]
            if bar["type"] in SCROLL_BARS and bar["mapped"]]
    return tuple(axis for axis, bar in enumerate(SCROLL_BARS) if bar in bars)


def _shown(widget, faults):
    """The part of a widget that is in sight. What a window cuts off without a scroll bar for it
    is a fault."""
    rect, where = tuple(widget["rect"]), widget.parent
    while where is not None:
        if where["type"] == "GtkViewport" or where.parent is None:
            axes = _scrolled(where) if where["type"] == "GtkViewport" else ()
            for axis in (0, 1):
                low, size = where["rect"][axis], where["rect"][axis + 2]
                if axis not in axes and not (low <= rect[axis] and
                                             rect[axis] + rect[axis + 2] <= low + size):
                    faults.append(f"{_said(widget)} is cut off: {rect} in {where['rect']}")
            rect = _cut(rect, where["rect"])
            if rect is None:
                return None
        where = where.parent
    return rect


def _leaves(widget):
    """The controls in a window, without what is part of another control."""
    for child in widget["children"]:
        if not child["mapped"]:
            continue
        if child["type"] in CONTROLS or child["type"] in SCROLL_BARS:
            yield child
        else:
            yield from _leaves(child)


def _texts(widget):
    for one in widget.walk():
        if one["mapped"] and one["type"] in ("GtkLabel", "GtkAccelLabel", "GtkCellView"):
            yield one


def faults(window, area):
    """What is wrong with a window's record on a screen with this work area; [] for nothing."""
    found = []
    if not inside(window["frame"], area):
        found.append(f"the window {window['frame']} is not in {area}")
    leaves = list(_leaves(window))
    shown = [(leaf, _shown(leaf, found)) for leaf in leaves]
    for leaf, rect in shown:
        if leaf["type"] not in SCROLL_BARS and rect and not inside(rect, area):
            found.append(f"{_said(leaf)} {rect} is not in {area}")
    for number, (leaf, rect) in enumerate(shown):
        for other, place in shown[:number]:
            if rect and place and _cut(rect, place):
                found.append(f"{_said(leaf)} {rect} covers {_said(other)} {place}")
    for text in _texts(window):
        size, needs = text["rect"][2:], text["needs"]
        if size[0] < needs[0] or size[1] < needs[1]:
            found.append(f"{_said(text)} has {size} and needs {needs}")
    letters = [letter.lower() for label in window.all(type="GtkLabel") if label["mapped"]
               for letter in re.findall("_(.)", label["label"])]
    found += [f"Alt+{letter} presses two" for letter in set(letters) if letters.count(letter) > 1]
    for viewport in window.all(type="GtkViewport"):
        if viewport["mapped"] and min(viewport["rect"][2:]) < 20:
            found.append(f"a scrolled part is only {viewport['rect'][2:]} in size")
    return found


def steady(pane, limit=10):
    """The window's record, once the window has its size and place: twice the same, and within the
    work area, which window manager and program agree on one after the other. One that stays outside
    is given as it is."""
    last = []

    def ready():
        tree = pane.now()
        now = [(one["rect"], one["mapped"]) for one in tree.walk()] if tree else None
        same = tree and tree["mapped"] and tree["rect"][2] > 1 and now == last
        last[:] = now or []
        return tree if same and (inside(tree["frame"], pane.app.display.work_area()) or
                                 time.monotonic() > end) else None

    end = time.monotonic() + limit
    return wait_until(ready, "the window to stand still", 2 * limit)


# --- the tour ---------------------------------------------------------------------------------

def _dialog(app):
    """The dialog that opened last, whatever its language."""
    known = {one["id"] for one in app.windows() if one["mapped"]}

    def newest():
        found = [one for one in app.windows() if one["mapped"] and one["id"] not in known
                 and one["type"] != "GtkTooltip"]
        return found and found[-1]["id"]

    def follow(press):
        press()
        identity = wait_until(newest, lambda: "a dialog\n" + app.sketch())
        pane = app.window(identity)
        if app.window_manager:
            wait_until(lambda: (pane.now() or {}).get("active"), "the dialog's focus")
        return pane

    return follow


def tour(app):
    """Opens every window in turn and gives (name, pane) for each while it is open."""
    def open_by(press):
        return _dialog(app)(press)

    def close(pane):
        app.key("Escape")
        pane.wait_gone()

    yield "main", app

    settings = open_by(lambda: app.press("button-wifi-settings"))
    yield "settings", settings
    settings.press("adhoc-hostwlan0")
    wait_until(lambda: settings.find(label="gtk-preferences")["sensitive"], "the host group")
    group = open_by(lambda: settings.press("gtk-preferences"))
    yield "ad-hoc", group
    refusal = open_by(lambda: group.press("gtk-ok"))
    yield "no name", refusal
    close(refusal)
    close(group)
    settings.type("address", "x")
    refusal = open_by(lambda: settings.press("gtk-ok"))
    yield "settings refused", refusal
    close(refusal)
    close(settings)

    listed = open_by(lambda: app.press("button-network-configure"))
    yield "preferred list", listed
    form = open_by(lambda: listed.press("preferred_button_add"))
    form.press("add_wpa")
    yield "add", form
    close(form)
    listed.click_row(FRONT, 0)
    wait_until(lambda: listed.selected(FRONT) == [0], "the row")
    form = open_by(lambda: listed.press("preferred_button_properties"))
    yield "properties", form
    close(form)
    question = open_by(lambda: listed.press("preferred_button_delete"))
    yield "delete", question
    close(question)
    listed.press("gtk-cancel")
    listed.wait_gone()

    app.click_row("view-press", STORED)
    key = open_by(lambda: app.press("button-connect"))
    yield "key", key
    close(key)
    app.click_row("view-press", NAMELESS)
    name = open_by(lambda: app.press("button-connect"))
    yield "hidden", name
    close(name)
    # The name stays empty, and the key is asked for.
    close(app.window(wait_until(lambda: [one["id"] for one in app.windows()
                                         if one["mapped"] and one.all("connect_key")],
                                "the key dialog")[0]))


def visit(d, dpi=96, language="en"):
    """Takes the tour; gives {window: what is wrong with it}."""
    app = start(d, dpi, language)
    found = {}
    for name, pane in tour(app):
        found[name] = faults(steady(pane), d.display.work_area())
    app.kill()
    return found
