// SPDX-License-Identifier: MIT
// The words for an encryption in files, commands and lists.

#ifndef WIFI_INFO_ENCRYPTION_H
#define WIFI_INFO_ENCRYPTION_H

#include "wifi.h"

enum encryption_words {
    SCAN_WORDS, // of iwlist: "off" and "on", which stands for ENC_OPEN
    FILE_WORDS, // of both files and of /sbin/iwset: "off", "open" and "restricted"
    LIST_WORDS  // of the preferred lists: "ENC_OFF", "ENC_OPEN" and "ENC_RESTRICTED"
};

// The word for an encryption in FILE_WORDS or LIST_WORDS. An unknown number gives the word for
// ENC_RESTRICTED.
const char *encryption_word(t_encmode encmode, encryption_words words);

// The encryption that `word` stands for, or `otherwise` for an unknown word.
t_encmode encryption_of(const char *word, encryption_words words, t_encmode otherwise);

#endif
