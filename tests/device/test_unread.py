# SPDX-License-Identifier: MIT
"""Files that could not be read whole are not written over without asking."""

import pytest

from connecting import OFFER, connect, idle, wait_commands
from harness import shared_library
from preferred import FILE, Network, close, file_of, open_list
from settings_page import CONF, Settings, dhcp
from test_store import QUESTION

# The system's answer to a path: it cannot be opened, or reading it fails behind some bytes.
LIBRARY = r"""
#define _GNU_SOURCE
#include <dlfcn.h>
#include <errno.h>
#include <stdio.h>
#include <string.h>

struct cut { FILE *file; long left; };

static ssize_t read_cut(void *cookie, char *buffer, size_t size)
{
    struct cut *cut = cookie;
    if (cut->left <= 0) {
        errno = EIO;
        return -1;
    }
    size_t count = fread(buffer, 1, size < (size_t)cut->left ? size : (size_t)cut->left, cut->file);
    cut->left -= (long)count;
    return (ssize_t)count;
}

FILE *fopen(const char *path, const char *mode)
{
    FILE *(*next)(const char *, const char *) = dlsym(RTLD_NEXT, "fopen");
    static struct cut cut;
    char wanted[200] = "";
    int reason = 0;
    long offset = -1;
    FILE *fault = next("/device/state/fault", "re");
    if (fault == NULL)
        return next(path, mode);
    fscanf(fault, "%199s %d %ld", wanted, &reason, &offset);
    fclose(fault);
    if (strcmp(path, wanted) != 0 || mode[0] != 'r')
        return next(path, mode);
    if (offset < 0) {
        errno = reason;
        return NULL;
    }
    cut.file = next(path, mode);
    cut.left = offset;
    return fopencookie(&cut, "r", (cookie_io_functions_t){.read = read_cut});
}

FILE *fopen64(const char *path, const char *mode)
{
    return fopen(path, mode);
}
"""

EMFILE, EIO = 24, 5
HOME = Network("home net", "Home", wpa=1, enc="open", key="home-key")
CAFE = Network("cafe", enc="open", key="cafe-key")
OLD = file_of(HOME, CAFE)


def faulty(device, path, reason, offset, files):
    """A device whose program meets the fault at its start, and no more behind it."""
    d, app = idle(device, "bar", ("attic", "on"),
                  files={"/fault.so": shared_library(LIBRARY), **files,
                         "/device/state/fault": f"{path} {reason} {offset}\n".encode()},
                  environment={"LD_PRELOAD": "/fault.so"})
    d.sh("rm /device/state/fault")
    return d, app


@pytest.mark.parametrize("reason, offset, known", [
    (EMFILE, -1, []), (EIO, -1, []), (EIO, 0, []),
    (EIO, OLD.index(b"USERCELL 1"), [HOME]),
    # In the middle of the second network: without its key.
    (EIO, OLD.index(b"KEY cafe-key"), [HOME, CAFE._replace(key="")])],
    ids=["no descriptor", "no open", "no byte", "one network", "a key"])
def test_remembering_a_network_loses_none(device, reason, offset, known):
    d, app = faulty(device, FILE, reason, offset, {FILE: OLD})
    if offset < 0:
        assert f"Could not access file: {FILE}\n" in app.stderr()
    for count, answer in enumerate(("gtk-no", "gtk-yes", None), 1):
        connect(app, 1)
        dialog = app.dialog("Encrypted Network")
        dialog.type("connect_key", f"secret{count}")
        dialog.press("gtk-ok")
        app.dialog(text=OFFER).press("gtk-yes")
        if answer is not None:
            question = app.dialog(text=QUESTION.format(FILE))
            assert d.file(FILE) == OLD
            question.press(answer)
            question.wait_gone()
        wait_commands(d, app, count)
        new = file_of(*known, *[Network("attic", mode="Master", enc="open", key=f"secret{number}")
                                for number in range(1, count + 1)]).replace(b"Master", b"Managed")
        assert d.file(FILE) == (OLD if answer == "gtk-no" else new)
        # The old one is kept once it is replaced, and not replaced by the new one.
        assert d.file(FILE + ".old") == (None if answer == "gtk-no" else OLD)
        for _ in range(22):
            d.clock.advance(2000)
            app.text("title-label")


def test_the_settings(device):
    before = dhcp(essid="board", key="old-key").encode()
    d, app = faulty(device, CONF, EIO, before.index(b"KEY"), {CONF: before})
    # The dialog reads them again, whole this time: nobody is asked.
    Settings(app).ok()
    assert d.file(CONF) == before and d.file(CONF + ".old") is None
    for reason, offset, key in ((EIO, before.index(b"KEY"), b""), (EMFILE, -1, b"")):
        d.write(CONF, before)
        for answer in ("gtk-no", "gtk-yes"):
            d.write("/device/state/fault", f"{CONF} {reason} {offset}\n")
            settings = Settings(app)
            d.sh("rm /device/state/fault")
            settings.pane.press("gtk-ok")
            question = app.dialog(text=QUESTION.format(CONF))
            assert question.tree()["modal"] and d.file(CONF) == before
            question.press(answer)
            settings.pane.wait_gone()
            if answer == "gtk-no":
                assert d.file(CONF) == before and d.file(CONF + ".old") is None
        assert d.file(CONF + ".old") == before
        assert d.file(CONF) == before.replace(b"old-key", key)
        d.sh(f"rm {CONF}.old")
    assert app.dialogs() == []


def test_an_old_file_that_cannot_be_kept(device):
    d, app = faulty(device, FILE, EMFILE, -1, {FILE: OLD})
    d.sh(f"mkdir {FILE}.old")
    dialog = open_list(app)
    dialog.press("gtk-ok")
    app.dialog(text=QUESTION.format(FILE)).press("gtk-yes")
    close(app.dialog(text="The preferred networks could not be saved."), "gtk-ok")
    dialog.wait_gone()
    assert d.file(FILE) == OLD
    app.wait_printed(f"WIRELESS-LAN-DEBUG: {FILE}.old: Is a directory\n")
    # Asked again.
    d.sh(f"rmdir {FILE}.old")
    dialog = open_list(app)
    dialog.press("gtk-ok")
    app.dialog(text=QUESTION.format(FILE)).press("gtk-yes")
    dialog.wait_gone()
    assert (d.file(FILE), d.file(FILE + ".old")) == (b"", OLD)
