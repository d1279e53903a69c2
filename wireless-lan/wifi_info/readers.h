// The readers over an open stream, without the commands and files that they are opened on: what
// fuzzing and tests feed directly. They leave the stream open and treat a read error as its end.

#ifndef WIFI_INFO_READERS_H
#define WIFI_INFO_READERS_H

#include <cstdio>

void read_interfaces(FILE *stream);              // of get_interface
void read_cells(FILE *stream);                   // of get_cell
void read_basic_settings(FILE *stream);          // of get_basic_setting_from_file
void read_basic_settings_advanced(FILE *stream); // of get_basic_setting_from_file_Advanced
void read_preferred_networks(FILE *stream);      // of get_preferred_network_setting_from_file

#endif
