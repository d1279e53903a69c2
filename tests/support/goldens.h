// SPDX-License-Identifier: MIT
// The inputs of tests/goldens and the records expected from them.

#ifndef TESTS_SUPPORT_GOLDENS_H
#define TESTS_SUPPORT_GOLDENS_H

#include <string>
#include <vector>

struct golden {
    std::string name, input, expected; // `input` is a path, `expected` the text of the records
};

// The goldens of a directory ("scan"); their records are in files with a suffix (".cells").
std::vector<golden> goldens(const std::string &directory, const std::string &suffix);

// A line "LABEL: VALUE\n" as in the files of records.
std::string golden_line(const std::string &label, const std::string &value);

#endif
