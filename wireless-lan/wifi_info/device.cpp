// SPDX-License-Identifier: MIT
#include "wifi_info/device.h"

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstring>

#include <fcntl.h>
#include <glib/gi18n.h>
#include <poll.h>
#include <sys/wait.h>
#include <unistd.h>

#include "wifi_info/shell.h"
#include "wifi_info/text.h"

// The window waits for the answer, so it must come soon.
static const gint64 ANSWER_LIMIT_US = 2 * G_USEC_PER_SEC;
constexpr gsize ADDRESS_LENGTH = 17; // six pairs and five colons
constexpr char REASON_FILE[] = "/run/wireless-lan/reason";
constexpr gsize REASON_SIZE = 256; // of its one line, with the terminator

static const char *device_path = "";

void set_device_path(const char *directory)
{
    const char *path = g_getenv("PATH");

    device_path = directory;
    if (!has_device_path())
        return;

    g_autofree gchar *longer =
        g_strconcat(directory, ":", path != nullptr ? path : "/bin:/usr/bin", nullptr);

    g_setenv("PATH", longer, TRUE);
}

gboolean has_device_path()
{
    return device_path[0] != '\0';
}

// The words that the device's commands leave, see the function "reason" of
// device/linux/wireless-lan.sh. A word may have a detail after it.
static const struct {
    const char *word;
    const char *sentence;
} REASONS[] = {
    {"wrong-key", N_("The access point refuses the key.")},
    {"not-found", N_("The network is out of reach.")},
    {"refused", N_("The access point refuses the connection.")},
    {"rfkill-soft", N_("The radio is switched off and cannot be switched on.")},
    {"rfkill-hard", N_("A switch on the device has turned the radio off.")},
    {"not-root", N_("Only an administrator can set the wireless network up.")},
    {"no-interface", N_("The wireless device is gone.")},
    {"no-driver", N_("The system has no driver for the wireless device.")},
    {"no-answer", N_("The wireless device does not answer.")},
    {"no-scan", N_("The system does not permit a search for networks.")},
    {"no-wep", N_("The system can no longer use WEP keys.")},
    {"no-hosting", N_("The wireless device cannot host a network.")},
    {"no-dhcp", N_("No DHCP client is installed.")},
    {"no-lease", N_("No DHCP server has given an address.")},
    {"bad-name", N_("A network's name has 1 to 32 bytes.")},
    {"bad-wep-key", N_("A WEP key has 5 or 13 characters, or 10 or 26 hexadecimal digits.")},
    {"bad-wpa-key", N_("A WPA key has 8 to 63 characters, or 64 hexadecimal digits.")},
    {"busy", N_("Another command keeps the wireless device busy.")},
    {"missing-tool", N_("A tool is missing and has to be installed:")},
};

gchar *reason_sentence(const char *reason)
{
    const gsize length = strcspn(reason, " ");
    g_autofree gchar *text = displayable(reason);

    for (gchar *byte = text; *byte != '\0'; byte++)
        if (g_ascii_iscntrl(*byte))
            *byte = ' ';
    for (const auto &known : REASONS)
        if (strlen(known.word) == length && strncmp(reason, known.word, length) == 0)
            return g_strconcat(gettext(known.sentence), text + length, nullptr);
    return g_steal_pointer(&text);
}

gchar *device_reason()
{
    char line[REASON_SIZE] = "";

    if (!has_device_path())
        return nullptr;

    FILE *file = fopen(REASON_FILE, "re");

    if (file == nullptr)
        return nullptr;
    if (fgets(line, sizeof line, file) == nullptr)
        line[0] = '\0';
    fclose(file);
    return g_strstrip(line)[0] != '\0' ? reason_sentence(line) : nullptr;
}

// Starts the device's command for one interface without a shell. -1: it could not be started;
// `output` is else the reading end of its standard output.
static pid_t start_command(const char *command, const char *interface, int *output)
{
    g_autofree gchar *path = g_strconcat(device_path, "/", command, nullptr);
    int ends[2];

    if (pipe2(ends, O_CLOEXEC) != 0)
        return -1;

    const pid_t pid = fork();

    if (pid == 0) {
        // A group of its own, so that all that it started can be ended with it.
        setpgid(0, 0);
        dup2(ends[1], STDOUT_FILENO);
        execl(path, path, interface, static_cast<char *>(nullptr));
        _exit(127);
    }
    close(ends[1]);
    if (pid < 0) {
        close(ends[0]);
        return -1;
    }
    setpgid(pid, pid); // here too: either may be first
    *output = ends[0];
    return pid;
}

// Reads until the end, `size` bytes or the limit of time. Returns how many bytes came.
static gsize read_answer(int output, char *answer, gsize size)
{
    const gint64 end = g_get_monotonic_time() + ANSWER_LIMIT_US;
    gsize length = 0;

    while (length < size) {
        const gint64 left = end - g_get_monotonic_time();
        struct pollfd ready = {output, POLLIN, 0};

        if (left <= 0)
            break;

        const int count = poll(&ready, 1, static_cast<int>(left / 1000 + 1));

        if (count < 0 && errno == EINTR)
            continue;
        if (count <= 0)
            break;

        const ssize_t got = read(output, answer + length, size - length);

        if (got < 0 && errno == EINTR)
            continue;
        if (got <= 0)
            break;
        length += static_cast<gsize>(got);
    }
    return length;
}

static gboolean is_address(const char *text, gsize length)
{
    for (gsize i = 0; i < length; i++)
        if (i % 3 == 2 ? text[i] != ':' : !g_ascii_isxdigit(text[i]))
            return FALSE;
    return length == ADDRESS_LENGTH;
}

gboolean ask_ap_address(const char *interface, char *address, gsize size)
{
    char answer[ADDRESS_LENGTH + 2]; // with a line end, and one byte that is too many
    int output = -1;

    if (!has_device_path() || !interface_usable(interface, "its access point"))
        return FALSE;

    const pid_t pid = start_command("ap-address", interface, &output);

    if (pid < 0)
        return FALSE;

    gsize length = read_answer(output, answer, sizeof answer);

    close(output);
    kill(-pid, SIGKILL);
    while (waitpid(pid, nullptr, 0) < 0 && errno == EINTR)
        continue;
    if (length > 0 && answer[length - 1] == '\n')
        length--;
    if (!is_address(answer, length))
        return FALSE;

    g_autofree gchar *upper = g_ascii_strup(answer, static_cast<gssize>(length));

    copy_field(address, size, upper);
    return TRUE;
}
