# SPDX-License-Identifier: MIT
"""Start-up, the main window widget for widget, translated texts, and the end."""

import gettext
import io
import subprocess

import pytest

from harness import CATALOGUES, TOP, wait_until

BUTTONS = {
    "button-refresh": ("gtk-refresh", 1),
    "button-wifi-settings": ("WLAN Setting", 3),
    "button-network-configure": ("Preferred Network", 5),
    "button-active-device": ("Active WIFI", 7),
}
AUTOMATIC = {"hscrollbar-policy": "automatic", "vscrollbar-policy": "automatic"}


def has(values, **wanted):
    wanted = {name.replace("_", "-"): value for name, value in wanted.items()}
    return {name: values[name] for name in wanted} == wanted


@pytest.fixture(scope="module")
def app(shared_device):
    started = shared_device("connected").start()
    started.wait_listed()
    return started


def parent_of(widget, type):
    while widget["type"] != type:
        widget = widget.parent
    return widget


def test_window(app):
    window = app.tree()
    assert window["title"] == "Wireless LAN"
    assert has(app.props(window)["properties"], type="toplevel", border_width=10)
    pane, = window["children"]
    assert pane["type"] == "GtkHPaned"
    left, right = pane["children"]
    for side, size in ((left, [240, 300]), (right, [400, 500])):
        props = app.props(side)
        assert side["type"] == "GtkScrolledWindow"
        assert props["size-request"] == size
        assert has(props["properties"], **AUTOMATIC)
    assert left.find("button-refresh") and right.find("view-press")


def test_every_control_is_registered_under_its_name(app):
    for key in [*BUTTONS, "title-label", "view-press", "button-connect"]:
        held = app.registry(key)
        assert held["name"] == key
        assert held["id"] == app.find(key)["id"]
    model = app.registry("cell-list")
    assert model["type"] == "GtkListStore"
    assert app.props("view-press")["properties"]["model"]["id"] == model["id"]
    assert [len(row) for row in app.registered_rows("cell-list")] == [5] * 8
    assert app.registry("window-proc-win") is None


def test_left_column(app):
    frame = parent_of(app.find("button-refresh"), "GtkFrame")
    props = app.props(frame)
    assert frame["label"] == "Settings"
    assert props["size-request"] == [220, 300]
    assert has(props["properties"], label_xalign=0, label_yalign=1, shadow_type="etched-out",
               border_width=10)
    assert frame.parent["type"] == "GtkViewport"
    table = frame.find(type="GtkTable")
    assert has(app.props(table)["properties"], n_rows=10, n_columns=2, homogeneous=True,
               border_width=10)
    assert sorted(one["name"] for one in table["children"]) == sorted(BUTTONS)
    for name, (label, row) in BUTTONS.items():
        button = table.find(name)
        props = app.props(button)
        assert button["label"] == label
        assert props["properties"]["use-stock"] == label.startswith("gtk-")
        assert has(props["packing"], left_attach=0, right_attach=2, top_attach=row,
                   bottom_attach=row + 1)


def test_list_side(app):
    label = app.find("title-label")
    box = label.parent
    assert has(app.props(box)["properties"], homogeneous=False, spacing=10, border_width=10)
    assert label["text"] == "Wireless network selection"
    assert has(app.props(label)["properties"], xalign=0, yalign=0)
    assert app.props(label)["packing"]["expand"] is False

    view = app.find("view-press")
    assert view["type"] == "GtkTreeView" and view.parent["type"] == "GtkViewport"
    inner = parent_of(view, "GtkScrolledWindow")
    assert inner.parent["id"] == box["id"]
    props = app.props(inner)
    assert has(props["properties"], **AUTOMATIC)
    assert has(props["packing"], expand=True, fill=True)

    connect = app.find("button-connect")
    table = connect.parent
    assert has(app.props(table)["properties"], n_rows=1, n_columns=6, homogeneous=True)
    assert app.props(table)["packing"]["expand"] is False
    props = app.props(connect)
    assert connect["label"] == "gtk-connect" and props["properties"]["use-stock"]
    assert has(props["packing"], left_attach=4, right_attach=6, top_attach=0, bottom_attach=1)
    assert [one["position"] for one in (app.props(child)["packing"]
                                        for child in (label, inner, table))] == [0, 1, 2]


def test_columns(app):
    columns = app.columns("view-press")
    assert [one["title"] for one in columns] == ["ESSID", "Mode", "KEY", "Signal strength", "State"]
    renderers = [one["renderers"] for one in columns]
    assert [len(one) for one in renderers] == [1] * 5
    assert len({one[0]["id"] for one in renderers}) == 1, "one renderer serves them all"
    assert renderers[0][0]["type"] == "RowText"
    # Only text renderers have a foreground; this is DarkOliveGreen.
    assert renderers[0][0]["foreground"] == "#55556b6b2f2f"


def test_all_columns_are_in_sight(app):
    def shown():
        inner = parent_of(app.find("view-press"), "GtkScrolledWindow")
        return not inner.find(type="GtkHScrollbar")["visible"]
    wait_until(shown, "the list to fit")
    assert app.networks()[1][4] == "Connected\nIP Address:192.168.7.23"
    x, _, width, _ = app.tree()["rect"]
    assert x >= 0 and x + width <= app.display.width


