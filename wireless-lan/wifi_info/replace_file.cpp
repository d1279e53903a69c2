#include <cerrno>
#include <cstdio>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <glib/gstdio.h>

#include "wifi.h"

// A function here that returns FALSE leaves the reason in errno.

// What `path` names behind symbolic links, whether it exists or not; a link when they go in
// circles.
static gchar *resolve_links(const char *path)
{
    gchar *name = g_strdup(path);
    for (int links = 0; links < 40; links++) {
        g_autofree gchar *target = g_file_read_link(name, nullptr);
        if (!target)
            break;
        g_autofree gchar *link = name;
        g_autofree gchar *folder = g_path_get_dirname(link);
        name = g_path_is_absolute(target) ? g_strdup(target)
                                          : g_build_filename(folder, target, nullptr);
    }
    return name;
}

static gboolean write_all(int fd, const char *content, gsize length)
{
    while (length > 0) {
        gssize written = write(fd, content, length);
        if (written < 0 && errno == EINTR)
            continue;
        if (written < 0)
            return FALSE;
        content += written;
        length -= static_cast<gsize>(written);
    }
    return TRUE;
}

static void close_quietly(int fd)
{
    int reason = errno;
    close(fd);
    errno = reason;
}

// The new name itself is on the disk only once the folder is.
static void sync_folder(const char *target)
{
    g_autofree gchar *folder = g_path_get_dirname(target);
    int fd = open(folder, O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (fd < 0)
        return;
    fsync(fd);
    close(fd);
}

// `old` is NULL when there is no file to take mode and owner from. A change of owner can clear mode
// bits, so it comes first.
static gboolean write_and_rename(const char *target, const struct stat *old, const char *content,
                                 gsize length)
{
    g_autofree gchar *name = g_strconcat(target, ".XXXXXX", nullptr);
    int fd = g_mkstemp_full(name, O_WRONLY | O_CLOEXEC, 0600);
    if (fd < 0)
        return FALSE;
    gboolean done = (!old || fchown(fd, old->st_uid, old->st_gid) == 0) &&
                    (!old || fchmod(fd, old->st_mode & 07777) == 0) &&
                    write_all(fd, content, length) && fsync(fd) == 0;
    close_quietly(fd);
    if (!done || rename(name, target) != 0) {
        int reason = errno;
        unlink(name);
        errno = reason;
        return FALSE;
    }
    sync_folder(target);
    return TRUE;
}

// Makes room for `length` bytes; the file is as before when there is none.
static gboolean reserve(int fd, gsize length)
{
    struct stat old;
    if (fstat(fd, &old) != 0)
        return FALSE;
    int reason = length > 0 ? posix_fallocate(fd, 0, static_cast<off_t>(length)) : 0;
    if (reason != 0 && ftruncate(fd, old.st_size) == 0)
        errno = reason;
    return reason == 0;
}

// The room is reserved before a byte of the old content goes, so that a full disk keeps it.
static gboolean write_in_place(const char *target, const char *content, gsize length)
{
    int fd = open(target, O_RDWR | O_CLOEXEC);
    if (fd < 0)
        return FALSE;
    gboolean done = reserve(fd, length) && write_all(fd, content, length) &&
                    ftruncate(fd, static_cast<off_t>(length)) == 0 && fsync(fd) == 0;
    close_quietly(fd);
    return done;
}

// Whether a file can still be written in place when renaming over it failed for this reason: a
// folder that is read-only or not ours, a file that is a mount point, an owner that cannot be kept.
static gboolean may_write_in_place(int reason)
{
    return reason == EACCES || reason == EPERM || reason == EROFS || reason == EBUSY ||
           reason == EXDEV;
}

gboolean replace_file(const char *path, const char *content, gsize length, GError **error)
{
    g_autofree gchar *target = resolve_links(path);
    struct stat old;
    gboolean exists = lstat(target, &old) == 0;
    gboolean renamable = !exists || S_ISREG(old.st_mode); // never put a file in a device's place
    gboolean done = renamable && write_and_rename(target, exists ? &old : nullptr, content, length);
    if (!done && exists && (!renamable || may_write_in_place(errno)))
        done = write_in_place(target, content, length);
    if (!done) {
        int reason = errno;
        g_set_error(error, G_FILE_ERROR, g_file_error_from_errno(reason), "%s: %s", path,
                    g_strerror(reason));
    }
    return done;
}
