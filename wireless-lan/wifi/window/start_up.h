// SPDX-License-Identifier: MIT
// What is loaded while the window is built.

#ifndef WIFI_WINDOW_START_UP_H
#define WIFI_WINDOW_START_UP_H

// Finds the interfaces and brings the first one up, reads both configuration files and builds the
// preferred lists.
void load_configuration();

#endif
