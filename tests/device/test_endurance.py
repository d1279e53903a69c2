# SPDX-License-Identifier: MIT
"""Five hundred refreshes leave the program as it was."""

from harness import wait_until


def refreshes(d, app, count):
    for number in range(count):
        scans = len(d.states())
        if number == 0:
            # Once its window is in its place.
            x, y, width, height = app.click("button-refresh")["rect"]
        else:
            d.display.click(x + width // 2, y + height // 2)
        wait_until(lambda: len(d.states()) > scans and app.sensitive("button-refresh"),
                   "a refresh")


def test_nothing_piles_up(device):
    d = device("hostile-names", rate=50)
    networks = [f"street {number}" for number in range(40)]
    d.associate("02:00:00:00:00:07")
    d.address("192.168.7.23")
    app = d.start()
    app.wait_listed()
    sanitized = app.sanitized()
    refreshes(d, app, 20)
    before = sorted(app.descriptors().items())
    memory = app.private_memory()
    for part in range(4):
        d.set_networks(*networks[:10 * part])
        if part == 0:
            app.press("button-refresh")
            app.dialog(text="No Network").press("gtk-close")
            app.wait_title("Wireless network selection")
        else:
            refreshes(d, app, 160)
            d.clear_commands()
    assert sorted(app.descriptors().items()) == before
    if not sanitized:  # the sanitizer keeps freed memory for a while, and looks for leaks itself
        assert app.private_memory() - memory < 512, "KiB"
    assert app.quit() == 0
