// SPDX-License-Identifier: MIT
// A device whose commands know more than a board's: the reason of a failure, the access point where
// the kernel does not tell it. A build without a directory of such commands knows of none of it.

#ifndef WIFI_INFO_DEVICE_H
#define WIFI_INFO_DEVICE_H

#include <glib.h>

// Names the directory of the device's commands and puts it in front of PATH. "": there is none.
void set_device_path(const char *directory);

// Whether a directory has been named.
gboolean has_device_path();

// The translated sentence for the word that `reason` begins with and the detail after it; a text
// that begins with no known word as it is, made valid UTF-8 without control characters. g_free it.
gchar *reason_sentence(const char *reason);

// The sentence that says why the last command failed. NULL: none failed, or the device does not
// say. g_free it.
gchar *device_reason();

// Asks the device's command "ap-address IF" for the access point of `interface` and copies the
// answer into `address`: six pairs of hexadecimal digits, in upper case. FALSE: there is none, no
// such command, or no answer in time; `address` is untouched.
gboolean ask_ap_address(const char *interface, char *address, gsize size);

#endif
