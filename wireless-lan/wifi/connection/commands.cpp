// SPDX-License-Identifier: MIT
#include "connection/commands.h"

#include <cerrno>
#include <cstdio>

#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "base/state.h"
#include "connection/interface_state.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/encryption.h"
#include "wifi_info/shell.h"
#include "wifi_info/text.h"

constexpr char ESSID_FILE[] = "/tmp/essid_tmp";
constexpr char KEY_FILE[] = "/tmp/key_tmp";

const char *client_mode(const char *mode)
{
    return g_ascii_strcasecmp(mode, "Master") == 0 ? "Managed" : mode;
}

const char *key_word(const WIFI_CELL *cell)
{
    return cell->userkey[0] == '\0' ? "off" : cell->userkey;
}

gchar *iwset_command(const char *name, const WIFI_CELL *cell)
{
    g_autofree gchar *essid = shell_escape(cell->essid);
    g_autofree gchar *mode = shell_escape(client_mode(cell->mode));
    WIPED gchar *key = shell_escape(key_word(cell));
    const char *enc = encryption_word(cell->encmode, FILE_WORDS);

    if (cell->key_mgmt == 0)
        return g_strdup_printf("/sbin/iwset \"%s\" essid \"%s\" mode \"%s\" key \"%s\" enc \"%s\""
                               " \"[%d]\"",
                               name, essid, mode, key, enc, static_cast<int>(cell->key_index + 1));
    // The two spaces are part of the format.
    return g_strdup_printf("/sbin/iwset  wpa \"%s\" essid \"%s\" mode \"%s\" key \"%s\" enc \"%s\"",
                           name, essid, mode, key, enc);
}

// Another user can make the name again at any time, but not for ever between two of our calls.
static const int MAX_TRIES = 100;

static gboolean is_ours(const char *path)
{
    struct stat status;

    return lstat(path, &status) == 0 && S_ISREG(status.st_mode) && status.st_uid == geteuid();
}

// Puts a new empty file of ours in the place of whatever has the name. A directory stays. mknod
// makes a plain file as open with O_EXCL does, and needs no descriptor.
static gboolean make_anew(const char *path, guint mode)
{
    int reason = EEXIST;

    for (int i = 0; i < MAX_TRIES && reason == EEXIST; i++) {
        unlink(path);
        reason = mknod(path, S_IFREG | mode, 0) != 0 ? errno : 0;
    }
    errno = reason;
    return reason == 0;
}

// The command line that leaves `text`, in one line, in the file `path`. g_free it.
static gchar *leaving_command(const char *text, const char *path)
{
    WIPED gchar *line = one_line(text);

    return echo_command(line, path);
}

static gboolean leave_for_scripts(const char *command, const char *path, guint mode)
{
    if (!make_anew(path, mode)) {
        debug_line("%s is not written: %s", path, g_strerror(errno));
        return FALSE;
    }
    run_command(command);
    if (is_ours(path))
        return TRUE;
    debug_line("%s is not written: %s", path, g_strerror(EPERM));
    return FALSE;
}

gboolean leave_text_for_scripts(const char *text, const char *path, guint mode)
{
    WIPED gchar *command = leaving_command(text, path);

    return leave_for_scripts(command, path, mode);
}

// Name and key belong together: both files are there and ours, or neither is.
static gboolean leave_name_and_key(const WIFI_CELL *cell)
{
    if (leave_text_for_scripts(cell->essid, ESSID_FILE, 0666) &&
        leave_text_for_scripts(key_word(cell), KEY_FILE, 0600) && is_ours(ESSID_FILE))
        return TRUE;
    unlink(ESSID_FILE);
    unlink(KEY_FILE);
    return FALSE;
}

gboolean apply_configuration()
{
    const WIFI_INTERFACE *iface = first_interface();
    const WIFI_CELL *cell = scanned_cell(connect_index);

    if (my_wifi->interface_count <= 0 || iface == nullptr || cell == nullptr)
        return TRUE;
    if (!interface_usable(iface->name, "joining the network"))
        return TRUE;

    bring_interface_up(iface->name);
    clear_address(iface->name);

    g_autofree gchar *essid = printable(cell->essid);
    WIPED gchar *command = iwset_command(iface->name, cell);
    WIPED gchar *shown = printable(command);

    debug_line("essid to set:%s", essid);
    debug_line("interface:%s", iface->name);
    if (cell->key_mgmt == 0)
        printf("iwset cmd=%s\r\n", shown);
    else
        printf("wpa_supplicant cmd=%s\r\n", shown);
    if (!leave_name_and_key(cell))
        return FALSE;
    run_command(command);
    return TRUE;
}

gboolean host_network(const WIFI_INTERFACE *iface)
{
    const WIFI_CELL *group = &iface->wifi_group;

    if (!interface_usable(iface->name, "hosting the Ad-Hoc network"))
        return TRUE;

    g_autofree gchar *up = g_strdup_printf("ifconfig %s up", iface->name);
    g_autofree gchar *essid = shell_escape(group->essid);
    // The device hosts an open network; the key is stored but not used.
    g_autofree gchar *iwset = g_strdup_printf(
        "/sbin/iwset \"%s\" essid \"%s\" mode \"%s\" key \"%s\" enc \"%s\"", iface->name, essid,
        "Ad-Hoc", "off", encryption_word(group->encmode, FILE_WORDS));
    g_autofree gchar *echo = leaving_command(group->essid, ESSID_FILE);
    g_autofree gchar *shown_echo = printable(echo);
    g_autofree gchar *shown_iwset = printable(iwset);

    run_command(up);
    printf("essid_buf = %s \n", shown_echo);
    if (!leave_for_scripts(echo, ESSID_FILE, 0666)) {
        unlink(ESSID_FILE);
        return FALSE;
    }
    printf("cmd=%s\r\n", shown_iwset);
    run_command(iwset);
    return TRUE;
}

gboolean require_ip_address()
{
    const WIFI_INTERFACE *iface = first_interface();

    if (iface == nullptr || !interface_usable(iface->name, "requiring an address"))
        return FALSE;

    const pid_t child = fork();

    if (child == 0) {
        // The child exits at once, so init adopts the script and reaps it.
        if (fork() == 0)
            execl("/sbin/lnk-ifup", "lnk-ifup", iface->name, nullptr);
        // Not exit(), which would print the parent's buffered output a second time.
        _exit(0);
    }
    if (child < 0)
        debug_line("fork PID %d error %d", child, errno);

    const pid_t reaped = child > 0 ? waitpid(child, nullptr, 0) : -1;

    debug_line("wait fPID=%d,exPID=%d", child, reaped);
    return FALSE;
}

void leave_network()
{
    const WIFI_INTERFACE *iface = first_interface();

    if (iface == nullptr || !interface_usable(iface->name, "leaving the network"))
        return;

    g_autofree gchar *command = g_strdup_printf("/sbin/lnk-ifdown %s", iface->name);

    run_command(command);
}
