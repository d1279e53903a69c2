"""The network list: from the scan to the rows."""


def test_street(device):
    d = device("street")
    app = d.start()
    rows = app.wait_listed()
    assert rows[1] == ["Haus 12", "Master", "on", "71/100", "Disconnect"]
    assert d.states() == [5]
    print(app.sketch(), d.commands(), d.notices(), app.inner_pid)
    app.click_row("view-press", 0)
    app.press("button-refresh")
    d.wait_states(5, 5)
    app.wait_listed()
    d.display.screenshot("/tmp/simb/shot.png")
    assert app.quit() == 0
