// The state model that the two units share: records, enumerations, limits, the shared globals and
// what the unit wifi_info offers. No widget code stands behind this header.

#ifndef WIRELESS_LAN_WIFI_H
#define WIRELESS_LAN_WIFI_H

#include <cstddef>
#include <type_traits>

#include <glib.h>

constexpr int MAX_INTERFACES = 16;
constexpr int MAX_CELLS = 128;
constexpr int MAX_USER_CELLS = 64;
constexpr gsize STATUS_TEXT_SIZE = 128; // a status text with its terminator

enum t_wifimode : guint32 { MODE_MANAGED = 0, MODE_ADHOC = 1 };

// A scan stores ENC_OPEN for a network that uses a key, whatever its authentication.
enum t_encmode : guint32 { ENC_OFF = 0, ENC_OPEN = 1, ENC_RESTRICTED = 2 };

struct iw_statics {
    gint32 status;
    gint32 quality;
    gint32 level;
    gint32 noise;
};

// One wireless network: a scan result, a preferred network, or the network that the device hosts.
// Numbers that tools print are kept as the text that they printed.
struct _WIFI_CELL {
    char address[32]; // of the access point, six hexadecimal pairs
    char essid[128];  // bytes, not necessarily UTF-8
    char mode[16];
    t_encmode encmode;
    char channel[40]; // the frequency figure, as in "2.437"
    char key[4];      // "on" or "off": whether the network wants a key
    char userkey[128];
    char surpport_rates[128];
    char bit_rates[8];
    char quality[16];
    char signal_level[16];
    char noise_level[16];
    char state[128]; // text of the list's "State" column
    char alias[128];
    gint32 linkstate;  // 1: the interface is associated with this network, 2: it is not
    guint32 key_mgmt;  // 0: WEP, 1: WPA
    guint32 key_index; // of the WEP key, from 0
};
typedef struct _WIFI_CELL WIFI_CELL;

struct _WIFI_INTERFACE {
    char name[16];
    char type[16];
    char essid[128];
    t_wifimode mode;
    t_encmode encmode;
    char channel[4];
    char key[32];
    char quality[8];
    char key1[128];
    char address[32]; // current IPv4 address as dotted text, empty: none
    char netmask[32];
    char broadcast[32];
    char gateway[32];
    gboolean isdhcp;
    gboolean isstatic;
    gboolean UP;
    gboolean RUNNING;
    gboolean auto_dns;
    iw_statics stats;
    gboolean wifi_group_enable; // the device hosts an Ad-Hoc network: nothing is scanned
    WIFI_CELL wifi_group;       // that network
};
typedef struct _WIFI_INTERFACE WIFI_INTERFACE;

struct _GtkWidget;

struct _MY_WIFI {
    int interface_index;
    int interface_count; // -1: the kernel's list had no header line
    WIFI_INTERFACE *wifi_interface[MAX_INTERFACES];
    int cell_index; // the selected network, -1: none
    int cell_count;
    int user_cell_count;
    int user_cell_index; // the selected row of the preferred networks, negative: none
    WIFI_CELL *wifi_cell[MAX_CELLS];
    WIFI_CELL *user_wifi_cell[MAX_USER_CELLS];
    struct _GtkWidget *wifi_view;
    struct _GtkWidget *wifi_combo;
    int cell_type;
};
typedef struct _MY_WIFI MY_WIFI;

