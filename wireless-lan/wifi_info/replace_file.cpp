// SPDX-License-Identifier: MIT
#include "wifi_info/replace_file.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

// Functions in this file that return an int return 0 or an errno.

// The file that `path` names once symbolic links are followed, whether it exists or not. For links
// in a cycle the result is a link.
static gchar *resolve_links(const char *path)
{
    gchar *name = g_strdup(path);

    for (int links = 0; links < 40; links++) {
        g_autofree gchar *target = g_file_read_link(name, nullptr);

        if (target == nullptr)
            break;

        g_autofree gchar *link = name;
        g_autofree gchar *directory = g_path_get_dirname(link);

        name = g_path_is_absolute(target) ? g_strdup(target)
                                          : g_build_filename(directory, target, nullptr);
    }
    return name;
}

static int write_all(int fd, const char *content, gsize length)
{
    while (length > 0) {
        gssize written = write(fd, content, length);

        if (written < 0 && errno == EINTR)
            continue;
        if (written < 0)
            return errno;
        content += written;
        length -= static_cast<gsize>(written);
    }
    return 0;
}

// A rename survives a power cut only once the directory is synced.
static void sync_directory(const char *target)
{
    g_autofree gchar *directory = g_path_get_dirname(target);
    int fd = open(directory, O_RDONLY | O_DIRECTORY | O_CLOEXEC);

    if (fd < 0)
        return;
    fsync(fd);
    close(fd);
}

// Writes the temporary file beside the target. `old` is NULL when there are no mode and owner to
// keep. The owner is set first because that can clear bits of the mode.
static int fill(int fd, const struct stat *old, const char *content, gsize length)
{
    if (old != nullptr && fchown(fd, old->st_uid, old->st_gid) != 0)
        return errno;
    if (old != nullptr && fchmod(fd, old->st_mode & 07777) != 0)
        return errno;

    int reason = write_all(fd, content, length);

    if (reason == 0 && fsync(fd) != 0)
        reason = errno;
    return reason;
}

static int write_and_rename(const char *target, const struct stat *old, const char *content,
                            gsize length, replace_error *step)
{
    g_autofree gchar *name = g_strconcat(target, ".XXXXXX", nullptr);
    int fd = g_mkstemp_full(name, O_WRONLY | O_CLOEXEC, 0600);

    *step = fd < 0 ? REPLACE_NOT_OPENED : REPLACE_NOT_WRITTEN;
    if (fd < 0)
        return errno;

    int reason = fill(fd, old, content, length);

    close(fd);
    if (reason == 0 && rename(name, target) != 0)
        reason = errno;
    if (reason == 0)
        sync_directory(target);
    else
        unlink(name);
    return reason;
}

static int overwrite(int fd, const char *content, gsize length)
{
    if (lseek(fd, 0, SEEK_SET) != 0)
        return errno;

    int reason = write_all(fd, content, length);

    if (reason == 0 && (ftruncate(fd, static_cast<off_t>(length)) != 0 || fsync(fd) != 0))
        reason = errno;
    return reason;
}

// Reserves the space before it touches the old content, and restores the old content when the new
// one cannot be written: only a power cut can leave half a file here.
static int write_in_place(const char *target, const char *content, gsize length,
                          replace_error *step)
{
    int fd = open(target, O_RDWR | O_CLOEXEC);

    *step = fd < 0 ? REPLACE_NOT_OPENED : REPLACE_NOT_WRITTEN;
    if (fd < 0)
        return errno;

    g_autofree gchar *old = nullptr;
    gsize old_length = 0;
    int reason = EIO;

    if (g_file_get_contents(target, &old, &old_length, nullptr)) {
        reason = length > 0 ? posix_fallocate(fd, 0, static_cast<off_t>(length)) : 0;
        if (reason == 0)
            reason = overwrite(fd, content, length);
        if (reason != 0)
            overwrite(fd, old, old_length);
        explicit_bzero(old, old_length); // it holds keys
    }
    close(fd);
    return reason;
}

// Whether writing in place can help when renaming failed with `reason`: a directory that is
// read-only or not ours, a target that is a mount point, an owner that cannot be kept.
static gboolean may_write_in_place(int reason)
{
    return reason == EACCES || reason == EPERM || reason == EROFS || reason == EBUSY ||
           reason == EXDEV;
}

// Refuses to replace a directory, a device, or links in a cycle.
static int check_type(mode_t mode)
{
    if (S_ISREG(mode))
        return 0;
    if (S_ISDIR(mode))
        return EISDIR;
    return S_ISLNK(mode) ? ELOOP : ENOTSUP;
}

static gboolean report(const char *path, replace_error step, int reason, GError **error)
{
    if (reason != 0)
        g_set_error(error, REPLACE_ERROR, step, "%s: %s", path, g_strerror(reason));
    return reason == 0;
}

gboolean replace_file(const char *path, const char *content, gsize length, GError **error)
{
    g_autofree gchar *target = resolve_links(path);
    struct stat old;
    gboolean exists = lstat(target, &old) == 0;
    int reason = exists ? check_type(old.st_mode) : errno;
    replace_error step = REPLACE_NOT_OPENED;

    if (reason == 0 || reason == ENOENT)
        reason = write_and_rename(target, exists ? &old : nullptr, content, length, &step);
    if (exists && may_write_in_place(reason))
        reason = write_in_place(target, content, length, &step);
    return report(path, step, reason, error);
}

// Makes `name` a hard link to `target` and replaces what was there.
static int link_over(const char *target, const char *name)
{
    g_autofree gchar *link_name = g_strconcat(name, ".new", nullptr);

    unlink(link_name);
    if (link(target, link_name) != 0)
        return errno;

    const int reason = rename(link_name, name) != 0 ? errno : 0;

    // Renaming one hard link over another of the same file leaves both.
    unlink(link_name);
    return reason;
}

gboolean keep_old_file(const char *path, GError **error)
{
    g_autofree gchar *target = resolve_links(path);
    g_autofree gchar *kept = g_strconcat(target, ".old", nullptr);
    g_autofree gchar *content = nullptr;
    gsize length = 0;
    struct stat old;

    if (lstat(target, &old) != 0)
        return errno == ENOENT || report(path, REPLACE_NOT_OPENED, errno, error);
    if (check_type(old.st_mode) != 0)
        return report(path, REPLACE_NOT_OPENED, check_type(old.st_mode), error);
    if (!g_file_get_contents(target, &content, &length, nullptr))
        return report(kept, REPLACE_NOT_WRITTEN, link_over(target, kept), error);

    const gboolean done = replace_file(kept, content, length, error);

    explicit_bzero(content, length);
    return done;
}