def test_start_up_commands_and_notices(app):
    d = app.device
    assert [one.argv for one in d.commands()] == [
        ["cat", "/proc/net/wireless"], ["/sbin/ifconfig", "wlan0", "up"],
        ["cat", "/proc/net/wireless"], ["/sbin/ifconfig", "wlan0", "up"],
        ["iwlist", "wlan0", "scan"]]
    assert d.notices() == [("_NET_WIFI_STOP_CHECK", str(app.inner_pid)),
                           ("_NET_WIFI_CHANGE_STATUS", "5")]
    assert app.stderr().startswith(
        "WIRELESS-LAN-DEBUG: find a wifi device,up it\n"
        "Could not access file: /etc/wireless.conf\n"
        "Could not access file: /etc/wireless-user.conf\n"
        "WIRELESS-LAN-DEBUG: Searching...\n")
    assert app.stdout() == "my_wifi->interface_count = 1\n"


def test_closing_ends_with_status_0(app):
    assert app.quit() == 0
    again = app.device.start()
    again.wait_listed()
    assert app.device.display.root_property("_NET_WIFI_STOP_CHECK") == str(again.inner_pid).encode()
    assert again.quit() == 0


def test_no_interface(device):
    d = device("no-interface", files={"/etc/wireless-user.conf": b""})
    app = d.start()
    dialog = app.dialog(text="No Wireless Device")
    assert app.networks() == []
    assert app.text("title-label") == "No Wireless Device"
    assert d.commands("ifconfig", "iwlist") == []
    assert "Could not access file: /etc/wireless.conf\n" in app.stderr()
    assert "wireless-user.conf" not in app.stderr()
    assert app.registered_rows("user_cell_list_backend") == []
    dialog.press("gtk-close")
    dialog.wait_gone()
    assert app.quit() == 0


def test_the_first_picture_comes_before_the_first_scan(device, tmp_path):
    # The refresh looks for the interface first; there it is held while the screen is looked at.
    d = device("street")
    d.command("cat", hook="""
if [ -e /device/state/loaded ]; then
    until [ -e /device/state/seen ]; do sleep 0.1; done
fi
: >/device/state/loaded
""")
    app = d.start(wait=False)
    d.wait_command("cat", 2, ended=False)
    picture = d.display.screenshot(str(tmp_path / "first.png"))
    # Inside the frame that the window manager draws: text has many shades, an empty window one.
    shades = subprocess.run(["identify", "-format", "%k", f"{picture}[600x440+60+150]"],
                            check=True, stdout=subprocess.PIPE).stdout
    assert int(shades) > 100
    assert len(d.commands("cat")) == 2 and d.notices() == []
    d.write("/device/state/seen", b"")
    app.wait()
    app.wait_listed()
    assert app.quit() == 0


def test_no_memory_for_the_state(device):
    d = device("street")
    app = d.start(wait=False, environment=d.preload(
        "memory", "void *g_try_malloc0(unsigned long n) { (void)n; return (void *)0; }"))
    assert app.wait_end() == 0
    assert "WIRELESS-LAN-DEBUG: my_wifi_init error!!!\r\n" in app.stderr()
    assert d.commands() == []


def test_translated_texts(device, german):
    catalogue = subprocess.run(["msgfmt", "-o", "-", f"{TOP}/po/de.po"], check=True,
                               stdout=subprocess.PIPE).stdout
    translated = gettext.GNUTranslations(io.BytesIO(catalogue)).gettext
    d = device("connected", files={f"{CATALOGUES}/de/LC_MESSAGES/wireless-lan.mo": catalogue})
    d.dissociate()
    app = d.start(environment=german)
    app.wait_title(translated("Wireless network selection"))
    wait_until(app.networks, "the list")
    shown = {
        "Wireless LAN": app.title, "Settings": app.find(type="GtkFrame")["label"],
        **{label: app.label(name) for name, (label, _) in BUTTONS.items() if "gtk" not in label},
        **dict(zip(["ESSID", "Mode", "KEY", "Signal strength", "State"],
                   [one["title"] for one in app.columns("view-press")])),
        "Disconnect": app.networks()[0][4],
    }
    assert shown == {text: translated(text) for text in shown}
    assert translated("Disconnect") != "Disconnect" and translated("Wireless LAN") != ""
    assert app.quit() == 0


def test_closing_waits_for_a_dialog(device):
    d = device("none")
    app = d.start()
    dialog = app.dialog(text="No Network")
    d.display.close_window("Wireless LAN")  # a modal dialog is in front: not heard
    dialog.press("gtk-close")
    app.wait_title("Wireless network selection")
    assert app.quit() == 0


def test_keyboard(device):
    d = device("street")
    app = d.start()
    app.wait_listed()
    assert app.find("view-press")["focus"]
    for name in ("button-connect", "button-refresh", "button-wifi-settings",
                 "button-network-configure", "view-press", "button-connect", "button-refresh"):
        app.key("Tab")
        wait_until(lambda: app.find(name)["focus"], f"the focus on {name}")
    app.key("space")
    d.wait_states(5, 5)
    app.wait_listed()
    app.key("alt+r")  # the mnemonic
    d.wait_states(5, 5, 5)
    app.wait_listed()
    assert app.quit() == 0


def test_a_small_screen(device):
    d = device("connected", size="640x480")
    app = d.start()
    app.wait_listed()
    assert app.props(app.tree())["properties"]["default-width"] <= 640
    app.click_row("view-press", 1)
    wait_until(lambda: app.label("button-connect") == "gtk-disconnect", "the button to follow")
    assert app.quit() == 0
