// SPDX-License-Identifier: MIT
// A state record for tests, and its fields as texts.

#ifndef TESTS_SUPPORT_STATE_H
#define TESTS_SUPPORT_STATE_H

#include <string>

#include "wifi.h"

// Makes my_wifi a new zeroed record with nothing selected and clears the static_ globals. Records
// of the former one are freed.
void fresh_state();

// Adds the first interface record, named `name`.
WIFI_INTERFACE *add_interface(const char *name);

// Adds a zeroed preferred network behind the last one.
WIFI_CELL *add_preferred();

// A field's text; aborts when it has no terminator.
std::string field_text(const char *field, gsize size);

#define FIELD(record, name) field_text((record).name, sizeof(record).name)

#endif
