# SPDX-License-Identifier: MIT
"""One walk through the whole program, as its owner takes it on the first evening."""

from connecting import IDLE, OFFER, connected, preferred
from preferred import FILE
from settings_page import ADDRESSES, CONF, PREFIXES, Settings, dhcp, static

ROW = 2  # "Haus 14"
RATE = 10
HOME = preferred(("at home", "Haus 14", 1, 0, "correct-horse"))[FILE]
LEASE, FIXED = "192.168.7.23", ADDRESSES[0]
WPA = ["/sbin/iwset", "wpa", "wlan0", "essid", "Haus 14", "mode", "Managed", "key",
       "correct-horse", "enc", "open"]
HOST = ["/sbin/iwset", "wlan0", "essid", "the board", "mode", "Ad-Hoc", "key", "off", "enc", "off"]
UP = ["ifconfig", "wlan0", "up"]
IF_UP = ["lnk-ifup", "wlan0"]


class Tour:
    """The device and what it was told since the last look."""

    def __init__(self, device):
        self.device = device("street", rate=RATE)
        self.addresses_from(LEASE)
        self.app = self.device.start()
        self.networks = self.app.wait_listed()
        self.seen = []

    def addresses_from(self, address):
        """What the next lnk-ifup gives."""
        self.device.command("lnk-ifup", hook=f"address {address} $1")

    def told(self):
        """The commands, discoveries left out."""
        found = [one.argv for one in self.device.commands() if one.name != "cat"]
        self.device.clear_commands()
        return found

    def sent(self, *states):
        """These states, and no other."""
        self.device.wait_states(*self.seen, *states)
        self.seen.extend(states)

    def conf(self):
        return self.device.file(CONF).decode()

    def choose(self):
        self.app.click_row("view-press", ROW)
        self.app.press("button-connect")

    def apply(self, settings):
        """OK; the new address is there before the first look at it."""
        self.device.clock.rate = 0
        settings.ok()
        self.device.wait_command("lnk-ifup")
        self.device.clock.rate = RATE


def look_around(tour):
    assert tour.networks[ROW] == ["Haus 14", "Master", "on", "64/100", "Disconnect"]
    tour.sent(5)
    tour.told()


def refresh_with_the_same_air(tour):
    tour.app.press("button-refresh")
    tour.device.wait_command("iwlist")
    assert tour.app.wait_listed() == tour.networks
    tour.sent(5)
    assert tour.told() == [["/sbin/ifconfig", "wlan0", "up"], ["iwlist", "wlan0", "scan"]]


def join_and_remember(tour):
    app, d = tour.app, tour.device
    tour.choose()
    key = app.dialog("Encrypted Network")
    key.type("connect_key", "correct-horse")
    key.choose("Authentication_ComboBox", 1)
    key.press("gtk-ok")
    offer = app.dialog(text=OFFER)
    offer.type("GtkEntry", "at home")
    offer.press("gtk-yes")
    app.wait_state(ROW, connected(LEASE))
    app.wait_title(IDLE)
    tour.sent(2, 3, 4)
    assert tour.told() == [["/sbin/ifconfig", "wlan0", "up"], WPA, IF_UP]
    assert d.file("/tmp/essid_tmp") == b"Haus 14\n"
    assert d.file("/tmp/key_tmp") == b"correct-horse\n"
    assert d.file(FILE) == HOME
    assert app.label("button-connect") == "gtk-disconnect"


def take_a_fixed_address(tour):
    tour.addresses_from(FIXED)
    settings = Settings(tour.app)
    settings.toggle("static")
    for prefix, text in zip(PREFIXES, ADDRESSES):
        settings.pane.type(prefix, text)
    tour.apply(settings)
    tour.app.wait_state(ROW, connected(FIXED))
    assert tour.told() == [IF_UP]
    tour.sent(2, 4)
    assert tour.conf() == static()


def host_a_network(tour):
    settings = Settings(tour.app)
    settings.toggle("adhoc-host")
    information = settings.open_group()
    information.type("GtkEntry", "the board")
    information.press("gtk-ok")
    information.wait_gone()
    tour.apply(settings)
    assert tour.told() == [UP, HOST, IF_UP]
    tour.sent(3)
    assert tour.app.text("title-label") == "Ad-Hoc Host Mode"
    assert not any(tour.app.sensitive(key) for key in
                   ("view-press", "button-connect", "button-refresh"))
    assert tour.conf() == static(host=1, essid="the board")


def host_no_longer(tour):
    # The network's name is read back up to its first blank.
    settings = Settings(tour.app)
    settings.toggle("adhoc-host")
    tour.apply(settings)
    tour.app.wait_state(ROW, connected(FIXED))
    tour.app.wait_title(IDLE)
    assert tour.told() == [IF_UP]
    tour.sent(2, 4)
    assert tour.conf() == static(essid="the")


def go_back_to_dhcp(tour):
    tour.addresses_from(LEASE)
    settings = Settings(tour.app)
    settings.toggle("dhcp")
    tour.apply(settings)
    tour.app.wait_state(ROW, connected(LEASE))
    assert tour.told() == [IF_UP]
    tour.sent(2, 4)
    assert tour.conf() == dhcp(essid="the")


def leave(tour):
    tour.choose()
    tour.app.wait_state(ROW, "Disconnect")
    assert tour.told() == [["/sbin/lnk-ifdown", "wlan0"]]
    tour.sent(2)
    assert tour.app.label("button-connect") == "gtk-connect"
    assert tour.app.quit() == 0


def find_everything_as_it_was_left(tour):
    tour.app = tour.device.start()
    assert tour.app.wait_listed() == tour.networks
    assert tour.conf() == dhcp(essid="the")
    assert tour.device.file(FILE) == HOME
    settings = Settings(tour.app)
    assert settings.active("dhcp", "static", "auto_dns", "adhoc-host") == [True, False, True, False]
    settings.cancel()
    tour.told()


def join_again_with_the_key_at_hand(tour):
    tour.choose()
    key = tour.app.dialog("Encrypted Network")
    assert key.text("connect_key") == "correct-horse"
    assert key.find("Authentication_ComboBox")["active"] == 1
    key.press("gtk-ok")  # known already: not offered again
    tour.app.wait_state(ROW, connected(LEASE))
    assert WPA in tour.told()
    assert tour.device.file(FILE) == HOME
    assert tour.app.quit() == 0


def test_tour(device):
    tour = Tour(device)
    look_around(tour)
    refresh_with_the_same_air(tour)
    join_and_remember(tour)
    take_a_fixed_address(tour)
    host_a_network(tour)
    host_no_longer(tour)
    go_back_to_dhcp(tour)
    leave(tour)
    find_everything_as_it_was_left(tour)
    join_again_with_the_key_at_hand(tour)
