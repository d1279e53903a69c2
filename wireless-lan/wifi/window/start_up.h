// SPDX-License-Identifier: MIT
// Loading the configuration at start-up.

#ifndef WIFI_WINDOW_START_UP_H
#define WIFI_WINDOW_START_UP_H

// Finds the interfaces and brings the first one up, reads both configuration files and builds the
// preferred lists.
void load_configuration();

#endif
