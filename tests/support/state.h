// SPDX-License-Identifier: MIT
// A state record for tests, and its fields as texts.

#ifndef TESTS_SUPPORT_STATE_H
#define TESTS_SUPPORT_STATE_H

#include <string>

#include "wifi.h"

// Replaces my_wifi by a zeroed record with nothing selected, frees the old records and clears the
// static_ globals.
void fresh_state();

// Adds the first interface record, named `name`.
WIFI_INTERFACE *add_interface(const char *name);

// Appends a zeroed preferred network.
WIFI_CELL *add_preferred();

// The text of a field; aborts when it has no terminator.
std::string field_text(const char *field, gsize size);

#define FIELD(record, name) field_text((record).name, sizeof(record).name)

#endif
