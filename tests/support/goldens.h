// SPDX-License-Identifier: MIT
// The inputs of tests/goldens with the records that stand beside them.

#ifndef TESTS_SUPPORT_GOLDENS_H
#define TESTS_SUPPORT_GOLDENS_H

#include <string>
#include <vector>

struct golden {
    std::string name, input, expected; // `input` is a path, `expected` a content
};

// Those of a folder ("scan"), whose records stand in files with a suffix (".cells").
std::vector<golden> goldens(const std::string &folder, const std::string &suffix);

// "LABEL: VALUE\n" as the files of records have it.
std::string golden_line(const std::string &label, const std::string &value);

#endif
