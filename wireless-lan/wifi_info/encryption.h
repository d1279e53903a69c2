// The words for an encryption.

#ifndef WIFI_INFO_ENCRYPTION_H
#define WIFI_INFO_ENCRYPTION_H

#include "wifi.h"

// The word for an encryption in /etc/wireless.conf and for /sbin/iwset: "off", "open" or (any other
// value) "restricted".
const char *encryption_word(t_encmode encmode);

#endif
