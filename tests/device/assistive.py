# SPDX-License-Identifier: MIT
"""The hands of assistive technology: it presses a button of the main window through its accessible
action, which a dialog in front does not keep away as it does the pointer."""

import functools
import subprocess

from harness import shared_library

SOURCE = r"""
#include <fcntl.h>
#include <string.h>
#include <sys/stat.h>
#include <unistd.h>

#include <gtk/gtk.h>

static const char FIFO[] = "/device/state/hand";

static GtkWidget *find(GtkWidget *widget, const char *name)
{
    GtkWidget *found = NULL;
    GList *children;
    if (strcmp(gtk_widget_get_name(widget), name) == 0)
        return widget;
    if (!GTK_IS_CONTAINER(widget))
        return NULL;
    children = gtk_container_get_children(GTK_CONTAINER(widget));
    for (GList *child = children; child != NULL && found == NULL; child = child->next)
        found = find(child->data, name);
    g_list_free(children);
    return found;
}

static gboolean press(GIOChannel *channel, GIOCondition condition, gpointer data)
{
    char name[100] = "";
    ssize_t length = read(g_io_channel_unix_get_fd(channel), name, sizeof name - 1);
    GList *windows = gtk_window_list_toplevels();
    (void)condition, (void)data;
    for (GList *window = windows; window != NULL && length > 0; window = window->next) {
        GtkWidget *found = find(window->data, name);
        if (found != NULL)
            atk_action_do_action(ATK_ACTION(gtk_widget_get_accessible(found)), 0);
    }
    g_list_free(windows);
    return TRUE;
}

G_MODULE_EXPORT void gtk_module_init(int *argc, char ***argv)
{
    (void)argc, (void)argv;
    mkfifo(FIFO, 0600);
    g_io_add_watch(g_io_channel_unix_new(open(FIFO, O_RDWR | O_CLOEXEC)), G_IO_IN, press, NULL);
}
"""


@functools.lru_cache(maxsize=None)
def _library():
    flags = subprocess.run(["pkg-config", "--cflags", "--libs", "gtk+-2.0", "gmodule-2.0"],
                           check=True, stdout=subprocess.PIPE, text=True).stdout.split()
    return shared_library(SOURCE, *flags)


def settings(**others):
    """Settings of a device (for `idle`) whose program has such hands."""
    return {**others, "files": {"/hand.so": _library(), **others.get("files", {})},
            "environment": {"GTK_MODULES": "/device/state/probe.so:gail:/hand.so"}}


def press(d, name):
    with open(f"{d.state}/hand", "wb") as hand:
        hand.write(name.encode())
