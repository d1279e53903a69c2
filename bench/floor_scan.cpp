// SPDX-License-Identifier: MIT
#include "floor_scan.h"

#include <cstdio>
#include <cstring>

gboolean read_interface_name(char (&name)[16])
{
    FILE *pipe = popen("cat /proc/net/wireless", "re");
    char line[256];
    int number = 0;

    name[0] = '\0';
    if (pipe == nullptr)
        return FALSE;
    while (fgets(line, sizeof line, pipe) != nullptr)
        if (++number == 3)
            sscanf(line, " %15[^:]", name);
    pclose(pipe);
    return name[0] != '\0';
}

static void take_word(const char *line, const char *keyword, const char *ends, char (&text)[64])
{
    const char *start = strstr(line, keyword);

    if (start == nullptr)
        return;
    start += strlen(keyword);

    const gsize length = MIN(strcspn(start, ends), sizeof text - 1);

    memcpy(text, start, length);
    text[length] = '\0';
}

int read_scan(const char *name, floor_row (&rows)[FLOOR_ROWS])
{
    char command[64];
    char line[512];
    int count = 0;

    g_snprintf(command, sizeof command, "iwlist %s scan", name);

    FILE *pipe = popen(command, "re");

    if (pipe == nullptr)
        return 0;
    while (fgets(line, sizeof line, pipe) != nullptr) {
        if (strstr(line, "Cell") != nullptr) {
            if (count == FLOOR_ROWS)
                break;
            memset(&rows[count], 0, sizeof rows[count]);
            strcpy(rows[count].texts[4], "Disconnect");
            count++;
        } else if (count > 0) {
            floor_row &row = rows[count - 1];

            take_word(line, "ESSID:\"", "\"", row.texts[0]);
            take_word(line, "Mode:", "\n", row.texts[1]);
            take_word(line, "Encryption key:", "\n", row.texts[2]);
            take_word(line, "Quality:", " \n", row.texts[3]);
        }
    }
    pclose(pipe);
    return count;
}

void fill_rows(GtkListStore *store, const floor_row *rows, int count)
{
    gtk_list_store_clear(store);
    for (int i = 0; i < count; i++)
        gtk_list_store_insert_with_values(store, nullptr, -1, 0, rows[i].texts[0], 1,
                                          rows[i].texts[1], 2, rows[i].texts[2], 3,
                                          rows[i].texts[3], 4, rows[i].texts[4], -1);
}
