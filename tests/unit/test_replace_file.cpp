// SPDX-License-Identifier: MIT
// tests/save/ covers kills, full disks, mounts and foreign owners.

#include <gtest/gtest.h>

#include <filesystem>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "support/commands.h"
#include "wifi_info/replace_file.h"

namespace fs = std::filesystem;

class ReplaceFile : public testing::Test
{
protected:
    std::string directory = scratch_directory() + "/replace", file = directory + "/conf";
    std::string cause; // of a failure

    void SetUp() override
    {
        fs::create_directory(directory);
    }
    void TearDown() override
    {
        fs::remove_all(directory);
    }
    gboolean replace(const std::string &path, const std::string &content)
    {
        g_autoptr(GError) error = nullptr;
        gboolean done = replace_file(path.c_str(), content.data(), content.size(), &error);
        EXPECT_EQ(done, error == nullptr);
        cause = error ? error->message : "";
        return done;
    }
    static mode_t mode_of(const std::string &path)
    {
        struct stat status;
        EXPECT_EQ(stat(path.c_str(), &status), 0);
        return status.st_mode & 07777;
    }
    gsize entries()
    {
        return names_in(directory).size();
    }
};

TEST_F(ReplaceFile, MakesANewFilePrivate)
{
    mode_t former = umask(0);
    EXPECT_TRUE(replace(file, "content"));
    umask(former);
    EXPECT_EQ(read_file(file), "content");
    EXPECT_EQ(mode_of(file), 0600u);
    EXPECT_EQ(entries(), 1u);
}

TEST_F(ReplaceFile, ReplacesAnyContentWhole)
{
    for (const std::string &content :
         {std::string(), std::string("short"), std::string(1000000, 'x'), std::string("a\0b", 3)}) {
        EXPECT_TRUE(replace(file, content));
        EXPECT_EQ(read_file(file), content);
    }
    EXPECT_EQ(entries(), 1u);
}

TEST_F(ReplaceFile, KeepsTheMode)
{
    for (mode_t mode : {0644, 0600, 0400, 0666, 0755, 04750}) {
        // The kernel takes this bit off when anybody but root writes.
        if ((mode & S_ISUID) != 0 && geteuid() != 0)
            continue;
        write_file(file, "old");
        chmod(file.c_str(), mode);
        EXPECT_TRUE(replace(file, "new"));
        EXPECT_EQ(mode_of(file), mode);
        fs::remove(file);
    }
}

TEST_F(ReplaceFile, FollowsLinks)
{
    fs::create_directory(directory + "/real");
    write_file(directory + "/real/target", "old");
    fs::create_symlink("real/target", directory + "/relative");
    fs::create_symlink(directory + "/real/target", directory + "/absolute");
    fs::create_symlink("relative", directory + "/twice");
    fs::create_directory_symlink("real", directory + "/by-directory");
    for (const char *name : {"/relative", "/absolute", "/twice", "/by-directory/target"}) {
        EXPECT_TRUE(replace(directory + name, name));
        EXPECT_EQ(read_file(directory + "/real/target"), name);
    }
    EXPECT_TRUE(fs::is_symlink(directory + "/relative"));
    EXPECT_TRUE(fs::is_symlink(directory + "/absolute"));
    EXPECT_TRUE(fs::is_symlink(directory + "/twice"));
    EXPECT_EQ(entries(), 5u);
}

TEST_F(ReplaceFile, MakesTheFileThatALinkLeadsTo)
{
    fs::create_symlink("later", file);
    EXPECT_TRUE(replace(file, "content"));
    EXPECT_TRUE(fs::is_symlink(file));
    EXPECT_EQ(read_file(directory + "/later"), "content");
    EXPECT_EQ(mode_of(directory + "/later"), 0600u);
}

TEST_F(ReplaceFile, FailsOnLinksInACircle)
{
    fs::create_symlink("conf", directory + "/other");
    fs::create_symlink("other", file);
    EXPECT_FALSE(replace(file, "content"));
    EXPECT_EQ(cause, file + ": Too many levels of symbolic links");
    EXPECT_TRUE(fs::is_symlink(file));
    EXPECT_EQ(entries(), 2u);
}

