// SPDX-License-Identifier: MIT
#include "goldens.h"

#include <cstring>

#include <glib.h>

#include "commands.h"

std::vector<golden> goldens(const std::string &directory, const std::string &suffix)
{
    std::vector<golden> found;
    const std::string place = std::string(GOLDENS "/") + directory + "/";
    for (const std::string &name : names_in(place)) {
        if (!g_str_has_suffix(name.c_str(), ".txt"))
            continue;
        const std::string stem = name.substr(0, name.size() - strlen(".txt"));
        found.push_back({stem, place + name, read_file(place + stem + suffix)});
    }
    return found;
}

std::string golden_line(const std::string &label, const std::string &value)
{
    std::string line = label + ": ";
    for (char byte : value) {
        g_autofree gchar *code = g_strdup_printf("\\x%02x", static_cast<guchar>(byte));
        line += g_ascii_isprint(byte) && byte != '\\' ? std::string(1, byte) : code;
    }
    line.resize(line.find_last_not_of(' ') + 1);
    return line + "\n";
}
