// SPDX-License-Identifier: MIT
// Text for the shell, and running commands.

#ifndef WIFI_INFO_SHELL_H
#define WIFI_INFO_SHELL_H

#include <glib.h>

// A new copy of `text` that the shell reads between double quotes as exactly `text`: a backslash
// stands before each ", \, $ and `. g_free it.
gchar *shell_escape(const char *text);

// A new command line that writes `text` and a line end to `path` (a name that is plain to a shell).
// It is `echo "%s" >path`; a text that some echo would read as something else goes through printf.
// g_free it.
gchar *echo_command(const char *text, const char *path);

// Runs a command line through the shell and waits for it; how it ends is not looked at: the outcome
// of a command is learnt from the interface.
void run_command(const char *command);

// TRUE for a name that the kernel could give to an interface (1 to 15 bytes, no blank, no '/', no
// ':', see dev_valid_name in net/core/dev.c) and that means nothing to a shell, nor an option to a
// command. For any other name one line goes to standard error, saying that `step` is skipped.
gboolean interface_usable(const char *name, const char *step);

// Runs "/sbin/ifconfig %s up" for a usable name.
void bring_interface_up(const char *name);

#endif
