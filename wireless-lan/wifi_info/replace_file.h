// SPDX-License-Identifier: MIT
// Replacing a file in one step.

#ifndef WIFI_INFO_REPLACE_FILE_H
#define WIFI_INFO_REPLACE_FILE_H

#include <glib.h>

#define REPLACE_ERROR g_quark_from_static_string("replace-error")

enum replace_error : int {
    REPLACE_NOT_OPENED, // no file could be opened for the new content
    REPLACE_NOT_WRITTEN // one could, and something failed after that
};

// Replaces the content of `path` by `length` bytes so that a power cut leaves the old or the new
// file. It writes a temporary file beside the target (symbolic links are followed), syncs it and
// renames it over the target. Where renaming is impossible (bind mount, read-only directory) it
// writes in place. A new file gets mode 0600; an existing one keeps mode and owner. FALSE: the old
// file is unchanged, and `error` (domain REPLACE_ERROR, a replace_error as its code; g_error_free
// it) says why.
gboolean replace_file(const char *path, const char *content, gsize length, GError **error);

// Keeps the content of `path` (symbolic links are followed) in the same directory under its name
// with ".old" at the end, in place of an earlier copy. A new file has mode 0600. A file that cannot
// be read is kept as a hard link. TRUE also when there is no file to keep. FALSE: `error` says why.
gboolean keep_old_file(const char *path, GError **error);

#endif
