// SPDX-License-Identifier: MIT
// The state that both libraries share: records, enumerations, limits and the shared globals.

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

// The records come from g_malloc0 and are copied as bytes. Field order and widths are part of the
// format.
static_assert(std::is_trivial<MY_WIFI>::value && std::is_standard_layout<MY_WIFI>::value);
static_assert(std::is_trivial<WIFI_INTERFACE>::value && std::is_trivial<WIFI_CELL>::value);
static_assert(sizeof(t_wifimode) == 4 && sizeof(gboolean) == 4);
static_assert(offsetof(iw_statics, quality) == 4 && offsetof(iw_statics, level) == 8);
static_assert(offsetof(iw_statics, noise) == 12 && sizeof(iw_statics) == 16);
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
static_assert(offsetof(MY_WIFI, interface_count) == 4 && offsetof(MY_WIFI, wifi_interface) == 8);
static_assert(offsetof(MY_WIFI, cell_index) == 8 + 16 * sizeof(void *));
static_assert(offsetof(MY_WIFI, cell_count) == 12 + 16 * sizeof(void *));
static_assert(offsetof(MY_WIFI, user_cell_count) == 16 + 16 * sizeof(void *));
static_assert(offsetof(MY_WIFI, user_cell_index) == 20 + 16 * sizeof(void *));
static_assert(offsetof(MY_WIFI, wifi_cell) == 24 + 16 * sizeof(void *));
static_assert(offsetof(MY_WIFI, user_wifi_cell) == 24 + 144 * sizeof(void *));
static_assert(offsetof(MY_WIFI, wifi_view) == 24 + 208 * sizeof(void *));
static_assert(offsetof(MY_WIFI, wifi_combo) == 24 + 209 * sizeof(void *));
static_assert(offsetof(MY_WIFI, cell_type) == 24 + 210 * sizeof(void *));

// Inline, so that wifi_info links without the window.
inline MY_WIFI *my_wifi = nullptr;    // created by start-up, never freed
inline gchar Link_AP_MAC[48] = {};    // written by get_ap_mac; empty or zeros: not associated
inline gchar static_address[32] = {}; // written by the settings reader and by apply
inline gchar static_netmask[32] = {}; // the same two write these
inline gchar static_broadcast[32] = {};
inline gchar static_gateway[32] = {};

#endif
