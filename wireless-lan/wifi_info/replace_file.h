// Replacing a file as a whole.

#ifndef WIFI_INFO_REPLACE_FILE_H
#define WIFI_INFO_REPLACE_FILE_H

#include <glib.h>

// Replaces the content of `path` by `length` bytes so that a power cut leaves the old or the new
// file: a temporary file beside the target (behind symbolic links) is written, synced and renamed
// over it; where that is impossible (bind mount, read-only folder) the file is written in place. A
// new file gets mode 0600, an existing one keeps mode and owner. FALSE: the old file stands and
// `error` (g_error_free it) says why.
gboolean replace_file(const char *path, const char *content, gsize length, GError **error);

#endif
