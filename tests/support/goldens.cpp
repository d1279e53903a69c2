// SPDX-License-Identifier: MIT
#include "goldens.h"

#include <algorithm>
#include <filesystem>

#include <glib.h>

#include "commands.h"

std::vector<golden> goldens(const std::string &directory, const std::string &suffix)
{
    std::vector<golden> found;
    for (const auto &entry : std::filesystem::directory_iterator(GOLDENS "/" + directory)) {
        std::filesystem::path path = entry.path();
        if (path.extension() == ".txt")
            found.push_back({path.stem(), path, read_file(path.replace_extension(suffix))});
    }
    std::sort(found.begin(), found.end(),
              [](const golden &a, const golden &b) { return a.name < b.name; });
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