TEST_F(ReplaceFile, SaysWhyItFails)
{
    EXPECT_FALSE(replace(directory, "content"));
    EXPECT_EQ(cause, directory + ": Is a directory");
    EXPECT_FALSE(replace(directory + "/missing/conf", "content"));
    EXPECT_EQ(cause, directory + "/missing/conf: No such file or directory");
    write_file(file, "old");
    EXPECT_FALSE(replace(file + "/conf", "content"));
    EXPECT_EQ(cause, file + "/conf: Not a directory");
    std::string longest = directory + "/" + std::string(300, 'n');
    EXPECT_FALSE(replace(longest, "content"));
    EXPECT_EQ(cause, longest + ": File name too long");
    EXPECT_EQ(entries(), 1u);
}

TEST_F(ReplaceFile, TellsWhetherAFileCouldBeOpened)
{
    g_autoptr(GError) error = nullptr;
    EXPECT_FALSE(replace_file((directory + "/missing/conf").c_str(), "", 0, &error));
    EXPECT_TRUE(g_error_matches(error, REPLACE_ERROR, REPLACE_NOT_OPENED));
    g_clear_error(&error);
    EXPECT_FALSE(replace_file(directory.c_str(), "", 0, &error));
    EXPECT_TRUE(g_error_matches(error, REPLACE_ERROR, REPLACE_NOT_OPENED));
}

TEST_F(ReplaceFile, KeepsTheOldOneBesideIt)
{
    EXPECT_TRUE(keep_old_file(file.c_str(), nullptr));
    EXPECT_EQ(entries(), 0u);
    for (const char *content : {"first", "second"}) {
        write_file(file, content);
        chmod(file.c_str(), 0644);
        EXPECT_TRUE(keep_old_file(file.c_str(), nullptr));
        EXPECT_TRUE(replace(file, "new"));
        EXPECT_EQ(read_file(file + ".old"), content);
        EXPECT_EQ(mode_of(file + ".old"), 0600u);
        EXPECT_EQ(read_file(file), "new");
    }
    EXPECT_EQ(entries(), 2u);
}

TEST_F(ReplaceFile, KeepsItWhereALinkLeads)
{
    fs::create_directory(directory + "/real");
    write_file(directory + "/real/target", "old");
    fs::create_symlink("real/target", file);
    EXPECT_TRUE(keep_old_file(file.c_str(), nullptr));
    EXPECT_EQ(read_file(directory + "/real/target.old"), "old");
    EXPECT_EQ(entries(), 2u);
}

TEST_F(ReplaceFile, SaysWhyNothingIsKept)
{
    g_autoptr(GError) error = nullptr;
    EXPECT_FALSE(keep_old_file(directory.c_str(), &error));
    EXPECT_EQ(error->message, directory + ": Is a directory");
    g_clear_error(&error);
    write_file(file, "old");
    fs::create_directory(file + ".old");
    EXPECT_FALSE(keep_old_file(file.c_str(), &error));
    EXPECT_EQ(error->message, file + ".old: Is a directory");
    EXPECT_EQ(read_file(file), "old");
}

TEST_F(ReplaceFile, LeavesADeviceADevice)
{
    fs::create_symlink("/dev/null", file);
    EXPECT_FALSE(replace(file, "content"));
    EXPECT_TRUE(fs::is_character_file("/dev/null"));
    std::string pipe = directory + "/pipe";
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    EXPECT_FALSE(replace(pipe, "content"));
    EXPECT_TRUE(fs::is_fifo(pipe));
}

TEST_F(ReplaceFile, LeavesNoDescriptorOpen)
{
    std::vector<std::string> before = open_descriptors();
    replace(file, "content");
    replace(directory, "content");
    replace(directory + "/missing/conf", "content");
    EXPECT_EQ(open_descriptors(), before);
}
