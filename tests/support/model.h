// SPDX-License-Identifier: MIT
// The expected results of the readers, computed in a second way: from lists of lines and from
// pieces of std::string instead of a stream, so that both agree only when they are right.

#ifndef TESTS_SUPPORT_MODEL_H
#define TESTS_SUPPORT_MODEL_H

#include <string>
#include <vector>

namespace model
{

// The lines of a text as fgets reads them into a buffer of `size` bytes, as C strings.
std::vector<std::string> lines(const std::string &text, size_t size);

// The part of a text that a field of `size` bytes holds.
std::string cut(const std::string &text, size_t size);

std::string trim(const std::string &text);

// The pieces between separators; at least one.
std::vector<std::string> split(const std::string &text, const std::string &separator);

// The second word (words are separated by white space), as a field of `size` bytes holds it.
std::string second_word(const std::string &text, size_t size);

// The words of a simple command and the file after ">", as a POSIX shell reads them. False for a
// command with anything else in it: an expansion, a second command, an open quote.
bool shell_words(const std::string &command, std::vector<std::string> *words, std::string *file);

struct interfaces {
    int count;
    std::vector<std::string> names; // of all filled slots
};
interfaces read_interfaces(const std::string &text);

struct cell {
    std::string address, essid, mode, channel, quality, key;
    unsigned encmode;
    bool operator==(const cell &other) const;
};
// `printed`, if given, receives the text for standard error.
std::vector<cell> read_cells(const std::string &text, std::string *printed = nullptr);

struct preferred {
    std::string alias, essid, mode, userkey;
    unsigned key_mgmt, key_index, encmode;
    bool operator==(const preferred &other) const;
};
std::vector<preferred> read_preferred(const std::string &text);
std::string write_preferred(const std::vector<preferred> &networks);

struct basic {
    int isdhcp, isstatic, auto_dns, wifi_group_enable;
    std::string essid, mode, userkey;
    unsigned encmode;
    std::string address, netmask, broadcast, gateway;
    bool operator==(const basic &other) const;
};
basic read_basic(const std::string &text, const std::string &name, basic before);
basic read_basic_advanced(const std::string &text, const std::string &name, basic before);
std::string write_basic(const std::string &name, const basic &settings);

// The value, or "" for none; `found` is false for NULL.
std::string file_var(const std::string &text, const std::string &var, bool *found);

} // namespace model

// The records of my_wifi in the form of the model.
std::vector<model::cell> scanned_cells();
std::vector<model::preferred> preferred_networks();
model::basic basic_settings();

#endif
