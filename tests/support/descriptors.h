// SPDX-License-Identifier: MIT
// Descriptors of the test itself, for those that must not leave one behind.

#ifndef TESTS_CONNECTION_DESCRIPTORS_H
#define TESTS_CONNECTION_DESCRIPTORS_H

#include <cstddef>

#include <dirent.h>

inline size_t open_descriptors()
{
    size_t count = 0;
    DIR *folder = opendir("/proc/self/fd");

    while (readdir(folder) != nullptr)
        count++;
    closedir(folder);
    return count;
}

#endif
