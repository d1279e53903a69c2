// SPDX-License-Identifier: MIT
// Text for the shell, and running commands.

#ifndef WIFI_INFO_SHELL_H
#define WIFI_INFO_SHELL_H

#include <glib.h>

// A new copy of `text` with a backslash before each ", \, $ and `, so that a shell reads it between
// double quotes as exactly `text`. g_free it.
gchar *shell_escape(const char *text);

// A new command line that writes `text` and a newline to `path`, whose name must be plain to a
// shell: `echo "%s" >path`, or printf for a text that some echo would change. g_free it.
gchar *echo_command(const char *text, const char *path);

// Runs a command line through the shell and waits for it. The exit status is ignored: the state of
// the interface shows the outcome.
void run_command(const char *command);

// TRUE for a name that the kernel could give to an interface (1 to 15 bytes, no white space, no
// '/', no ':', see dev_valid_name in net/core/dev.c) and that no shell or command takes for
// anything but a name. Otherwise FALSE, and one line on standard error says that `step` is skipped.
gboolean interface_usable(const char *name, const char *step);

// Runs "/sbin/ifconfig %s up" if the name is usable.
void bring_interface_up(const char *name);

#endif
