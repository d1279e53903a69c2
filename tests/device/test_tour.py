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


def choose(app, row):
    app.click_row("view-press", row)
    app.press("button-connect")


def test_tour(device):
    d = device("street", rate=RATE)
    d.command("lnk-ifup", hook=f"address {LEASE} $1")
    seen = []

    def told():
        """The commands since the last look, discoveries left out."""
        found = [one.argv for one in d.commands() if one.name != "cat"]
        d.clear_commands()
        return found

    def sent(*states):
        """These states since the last look, and no other."""
        d.wait_states(*seen, *states)
        seen.extend(states)

    def apply(settings):
        """OK; the new address is there before the first look at it."""
        d.clock.rate = 0
        settings.ok()
        d.wait_command("lnk-ifup")
        d.clock.rate = RATE

    # The first start finds the street.
    app = d.start()
    networks = app.wait_listed()
    assert networks[ROW] == ["Haus 14", "Master", "on", "64/100", "Disconnect"]
    sent(5)
    told()

    # A refresh with the same air changes nothing.
    app.press("button-refresh")
    d.wait_command("iwlist")
    assert app.wait_listed() == networks
    sent(5)
    assert told() == [["/sbin/ifconfig", "wlan0", "up"], ["iwlist", "wlan0", "scan"]]

    # Joining with WPA; the key is remembered under a name of its own.
    choose(app, ROW)
    key = app.dialog("Encrypted Network")
    key.type("connect_key", "correct-horse")
    key.choose("Authentication_ComboBox", 1)
    key.press("gtk-ok")
    offer = app.dialog(text=OFFER)
    offer.type("GtkEntry", "at home")
    offer.press("gtk-yes")
    app.wait_state(ROW, connected(LEASE))
    app.wait_title(IDLE)
    sent(2, 3, 4)
    assert told() == [["/sbin/ifconfig", "wlan0", "up"], WPA, IF_UP]
    assert d.file("/tmp/essid_tmp") == b"Haus 14\n"
    assert d.file("/tmp/key_tmp") == b"correct-horse\n"
    assert d.file(FILE) == HOME
    assert app.label("button-connect") == "gtk-disconnect"

    # A fixed address.
    d.command("lnk-ifup", hook=f"address {FIXED} $1")
    settings = Settings(app)
    settings.toggle("static")
    for prefix, text in zip(PREFIXES, ADDRESSES):
        settings.pane.type(prefix, text)
    apply(settings)
    app.wait_state(ROW, connected(FIXED))
    assert told() == [IF_UP]
    sent(2, 4)
    assert d.file(CONF).decode() == static()

    # The device hosts a network of its own.
    settings = Settings(app)
    settings.toggle("adhoc-host")
    information = settings.open_group()
    information.type("GtkEntry", "the board")
    information.press("gtk-ok")
    information.wait_gone()
    apply(settings)
    assert told() == [UP, HOST, IF_UP]
    sent(3)
    assert app.text("title-label") == "Ad-Hoc Host Mode"
    assert not any(app.sensitive(key) for key in ("view-press", "button-connect", "button-refresh"))
    assert d.file(CONF).decode() == static(host=1, essid="the board")

    # And no longer. The network's name is read back up to its first blank.
    settings = Settings(app)
    settings.toggle("adhoc-host")
    apply(settings)
    app.wait_state(ROW, connected(FIXED))
    app.wait_title(IDLE)
    assert told() == [IF_UP]
    sent(2, 4)
    assert d.file(CONF).decode() == static(essid="the")

    # Back to DHCP.
    d.command("lnk-ifup", hook=f"address {LEASE} $1")
    settings = Settings(app)
    settings.toggle("dhcp")
    apply(settings)
    app.wait_state(ROW, connected(LEASE))
    assert told() == [IF_UP]
    sent(2, 4)
    assert d.file(CONF).decode() == dhcp(essid="the")

    # Leaving the network.
    choose(app, ROW)
    app.wait_state(ROW, "Disconnect")
    assert told() == [["/sbin/lnk-ifdown", "wlan0"]]
    sent(2)
    assert app.label("button-connect") == "gtk-connect"
    assert app.quit() == 0

    # The next start finds everything as it was left.
    app = d.start()
    assert app.wait_listed() == networks
    assert d.file(CONF).decode() == dhcp(essid="the")
    assert d.file(FILE) == HOME
    settings = Settings(app)
    assert settings.active("dhcp", "static", "auto_dns", "adhoc-host") == [True, False, True, False]
    settings.cancel()
    told()
    choose(app, ROW)
    key = app.dialog("Encrypted Network")
    assert key.text("connect_key") == "correct-horse"
    assert key.find("Authentication_ComboBox")["active"] == 1
    key.press("gtk-ok")  # known already: not offered again
    app.wait_state(ROW, connected(LEASE))
    assert WPA in told()
    assert d.file(FILE) == HOME
    assert app.quit() == 0
