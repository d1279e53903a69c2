// SPDX-License-Identifier: MIT
#include "wifi_info/debug.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>

void debug_line(const char *format, ...)
{
    char line[sizeof DEBUG_PREFIX + 4000 + sizeof "\n"];
    char *text = g_stpcpy(line, DEBUG_PREFIX);
    va_list arguments;

    va_start(arguments, format);
    vsnprintf(text, 4001, format, arguments);
    va_end(arguments);
    strcat(text, "\n");
    fputs(line, stderr);
}
