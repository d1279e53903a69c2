# SPDX-License-Identifier: MIT
"""What the tests of the settings share: the file, the dialog and the hands on it."""

from harness import wait_until

CONF = "/etc/wireless.conf"
PREFIXES = ("address", "netmask", "broadcast", "gateway")
ADDRESSES = ("192.168.1.2", "255.255.255.0", "192.168.1.255", "192.168.1.1")
TITLE = "WLAN Setting"
GROUP_TITLE = "Ad-Hoc Information"


def group(host=0, essid="", key="", encryption="off"):
    return f"wifigroup {host}\nESSID {essid}\nMODE Ad-Hoc\nKEY {key}\nEncryption {encryption}\n"


def dhcp(dns="auto", **hosted):
    return f"iface wlan0\naddrtype dhcp\ndns {dns}\n" + group(**hosted)


def static(addresses=ADDRESSES, **hosted):
    lines = "".join(f"{prefix} {text}\n" for prefix, text in zip(PREFIXES, addresses))
    return "iface wlan0\naddrtype static \n" + lines + group(**hosted)


class Settings:
    """The open settings dialog; `pane` is the harness's view of it."""

    def __init__(self, app, content=None):
        if content is not None:
            app.device.write(CONF, content)
        self.app, self.device = app, app.device
        app.press("button-wifi-settings")
        self.pane = app.dialog(TITLE)

    def widget(self, prefix, interface="wlan0"):
        return self.pane.find(prefix if prefix in PREFIXES else prefix + interface)

    def preferences(self):
        return self.pane.find(type="GtkButton", label="gtk-preferences")

    def active(self, *prefixes):
        return [self.widget(prefix)["active"] for prefix in prefixes]

    def texts(self):
        return tuple(self.pane.find(prefix)["text"] for prefix in PREFIXES)

    def entries_sensitive(self):
        """True or False for all four, else what they are."""
        states = [self.pane.find(prefix)["sensitive"] for prefix in PREFIXES]
        return states[0] if len(set(states)) == 1 else states

    def toggle(self, prefix):
        """Clicks a radio or check button and waits for it to change."""
        before = self.widget(prefix)["active"]
        self.pane.press(prefix + "wlan0")
        wait_until(lambda: self.widget(prefix)["active"] != before, f"{prefix} to change")

    def open_group(self):
        self.pane.press("gtk-preferences")
        return self.app.dialog(GROUP_TITLE)

    def cancel(self):
        self.pane.press("gtk-cancel")
        self.pane.wait_gone()

    def ok(self):
        self.pane.press("gtk-ok")
        self.pane.wait_gone()

    def refused(self):
        """Presses OK, reads the one message, closes it; the dialog is there again."""
        self.pane.press("gtk-ok")
        message = self.app.dialog(text="Settings invalid")
        assert message.tree()["modal"]
        message.press("gtk-ok")
        message.wait_gone()
        assert self.pane.exists()


def close_dialogs(app):
    """What a test that failed left open must not fail the next one."""
    while app.running() and app.dialogs():
        before = len(app.dialogs())
        app.key("Escape")
        wait_until(lambda: len(app.dialogs()) < before, "a dialog to close")
