// SPDX-License-Identifier: MIT
#include "commands.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <sstream>

#include <glib.h>
#include <unistd.h>

std::vector<std::string> commands;
bool refuse_pipes = false;
const char *disconnect_text = nullptr;

extern "C" {
int __real_system(const char *command);
FILE *__real_popen(const char *command, const char *mode);

int __wrap_system(const char *command)
{
    commands.push_back(std::string("system: ") + command);
    return 0;
}

FILE *__wrap_popen(const char *command, const char *mode)
{
    commands.push_back(std::string("popen ") + mode + ": " + command);
    if (refuse_pipes) {
        errno = EMFILE;
        return nullptr;
    }
    return __real_popen(command, mode);
}

static char *translate(const char *text)
{
    bool known = disconnect_text && strcmp(text, "Disconnect") == 0;
    return const_cast<char *>(known ? disconnect_text : text);
}

char *__wrap_gettext(const char *text)
{
    return translate(text);
}

// Optimising compilers replace gettext() by this.
char *__wrap_dcgettext(const char *, const char *text, int)
{
    return translate(text);
}
}

int real_system(const std::string &command)
{
    return __real_system(command.c_str());
}

namespace
{
struct temporary_directory {
    std::string path;
    explicit temporary_directory(const std::string &parent)
        : path(parent + "/wireless-lan-unit-XXXXXX")
    {
        if (!mkdtemp(path.data()))
            abort();
    }
    ~temporary_directory()
    {
        std::filesystem::remove_all(path);
    }
};
} // namespace

const std::string &scratch_directory()
{
    static temporary_directory directory("/tmp");
    return directory.path;
}

const std::string &memory_directory()
{
    static temporary_directory directory(access("/dev/shm", W_OK) == 0 ? "/dev/shm" : "/tmp");
    return directory.path;
}

// The tests' own tools come first in PATH.
static std::string tool_directory()
{
    std::string directory = scratch_directory() + "/bin";
    if (std::filesystem::create_directory(directory))
        setenv("PATH", (directory + ":" + getenv("PATH")).c_str(), 1);
    return directory;
}

void set_tool_script(const std::string &script)
{
    commands.clear();
    refuse_pipes = false;
    for (const char *tool : {"/cat", "/iwlist"}) {
        std::string path = tool_directory() + tool;
        write_file(path, "#!/bin/sh\n" + script + "\n");
        std::filesystem::permissions(path, std::filesystem::perms::owner_all);
    }
}

void set_tool_output(const std::string &file)
{
    set_tool_script("exec /bin/cat '" + file + "'");
}

void write_file(const std::string &path, const std::string &content)
{
    std::ofstream file(path, std::ios::binary);
    file << content;
    file.close();
    if (!file)
        abort();
}

std::string read_file(const std::string &path)
{
    std::ifstream file(path, std::ios::binary);
    std::stringstream content;
    content << file.rdbuf();
    if (!file)
        abort();
    return content.str();
}

std::vector<std::string> names_in(const std::string &directory)
{
    std::vector<std::string> found;
    g_autoptr(GDir) entries = g_dir_open(directory.c_str(), 0, nullptr);
    if (!entries)
        abort();
    while (const gchar *name = g_dir_read_name(entries))
        found.push_back(name);
    std::sort(found.begin(), found.end());
    return found;
}

std::vector<std::string> open_descriptors()
{
    std::vector<std::string> found;
    for (const std::string &number : names_in("/proc/self/fd")) {
        g_autofree gchar *target = g_file_read_link(("/proc/self/fd/" + number).c_str(), nullptr);
        if (target && !strstr(target, "/proc/"))
            found.push_back(number + " " + target);
    }
    return found;
}
