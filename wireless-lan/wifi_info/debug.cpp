// SPDX-License-Identifier: MIT
#include "wifi_info/debug.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>

constexpr gsize TEXT_LIMIT = 4000;

void debug_line(const char *format, ...)
{
    constexpr gsize prefix = sizeof DEBUG_PREFIX - 1;
    char line[prefix + TEXT_LIMIT + 1];
    va_list arguments;

    memcpy(line, DEBUG_PREFIX, prefix);
    va_start(arguments, format);

    const int length = vsnprintf(line + prefix, TEXT_LIMIT + 1, format, arguments);
    const gsize end = prefix + static_cast<gsize>(CLAMP(length, 0, static_cast<int>(TEXT_LIMIT)));

    va_end(arguments);
    line[end] = '\n'; // in the place of the terminator: the length is known
    fwrite(line, 1, end + 1, stderr);
}
