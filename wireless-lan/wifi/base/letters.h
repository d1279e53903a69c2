// SPDX-License-Identifier: MIT
// The letters that press a button together with Alt.

#ifndef WIFI_BASE_LETTERS_H
#define WIFI_BASE_LETTERS_H

#include <initializer_list>

// Gives each of the stock items of one dialog a letter of its own, in whatever language: where two
// have the same one, that of the later item moves to another letter of its word. Call it before the
// buttons are built.
void set_letters_apart(std::initializer_list<const char *> stock_ids);

#endif
