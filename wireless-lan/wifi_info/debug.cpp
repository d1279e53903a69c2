// SPDX-License-Identifier: MIT
#include "wifi_info/debug.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>

constexpr gsize PREFIX_LENGTH = sizeof DEBUG_PREFIX - 1;
constexpr gsize TEXT_LIMIT = 4000;
constexpr gsize LINE_SIZE = PREFIX_LENGTH + TEXT_LIMIT + 1;
constexpr gsize BLOCK_SIZE = 4096; // what a pipe takes in one piece

static char lines[BLOCK_SIZE + LINE_SIZE];
static gsize lines_length = 0;
static gboolean collecting = FALSE;

static void write_lines()
{
    fwrite(lines, 1, lines_length, stderr);
    lines_length = 0;
}

void debug_line(const char *format, ...)
{
    char *line = lines + lines_length;
    va_list arguments;

    memcpy(line, DEBUG_PREFIX, PREFIX_LENGTH);
    va_start(arguments, format);

    const int length = vsnprintf(line + PREFIX_LENGTH, TEXT_LIMIT + 1, format, arguments);
    const gsize end =
        PREFIX_LENGTH + static_cast<gsize>(CLAMP(length, 0, static_cast<int>(TEXT_LIMIT)));

    va_end(arguments);
    line[end] = '\n'; // in the place of the terminator: the length is known
    lines_length += end + 1;
    if (!collecting || lines_length > BLOCK_SIZE)
        write_lines();
}

void collect_debug_lines()
{
    collecting = TRUE;
}

void write_debug_lines()
{
    collecting = FALSE;
    write_lines();
}
