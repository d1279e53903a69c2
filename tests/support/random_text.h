// SPDX-License-Identifier: MIT
// Texts for generated records: empty, full, with spaces, with line ends, with bytes that are not
// UTF-8.

#ifndef TESTS_SUPPORT_RANDOM_TEXT_H
#define TESTS_SUPPORT_RANDOM_TEXT_H

#include <random>
#include <string>

#include <glib.h>

// Random numbers below `bound`, the same in every run.
inline unsigned random_number(std::mt19937 &source, unsigned bound)
{
    return static_cast<unsigned>(source() % bound);
}

// A text that fits in a field of `size` bytes.
inline std::string random_text(std::mt19937 &source, unsigned size)
{
    static const char *const kinds[] = {
        "abcXYZ019",      "a b c ",         "  ab\t",       "a\nb\r ", "\xC3\xA9\xE2\x98\x95z",
        "\x80\xFF\xC3 x", "USERCELL KEY\n", "\"$`\\;&|<>%",
    };
    unsigned length = random_number(source, 4) == 0 ? size - 1 : random_number(source, size);
    std::string kind = kinds[random_number(source, G_N_ELEMENTS(kinds))], text;
    if (random_number(source, 8) == 0)
        return "";
    while (text.size() < length)
        text += kind[random_number(source, static_cast<unsigned>(kind.size()))];
    return text;
}

#endif
