// SPDX-License-Identifier: MIT
#include "wifi_info/encryption.h"

#include <initializer_list>

#include <glib.h>

#include "wifi.h"

// Indexed by t_encmode and encryption_words.
constexpr const char *WORDS[][3] = {
    {"off", "off", "ENC_OFF"},
    {"on", "open", "ENC_OPEN"},
    {nullptr, "restricted", "ENC_RESTRICTED"},
};

const char *encryption_word(t_encmode encmode, encryption_words words)
{
    return WORDS[MIN(encmode, ENC_RESTRICTED)][words];
}

t_encmode encryption_of(const char *word, encryption_words words, t_encmode otherwise)
{
    for (const t_encmode encmode : {ENC_OFF, ENC_OPEN, ENC_RESTRICTED})
        if (g_strcmp0(word, WORDS[encmode][words]) == 0)
            return encmode;
    return otherwise;
}
