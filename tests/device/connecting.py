# SPDX-License-Identifier: MIT
"""Steps of a connect that several tests take. Time passes only when a test lets it."""

from contextlib import suppress

from harness import wait_until
from preferred import FILE, Network, file_of
from support.grammar import scan_text

IDLE = "Wireless network selection"
CONNECTING = "Connect network..."
ACQUIRING = "Connected\nAcquire IP address..."
INVALID = "Connected\nIP address invalid"
OFFER = "Do you want to add this configuration to the preferred network?"
HIDDEN = "The essid is empty,Please input the Essid: "
COMMANDS = ("iwset", "lnk-ifup", "lnk-ifdown")
LOCKED = ("button-network-configure", "button-connect", "button-wifi-settings", "button-refresh")


def address_of(row):
    """The access point of a row of scan_text."""
    return f"02:00:00:00:00:{row + 1:02X}"


def connected(ip):
    return f"Connected\nIP Address:{ip}"


def idle(device, *networks, **settings):
    """A device with these networks in the list, nothing under way, and commands that do nothing."""
    start = {name: settings.pop(name) for name in ("environment", "device_path")
             if name in settings}
    d = device("none", rate=50, scan=scan_text(*networks), **settings)
    for name in COMMANDS:
        d.command(name, hook=":")
    app = d.start(**start)
    app.wait_listed()
    d.clock.rate = 0
    return d, app


def settle(app):
    """Returns once the main loop has left whatever it was in: it answers questions only then."""
    return app.text("title-label")


def pass_time(d, app, milliseconds):
    """Moves the time on and lets what is due happen. The question after it wakes the main loop,
    which may have been on its way into a wait that it measured before the time moved."""
    settle(app)
    d.clock.advance(milliseconds)
    settle(app)


def connect(app, row):
    app.click_row("view-press", row)
    app.press("button-connect")


def wait_commands(d, app, count=1):
    """Lets the 100 ms after a press pass, until iwset has run and the poller is under way."""
    app.wait_title(CONNECTING)
    pass_time(d, app, 100)
    command = d.wait_command("iwset", count)
    settle(app)
    return command


def answer_key(app, key, authentication=None, index=None, offer="gtk-no"):
    """Fills the key dialog in and answers the offer after it (None: there is none)."""
    dialog = app.dialog("Encrypted Network")
    if key:
        dialog.type("connect_key", key)
    if index is not None:
        dialog.choose("Key_Index_ComboBox", index)
    if authentication is not None:
        dialog.choose("Authentication_ComboBox", authentication)
    dialog.press("gtk-ok")
    if offer is not None:
        app.dialog(text=OFFER).press(offer)
    dialog.wait_gone()


def type_answer(app, question, text):
    """Types into a question's entry, which has the focus from the start."""
    def entry():
        return question.find(type="GtkEntry")

    assert entry()["text"] == ""
    wait_until(lambda: entry()["focus"], "the focus on the question's entry")
    app.display.type(text)
    wait_until(lambda: entry()["text"] == text, lambda: f"{text!r}; it holds {entry()['text']!r}")


def _passing(d, app, marks, milliseconds, times, expect):
    def seen():
        printed = app.stderr()
        return sum(printed.count(mark) for mark in marks)

    for _ in range(times):
        before = seen()
        pass_time(d, app, milliseconds)
        wait_until(lambda: seen() >= before + expect,
                   lambda: f"{expect} polls; {seen() - before} came\n{app.stderr()[-2000:]}")
        settle(app)


def poll_link(d, app, times=1, expect=1):
    """Lets the link poller look `times` times."""
    _passing(d, app, ("WIRELESS-LAN-DEBUG: AP MAC[", "link connected,then"), 2000, times, expect)


def poll_address(d, app, times=1, expect=1, milliseconds=2000):
    """The same with the address poller."""
    _passing(d, app, ("detect_network_interface_state ...",), milliseconds, times, expect)


def arrive(d, app, row, ip="192.168.7.23"):
    """From the applied configuration to the address."""
    d.associate(address_of(row))
    poll_link(d, app)
    d.address(ip)
    poll_address(d, app)
    app.wait_state(row, connected(ip))


def refresh(d, app):
    app.press("button-refresh")
    app.wait_title("Searching...")
    pass_time(d, app, 100)


def preferred(*networks):
    """The file of preferred networks with keys: (alias, essid, authentication, index, key) each."""
    return {FILE: file_of(*(
        Network(essid, alias, wpa=authentication, index=index, enc="open", key=key)
        for alias, essid, authentication, index, key in networks))}


def children(pid):
    """(state, command line) of every process below this one, but for those that end meanwhile."""
    found = []
    with open(f"/proc/{pid}/task/{pid}/children", encoding="ascii") as numbers:
        below = numbers.read().split()
    for number in below:
        with suppress(FileNotFoundError, ProcessLookupError):
            with open(f"/proc/{number}/stat", encoding="ascii") as stat, \
                    open(f"/proc/{number}/cmdline", "rb") as line:
                found.append((stat.read().rpartition(")")[2].split()[0], line.read()))
            found += children(number)
    return found
