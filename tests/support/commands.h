// SPDX-License-Identifier: MIT
// Replaces the outside world in unit tests, which are linked with --wrap=system and the like:
// system() only records its command line; popen() records it and starts the real shell, which finds
// the tests' own `cat` and `iwlist` first.

#ifndef TESTS_SUPPORT_COMMANDS_H
#define TESTS_SUPPORT_COMMANDS_H

#include <string>
#include <vector>

extern std::vector<std::string> commands; // "system: LINE", "popen MODE: LINE"
extern bool refuse_pipes;                 // popen fails with EMFILE
extern const char *disconnect_text;       // the translation of "Disconnect", NULL: none

// Runs a command line in the real shell and returns its exit status.
int real_system(const std::string &command);

// Clears `commands`. From now on `cat` and `iwlist` run this shell script.
void set_tool_script(const std::string &script);

// The same, with a script that prints a file.
void set_tool_output(const std::string &file);

// A directory for this test run, removed when the program exits.
const std::string &scratch_directory();

// The same in memory if there is a /dev/shm, for thousands of files that are synced.
const std::string &memory_directory();

void write_file(const std::string &path, const std::string &content);
std::string read_file(const std::string &path); // aborts when it cannot be read

// The names in a directory, sorted; aborts when it cannot be read. Not std::filesystem's iterator:
// GCC 14 leaves a function of it out when both sanitizers are on, and the linker misses it.
std::vector<std::string> names_in(const std::string &directory);

// The open descriptors of this process, each with the name of its file.
std::vector<std::string> open_descriptors();

#endif