// The records come from g_malloc0 and are copied as bytes; outside programs' headers of the same
// records fix order and width.
static_assert(std::is_trivial<MY_WIFI>::value && std::is_standard_layout<MY_WIFI>::value);
static_assert(std::is_trivial<WIFI_INTERFACE>::value && std::is_trivial<WIFI_CELL>::value);
static_assert(sizeof(iw_statics) == 16 && sizeof(gboolean) == 4);
static_assert(offsetof(WIFI_CELL, essid) == 32 && offsetof(WIFI_CELL, mode) == 160);
static_assert(offsetof(WIFI_CELL, encmode) == 176 && offsetof(WIFI_CELL, channel) == 180);
static_assert(offsetof(WIFI_CELL, key) == 220 && offsetof(WIFI_CELL, userkey) == 224);
static_assert(offsetof(WIFI_CELL, surpport_rates) == 352 && offsetof(WIFI_CELL, bit_rates) == 480);
static_assert(offsetof(WIFI_CELL, quality) == 488 && offsetof(WIFI_CELL, signal_level) == 504);
static_assert(offsetof(WIFI_CELL, noise_level) == 520 && offsetof(WIFI_CELL, state) == 536);
static_assert(offsetof(WIFI_CELL, alias) == 664 && offsetof(WIFI_CELL, linkstate) == 792);
static_assert(offsetof(WIFI_CELL, key_mgmt) == 796 && offsetof(WIFI_CELL, key_index) == 800);
static_assert(sizeof(WIFI_CELL) == 804);
static_assert(offsetof(WIFI_INTERFACE, type) == 16 && offsetof(WIFI_INTERFACE, essid) == 32);
static_assert(offsetof(WIFI_INTERFACE, mode) == 160 && offsetof(WIFI_INTERFACE, encmode) == 164);
static_assert(offsetof(WIFI_INTERFACE, channel) == 168 && offsetof(WIFI_INTERFACE, key) == 172);
static_assert(offsetof(WIFI_INTERFACE, quality) == 204 && offsetof(WIFI_INTERFACE, key1) == 212);
static_assert(offsetof(WIFI_INTERFACE, address) == 340 && offsetof(WIFI_INTERFACE, netmask) == 372);
static_assert(offsetof(WIFI_INTERFACE, broadcast) == 404 &&
              offsetof(WIFI_INTERFACE, gateway) == 436);
static_assert(offsetof(WIFI_INTERFACE, isdhcp) == 468 && offsetof(WIFI_INTERFACE, isstatic) == 472);
static_assert(offsetof(WIFI_INTERFACE, UP) == 476 && offsetof(WIFI_INTERFACE, RUNNING) == 480);
static_assert(offsetof(WIFI_INTERFACE, auto_dns) == 484 && offsetof(WIFI_INTERFACE, stats) == 488);
static_assert(offsetof(WIFI_INTERFACE, wifi_group_enable) == 504);
static_assert(offsetof(WIFI_INTERFACE, wifi_group) == 508 && sizeof(WIFI_INTERFACE) == 1312);

// Defined here, once for every program that includes the header, so that wifi_info links alone.
inline MY_WIFI *my_wifi = nullptr;      // created by start-up, never freed
inline gchar Link_AP_MAC[48] = {};      // written by get_ap_mac; empty or zeros: not associated
inline gchar static_address[32] = {};   // written by the settings reader and by apply
inline gchar static_netmask[32] = {};   // likewise
inline gchar static_broadcast[32] = {}; // likewise
inline gchar static_gateway[32] = {};   // likewise

// --- text -------------------------------------------------------------------------------------

// Copies `text` into a fixed field of `size` bytes: cut to the field, never inside a UTF-8
// character, always NUL-terminated. `text` may be NULL (an empty field) or lie inside the field.
void copy_field(char *field, gsize size, const char *text);

// Logs GLib's failed-precondition message with a plain function name and the literal expression;
// g_return_if_fail of C++ would log the whole signature.
void log_critical(const char *function, const char *expression);

// --- shell ------------------------------------------------------------------------------------

// A new copy of `text` that the shell reads between double quotes as exactly `text`: a backslash
// stands before each ", \, $ and `. g_free it.
gchar *shell_escape(const char *text);

// A new command line that writes `text` and a line end to `path` (a name that is plain to a shell).
// It is `echo "%s" >path`; a text that some echo would read as something else goes through printf.
// g_free it.
gchar *echo_command(const char *text, const char *path);

