// SPDX-License-Identifier: MIT
// What stands in for the outside world in the unit tests. They are linked with --wrap=system and
// its like: system() only notes its command line, popen() notes it and starts the real shell, which
// finds our own `cat` and `iwlist` first.

#ifndef TESTS_SUPPORT_COMMANDS_H
#define TESTS_SUPPORT_COMMANDS_H

#include <string>
#include <vector>

extern std::vector<std::string> commands; // "system: LINE", "popen MODE: LINE"
extern bool refuse_pipes;                 // popen fails with EMFILE
extern const char *disconnect_text;       // the translation of "Disconnect", NULL: none

// Runs a command line in the real shell and returns its status.
int real_system(const std::string &command);

// Forgets the commands; `cat` and `iwlist` run this shell script from now on.
void set_tool_script(const std::string &script);

// The same with a script that prints a file.
void set_tool_output(const std::string &file);

// A folder of this test run, removed when the program ends.
const std::string &scratch_folder();

// The same in memory where there is a /dev/shm: for thousands of files that are synced.
const std::string &memory_folder();

void write_file(const std::string &path, const std::string &content);
std::string read_file(const std::string &path); // aborts when it cannot be read

// The open descriptors of this process, each with what it is open on.
std::vector<std::string> open_descriptors();

#endif
