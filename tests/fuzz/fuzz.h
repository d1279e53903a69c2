// SPDX-License-Identifier: MIT
// What the fuzz targets share: the input as a stream or a file, and a check that aborts.

#ifndef TESTS_FUZZ_FUZZ_H
#define TESTS_FUZZ_FUZZ_H

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>

#include <unistd.h>

// Called by libFuzzer, or by the replay program, with one input.
extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size);

#define CHECK(condition)                                                                           \
    do {                                                                                           \
        if (!(condition)) {                                                                        \
            fprintf(stderr, "%s:%d: %s\n", __FILE__, __LINE__, #condition);                        \
            fflush(stderr);                                                                        \
            abort();                                                                               \
        }                                                                                          \
    } while (0)

inline std::string input_text(const uint8_t *data, size_t size)
{
    return std::string(reinterpret_cast<const char *>(data), size);
}

// A stream that reads `text`, which must outlive it.
inline FILE *open_input(const std::string &text)
{
    FILE *stream = fmemopen(const_cast<char *>(text.data()), text.size(), "r");
    CHECK(stream != nullptr);
    return stream;
}

// The path of an in-memory file of this process.
inline std::string scratch_path()
{
    return "/dev/shm/wireless-lan-fuzz-" + std::to_string(getpid());
}

// A file with the content `text`.
inline std::string write_scratch(const std::string &text)
{
    std::string path = scratch_path();
    FILE *file = fopen(path.c_str(), "w");
    CHECK(file && fwrite(text.data(), 1, text.size(), file) == text.size() && fclose(file) == 0);
    return path;
}

inline std::string read_scratch()
{
    std::string text, path = scratch_path();
    char buffer[4096];
    FILE *file = fopen(path.c_str(), "r");
    CHECK(file);
    for (size_t got; (got = fread(buffer, 1, sizeof buffer, file)) > 0;)
        text.append(buffer, got);
    fclose(file);
    return text;
}

#endif
