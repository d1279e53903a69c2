// SPDX-License-Identifier: MIT
#include "model.h"

#include <algorithm>
#include <climits>
#include <functional>
#include <regex>

#include "state.h"
#include "wifi.h"
#include "wifi_info/text.h"

namespace model
{

std::vector<std::string> lines(const std::string &text, size_t size)
{
    std::vector<std::string> result;
    for (size_t at = 0; at < text.size();) {
        size_t end = text.find('\n', at);
        size_t length =
            std::min(end == std::string::npos ? text.size() - at : end - at + 1, size - 1);
        result.push_back(text.substr(at, length).c_str());
        at += length;
    }
    return result;
}

// The length of a character by its UTF-8 lead byte.
static size_t announced(unsigned char byte)
{
    const struct {
        unsigned char mask, lead;
    } forms[] = {{0xE0, 0xC0}, {0xF0, 0xE0}, {0xF8, 0xF0}, {0xFC, 0xF8}, {0xFE, 0xFC}};
    for (size_t i = 0; i < 5; i++)
        if ((byte & forms[i].mask) == forms[i].lead)
            return i + 2;
    return 1;
}

std::string cut(const std::string &text, size_t size)
{
    if (text.size() < size)
        return text;
    size_t last = size - 1;
    auto continues = [&](size_t at) {
        return (text[at] & 0xC0) == 0x80;
    };
    for (size_t back = 1; back <= 3 && back <= last && continues(last - back + 1); back++)
        if (announced(static_cast<unsigned char>(text[last - back])) > back)
            return text.substr(0, last - back);
    return text.substr(0, last);
}

std::string trim(const std::string &text)
{
    const char *white_space = " \t\n\f\r";
    size_t from = text.find_first_not_of(white_space);
    if (from == std::string::npos)
        return "";
    return text.substr(from, text.find_last_not_of(white_space) - from + 1);
}

bool shell_words(const std::string &command, std::vector<std::string> *words, std::string *file)
{
    std::string word;
    bool in_word = false, to_file = false;
    auto end_word = [&] {
        if (in_word && to_file)
            *file = word;
        else if (in_word)
            words->push_back(word);
        word = "";
        in_word = false;
    };
    for (size_t at = 0; at < command.size(); at++) {
        char byte = command[at];
        if (byte == ' ') {
            end_word();
        } else if (byte == '>') {
            end_word();
            to_file = true;
        } else if (byte == '\'') {
            size_t end = command.find('\'', at + 1);
            if (end == std::string::npos)
                return false;
            word += command.substr(at + 1, end - at - 1);
            in_word = true;
            at = end;
        } else if (byte == '"') {
            in_word = true;
            for (at++; at < command.size() && command[at] != '"'; at++) {
                if (command[at] == '$' || command[at] == '`')
                    return false;
                if (command[at] == '\\' && at + 1 < command.size() &&
                    std::string("\"\\$`\n").find(command[at + 1]) != std::string::npos)
                    at++;
                word += command[at];
            }
            if (at >= command.size())
                return false;
        } else if (g_ascii_isalnum(byte) || byte == '/' || byte == '_' || byte == '.') {
            word += byte;
            in_word = true;
        } else {
            return false;
        }
    }
    end_word();
    return true;
}

static bool begins(const std::string &text, const std::string &start)
{
    return text.compare(0, start.size(), start) == 0;
}

std::vector<std::string> split(const std::string &text, const std::string &separator)
{
    std::vector<std::string> pieces;
    size_t at = 0;
    for (size_t end; (end = text.find(separator, at)) != std::string::npos;
         at = end + separator.size())
        pieces.push_back(text.substr(at, end - at));
    pieces.push_back(text.substr(at));
    return pieces;
}

static std::vector<std::string> words(const std::string &text)
{
    const char *white_space = " \t\n\v\f\r";
    std::vector<std::string> result;
    for (size_t at = 0; (at = text.find_first_not_of(white_space, at)) != std::string::npos;) {
        size_t end = std::min(text.find_first_of(white_space, at), text.size());
        result.push_back(text.substr(at, end - at));
        at = end;
    }
    return result;
}

std::string second_word(const std::string &text, size_t size)
{
    std::vector<std::string> all = words(text);
    return all.size() > 1 ? cut(all[1], size) : "";
}

static int number(const std::string &text)
{
    size_t at = std::min(text.find_first_not_of(" \t\n\v\f\r"), text.size());
    bool minus = at < text.size() && text[at] == '-';
    if (at < text.size() && (text[at] == '-' || text[at] == '+'))
        at++;
    long long value = 0;
    for (; at < text.size() && text[at] >= '0' && text[at] <= '9'; at++)
        value = std::min(value * 10 + (text[at] - '0'), 1LL << 40);
    value = minus ? -value : value;
    return static_cast<int>(std::max<long long>(INT_MIN, std::min<long long>(INT_MAX, value)));
}

interfaces read_interfaces(const std::string &text)
{
    std::vector<std::string> all = lines(text, 255);
    auto header = std::find_if(all.begin(), all.end(),
                               [](const std::string &line) { return begins(line, " face"); });
    interfaces result = {-1, {}};
    if (header == all.end())
        return result;
    std::vector<std::string> after(header + 1, all.end());
    result.count = static_cast<int>(std::min<size_t>(after.size(), 16));
    after.push_back(all.back());
    for (size_t i = 0; i < after.size() && i < 16; i++)
        result.names.push_back(cut(trim(split(after[i], ":")[0]), 16));
    return result;
}

bool cell::operator==(const cell &other) const
{
    return address == other.address && essid == other.essid && mode == other.mode &&
           channel == other.channel && quality == other.quality && key == other.key &&
           encmode == other.encmode;
}

// The text for a terminal: control characters as \xNN, also those of two bytes.
static std::string shown(const std::string &text)
{
    static const std::regex control("[\x01-\x1F\x7F]|\xC2[\x80-\x9F]");
    std::string result;
    size_t end = 0;

    for (std::sregex_iterator one(text.begin(), text.end(), control), none; one != none; ++one) {
        result += text.substr(end, static_cast<size_t>(one->position()) - end);
        for (const char byte : one->str()) {
            char code[5];
            snprintf(code, sizeof code, "\\x%02x", static_cast<unsigned char>(byte));
            result += code;
        }
        end = static_cast<size_t>(one->position() + one->length());
    }
    return result + text.substr(end);
}

std::vector<cell> read_cells(const std::string &text, std::string *printed)
{
    const std::string keywords[] = {
        "Address:", "ESSID:", "Mode:", "Frequency:", "Quality:", "Encryption key:"};
    std::string unread;
    std::string &log = printed ? *printed : unread;
    auto say = [&](const std::string &what) {
        log += "WIRELESS-LAN-DEBUG: " + shown(what) + "\n";
    };
    auto after = [](const std::string &line, const std::string &keyword) {
        size_t at = line.find(keyword);
        return at == std::string::npos ? "" : trim(line.substr(at + keyword.size()));
    };
    std::vector<cell> cells;
    std::vector<std::string> all = lines(text, 512);
    for (size_t at = 0; at < all.size(); at++) {
        if (all[at].find("Cell") == std::string::npos)
            continue;
        say("FIND CELL[" + std::to_string(cells.size()) + "]");
        std::string values[6];
        cell now = {};
        for (; at < all.size(); at++) {
            size_t i = 0;
            while (i < 6 && (!values[i].empty() || after(all[at], keywords[i]).empty()))
                i++;
            if (i == 6 && !after(all[at], "Bit Rates:").empty())
                break;
            if (i == 6)
                continue;
            values[i] = split(after(all[at], keywords[i]), i == 1 ? "        " : " ")[0];
            if (i == 1) {
                std::string name = values[1];
                if (name.front() == '"')
                    name.front() = ' ';
                if (name.back() == '"')
                    name.back() = ' ';
                now.essid = trim(name);
                say("ESSID:" + now.essid);
            } else if (i == 5) {
                now.encmode = values[5] == "on" ? 1 : values[5] == "off" ? 0 : 2;
                say("key:" + std::to_string(now.encmode));
            } else {
                say((i == 4 ? "quality:" : keywords[i]) + values[i]);
            }
        }
        if (cells.size() == 128)
            break;
        now.address = cut(values[0], 32);
        now.essid = cut(now.essid, 128);
        now.mode = cut(values[2], 16);
        now.channel = cut(values[3], 40);
        now.quality = cut(values[4], 16);
        now.key = cut(values[5], 4);
        cells.push_back(now);
    }
    return cells;
}

bool preferred::operator==(const preferred &other) const
{
    return alias == other.alias && essid == other.essid && mode == other.mode &&
           userkey == other.userkey && key_mgmt == other.key_mgmt && key_index == other.key_index &&
           encmode == other.encmode;
}

std::vector<preferred> read_preferred(const std::string &text)
{
    std::vector<preferred> networks;
    std::vector<std::string> all = lines(text, 255);
    for (size_t at = 0; at < all.size() && networks.size() < 64; at++) {
        if (!begins(all[at], "USERCELL"))
            continue;
        std::string line[7];
        for (size_t i = 0; i < 7 && at + 1 < all.size(); i++)
            line[i] = all[++at];
        auto rest = [](const std::string &from) {
            size_t space = from.find(' ');
            return space == std::string::npos ? "" : cut(trim(from.substr(space)), 128);
        };
        std::string word = second_word(line[5], 128);
        networks.push_back({rest(line[0]), rest(line[1]), second_word(line[2], 16),
                            second_word(line[6], 128),
                            static_cast<unsigned>(number(second_word(line[3], 128))),
                            static_cast<unsigned>(number(second_word(line[4], 128))),
                            word == "open"         ? 1u
                            : word == "restricted" ? 2u
                                                   : 0u});
    }
    return networks;
}

static std::string one_line(std::string text)
{
    std::replace(text.begin(), text.end(), '\n', ' ');
    std::replace(text.begin(), text.end(), '\r', ' ');
    return text;
}

std::string write_preferred(const std::vector<preferred> &networks)
{
    std::string text;
    const char *const encryption[] = {"off", "open", "restricted"};
    for (size_t i = 0; i < networks.size(); i++) {
        const preferred &network = networks[i];
        text += "USERCELL " + std::to_string(i);
        text += "\nALIAS " + one_line(network.alias);
        text += "\nESSID " + one_line(network.essid);
        text += "\nMODE " + one_line(network.mode);
        text += "\nKMGMT " + std::to_string(static_cast<int>(network.key_mgmt));
        text += "\nKINDEX " + std::to_string(static_cast<int>(network.key_index));
        text +=
            std::string("\nEncryption ") + encryption[network.encmode > 2 ? 0 : network.encmode];
        text += "\nKEY " + (network.encmode ? one_line(network.userkey) : "off") + "\n";
    }
    return text;
}

bool basic::operator==(const basic &other) const
{
    return isdhcp == other.isdhcp && isstatic == other.isstatic && auto_dns == other.auto_dns &&
           wifi_group_enable == other.wifi_group_enable && essid == other.essid &&
           mode == other.mode && userkey == other.userkey && encmode == other.encmode &&
           address == other.address && netmask == other.netmask && broadcast == other.broadcast &&
           gateway == other.gateway;
}

static std::vector<std::string> trimmed_lines(const std::string &text)
{
    std::vector<std::string> all = lines(text, 255);
    for (std::string &line : all)
        line = trim(line);
    return all;
}

// The index of the line that names the interface, or the number of lines.
static size_t stanza(const std::vector<std::string> &all, const std::string &name)
{
    std::string current;
    for (size_t at = 0; at < all.size(); at++) {
        std::vector<std::string> pieces = split(all[at], " ");
        if (!begins(all[at], "iface"))
            continue;
        if (pieces.size() > 1)
            current = trim(pieces[1]);
        if (current == name)
            return at;
    }
    return all.size();
}

// Calls `use` with the value of line `at` (past the end: of the last line), if it has one.
static void value(const std::vector<std::string> &all, size_t at, const std::string &keyword,
                  const std::function<void(const std::string &)> &use)
{
    const std::string &line = all[std::min(at, all.size() - 1)];
    std::vector<std::string> pieces = split(line, " ");
    if (begins(line, keyword) && pieces.size() > 1)
        use(trim(pieces[1]));
}

static void addresses(const std::vector<std::string> &all, size_t at, basic &settings)
{
    value(all, at, "address", [&](const std::string &text) { settings.address = cut(text, 32); });
    value(all, at + 1, "netmask",
          [&](const std::string &text) { settings.netmask = cut(text, 32); });
    value(all, at + 2, "broadcast",
          [&](const std::string &text) { settings.broadcast = cut(text, 32); });
    value(all, at + 3, "gateway",
          [&](const std::string &text) { settings.gateway = cut(text, 32); });
}

basic read_basic(const std::string &text, const std::string &name, basic settings)
{
    std::vector<std::string> all = trimmed_lines(text);
    settings.wifi_group_enable = 0;
    settings.essid = settings.mode = settings.userkey = "";
    settings.encmode = 0;
    size_t at = stanza(all, name);
    if (at == all.size())
        return settings;
    value(all, at + 1, "addrtype", [&](const std::string &type) {
        settings.isstatic = type == "static";
        settings.isdhcp = type != "static";
    });
    if (settings.isstatic == 1)
        addresses(all, at + 2, settings);
    else
        value(all, at + 2, "dns",
              [&](const std::string &dns) { settings.auto_dns = dns == "auto"; });
    at += settings.isstatic == 1 ? 6 : 3;
    value(all, at, "wifigroup",
          [&](const std::string &on) { settings.wifi_group_enable = number(on); });
    value(all, at + 1, "ESSID",
          [&](const std::string &name_) { settings.essid = cut(name_, 128); });
    settings.mode = "Ad-Hos";
    value(all, at + 3, "KEY", [&](const std::string &key) { settings.userkey = cut(key, 128); });
    value(all, at + 4, "Encryption", [&](const std::string &word) {
        settings.encmode = word == "off" ? 0 : word == "open" ? 1 : 2;
    });
    return settings;
}

basic read_basic_advanced(const std::string &text, const std::string &name, basic settings)
{
    std::vector<std::string> all = trimmed_lines(text);
    size_t at = stanza(all, name);
    if (at == all.size())
        return settings;
    std::vector<std::string> pieces = split(all[at], " ");
    if (pieces.size() > 3) {
        settings.isstatic = trim(pieces[3]) == "static";
        settings.isdhcp = !settings.isstatic;
    }
    addresses(all, at + 1, settings);
    return settings;
}

std::string write_basic(const std::string &name, const basic &settings)
{
    std::string text = "iface " + one_line(name) + "\naddrtype ";
    if (settings.isstatic)
        text += "static \naddress " + one_line(settings.address) + "\nnetmask " +
                one_line(settings.netmask) + "\nbroadcast " + one_line(settings.broadcast) +
                "\ngateway " + one_line(settings.gateway);
    else
        text += std::string(settings.isdhcp ? "dhcp" : "static") + "\ndns " +
                (settings.auto_dns ? "auto" : "manual");
    text += "\nwifigroup " + std::to_string(settings.wifi_group_enable);
    text += "\nESSID " + one_line(settings.essid) + "\nMODE Ad-Hoc\nKEY ";
    text += one_line(settings.userkey) + "\nEncryption ";
    text += settings.encmode == 0 ? "off\n" : settings.encmode == 1 ? "open\n" : "restricted\n";
    return text;
}

std::string file_var(const std::string &text, const std::string &var, bool *found)
{
    std::vector<std::string> all = split(text.c_str(), "\n");
    if (all.size() == 1 && all[0].empty())
        all.clear();
    if (all.size() > 2048) {
        for (size_t i = 2048; i < all.size(); i++)
            all[2047] += "\n" + all[i];
        all.resize(2048);
    }
    *found = true;
    for (const std::string &line : all) {
        std::string end = trim("|" + line).substr(1);
        if (begins(end, "#") || end.find(var) == std::string::npos)
            continue;
        size_t separator = end.rfind(end.find('=') != std::string::npos ? '=' : ' ');
        *found = separator != std::string::npos;
        return *found ? end.substr(separator + 1) : "";
    }
    return "";
}

} // namespace model