// Runs a command line through the shell and waits for it; how it ends is not looked at: the outcome
// of a command is learnt from the interface.
void run_command(const char *command);

// TRUE for a name that the kernel could give to an interface (1 to 15 bytes, no blank, no '/', no
// ':', see dev_valid_name in net/core/dev.c) and that means nothing to a shell, nor an option to a
// command. For any other name one line goes to standard error, saying that `step` is skipped.
gboolean interface_usable(const char *name, const char *step);

// Runs "/sbin/ifconfig %s up" for a usable name.
void bring_interface_up(const char *name);

// --- files ------------------------------------------------------------------------------------

// Replaces the content of `path` by `length` bytes so that a power cut leaves the old or the new
// file: a temporary file beside the target (behind symbolic links) is written, synced and renamed
// over it; where that is impossible (bind mount, read-only folder) the file is written in place. A
// new file gets mode 0600, an existing one keeps mode and owner. FALSE: the old file stands and
// `error` (g_error_free it) says why.
gboolean replace_file(const char *path, const char *content, gsize length, GError **error);

// --- wireless interfaces ----------------------------------------------------------------------

// Reads "cat /proc/net/wireless" (grammar: the kernel's net/wireless/wext-proc.c) into
// interface_index, interface_count and wifi_interface of my_wifi. An existing record keeps all but
// its name. Returns what closing the pipe returns, or FALSE when the command could not be started
// (the table is untouched then). interface_count is -1 when the header line is missing.
gboolean get_interface();

// The word behind the keyword `target` in the line `src`, or the first two words when `unit` is not
// 0; NULL when the keyword is missing or nothing stands behind it. The text behind the keyword is
// trimmed in place. g_free the result.
gchar *get_string_value(gchar *src, const gchar *target, int unit);

// The same, cut at eight blanks only, so that a network name with single blanks stays whole.
gchar *get_essid_value(gchar *src, const gchar *target, int unit);

// Brings `iface` up, runs "iwlist %s scan" (wireless-tools) on it and replaces wifi_cell and
// cell_count of my_wifi by the networks printed, 128 at most. When the pipe cannot be opened the
// former records stay. For a name that is not usable nothing is run and no network is left.
void get_cell(WIFI_INTERFACE *iface);

// The word for an encryption in /etc/wireless.conf and for /sbin/iwset: "off", "open" or (any other
// value) "restricted".
const char *encryption_word(t_encmode encmode);

// --- /etc/wireless.conf -----------------------------------------------------------------------

// Writes the settings of wifi_interface[0] and the static_ globals. FALSE when they could not be
// stored; the old file stands then and standard error has the cause.
gboolean save_basic_setting_to_file(const gchar *file);

// Reads them back. A file that cannot be opened changes nothing, one without a stanza for the
// interface only empties the hosted network. The stream stays open until the next call of this
// reader or the following one.
void get_basic_setting_from_file(const gchar *file);

// Reads the addressing from a stanza that begins with "iface NAME inet METHOD" instead.
void get_basic_setting_from_file_Advanced(const gchar *file);

// The value of the first line of `file` that holds `var` and is no comment: the text behind its
// last '=', or else behind its last blank. Empty when no line holds it, NULL when the file cannot
// be read or the line has no value. g_free it.
gchar *get_file_var(const gchar *file, const gchar *var);

// Copies the second word of `source` into `ret`, at most 127 bytes and the terminator, the empty
// text when there is none. `keyword` is not looked at.
void get_paramval(gchar *source, gchar *keyword, gchar *ret);

// --- /etc/wireless-user.conf ------------------------------------------------------------------

// Writes the user_cell_count preferred networks. FALSE when they could not be stored; the old file
// stands then and standard error has the cause.
gboolean save_preferred_network_to_file(const gchar *file);

// Rebuilds user_wifi_cell and user_cell_count from the file. A 65th network is read over and
// dropped, which one line on standard error says. A file that cannot be opened changes nothing.
void get_preferred_network_setting_from_file(const gchar *file);

#endif
