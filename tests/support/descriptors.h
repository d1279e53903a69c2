// SPDX-License-Identifier: MIT
// Counting the descriptors of the test itself, for functions that must not leave one open.

#ifndef TESTS_CONNECTION_DESCRIPTORS_H
#define TESTS_CONNECTION_DESCRIPTORS_H

#include <cstddef>

#include <dirent.h>

inline size_t open_descriptors()
{
    size_t count = 0;
    DIR *directory = opendir("/proc/self/fd");

    while (readdir(directory) != nullptr)
        count++;
    closedir(directory);
    return count;
}

#endif