std::vector<model::cell> scanned_cells()
{
    std::vector<model::cell> cells;
    for (int i = 0; i < my_wifi->cell_count; i++) {
        const WIFI_CELL &cell = *my_wifi->wifi_cell[i];
        cells.push_back({FIELD(cell, address), FIELD(cell, essid), FIELD(cell, mode),
                         FIELD(cell, channel), FIELD(cell, quality), FIELD(cell, key),
                         cell.encmode});
    }
    return cells;
}

std::vector<model::preferred> preferred_networks()
{
    std::vector<model::preferred> networks;
    for (int i = 0; i < my_wifi->user_cell_count; i++) {
        const WIFI_CELL &cell = *my_wifi->user_wifi_cell[i];
        networks.push_back({FIELD(cell, alias), FIELD(cell, essid), FIELD(cell, mode),
                            FIELD(cell, userkey), cell.key_mgmt, cell.key_index, cell.encmode});
    }
    return networks;
}

model::basic basic_settings()
{
    const WIFI_INTERFACE &iface = *my_wifi->wifi_interface[0];
    return {iface.isdhcp,
            iface.isstatic,
            iface.auto_dns,
            iface.wifi_group_enable,
            FIELD(iface.wifi_group, essid),
            FIELD(iface.wifi_group, mode),
            FIELD(iface.wifi_group, userkey),
            iface.wifi_group.encmode,
            field_text(static_address, sizeof static_address),
            field_text(static_netmask, sizeof static_netmask),
            field_text(static_broadcast, sizeof static_broadcast),
            field_text(static_gateway, sizeof static_gateway)};
}
