// SPDX-License-Identifier: MIT
// Runs a fuzz target on every file of the given directories, so that the corpus serves as a plain
// test.

#include <glib.h>

#include "fuzz.h"

int main(int argc, char **argv)
{
    int inputs = 0;
    for (int i = 1; i < argc; i++) {
        g_autoptr(GDir) directory = g_dir_open(argv[i], 0, nullptr);
        CHECK(directory != nullptr);
        while (const gchar *name = g_dir_read_name(directory)) {
            g_autofree gchar *path = g_build_filename(argv[i], name, nullptr);
            g_autofree gchar *content = nullptr;
            gsize length;
            CHECK(g_file_get_contents(path, &content, &length, nullptr));
            LLVMFuzzerTestOneInput(reinterpret_cast<const uint8_t *>(content), length);
            inputs++;
        }
    }
    unlink(scratch_path().c_str());
    printf("%d inputs replayed\n", inputs);
    return inputs > 0 ? 0 : 1;
}
