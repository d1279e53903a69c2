# SPDX-License-Identifier: MIT
# The networks of a scan in the form that the program reads. Read by awk together with the rules of
# one of the tools, from-iwlist.awk or from-iw.awk: these set the variables of the network that is
# being read (see begin_network) and call end_network after its last line.
#
# Names travel as hexadecimal digits and are put into words at the end.

BEGIN {
    for (i = 0; i < 256; i++) {
        byte[sprintf("%02X", i)] = i
        if (i > 0) {
            char[i] = sprintf("%c", i)
            code[char[i]] = sprintf("%02X", i)
        }
    }
    margin = "                    "
    # The window keeps no more networks, and a field of it no more bytes of a name.
    most = 128
    longest = 127
}

# The bytes of a name as the tools print it: \xNN where they escaped one, the character otherwise.
function bytes_of_text(text,    out, hex) {
    out = ""
    while (text != "") {
        hex = toupper(substr(text, 3, 2))
        if (substr(text, 1, 2) == "\\x" && hex in byte) {
            out = out hex
            text = substr(text, 5)
        } else {
            out = out code[substr(text, 1, 1)]
            text = substr(text, 2)
        }
    }
    return out
}

# How many bytes the UTF-8 character at byte i of b[0..n-1] has; 0 if there is no valid one or if
# it would not show as itself: control characters, line and direction marks, non-characters.
function printable(b, i, n,    more, c, k) {
    c = b[i]
    if (c < 128)
        return c >= 32 && c != 127
    if (c < 194 || c > 244)
        return 0
    more = c < 224 ? 1 : c < 240 ? 2 : 3
    if (i + more >= n)
        return 0
    c -= more == 1 ? 192 : more == 2 ? 224 : 240
    for (k = 1; k <= more; k++) {
        if (b[i + k] < 128 || b[i + k] > 191)
            return 0
        c = c * 64 + b[i + k] - 128
    }
    if (more == 2 && c < 2048 || more == 3 && (c < 65536 || c > 1114111))
        return 0
    if (c < 160 || c >= 55296 && c <= 57343 || c == 65279 || c % 65536 >= 65534)
        return 0
    if (c >= 8232 && c <= 8238 || c >= 8294 && c <= 8297)
        return 0
    return more + 1
}

# The text of a name: its characters where they are printable, \xNN for any other byte, for a
# backslash that would read as the start of one, and for blanks that the program cuts off (at either
# end) or cuts at (the eighth of a run). Where that is longer than the program's field, \X and the
# digits of all bytes. iwset turns each back, so that every name can be joined exactly.
function text_of_bytes(hex,    b, n, i, k, size, out, blanks, tail) {
    n = length(hex) / 2
    for (i = 0; i < n; i++)
        b[i] = byte[substr(hex, 2 * i + 1, 2)]
    out = ""
    blanks = 0
    for (i = 0; i < n; i += size) {
        size = printable(b, i, n)
        blanks = b[i] == 32 ? blanks + 1 : 0
        tail = i + 3 < n ? char[b[i + 1]] toupper(char[b[i + 2]] char[b[i + 3]]) : ""
        if (size == 0 || b[i] == 92 && tail ~ /^x[0-9A-F][0-9A-F]$/ ||
            b[i] == 32 && (i == 0 || i == n - 1 || blanks == 8)) {
            out = out sprintf("\\x%02X", b[i])
            size = 1
            blanks = 0
        } else
            for (k = 0; k < size; k++)
                out = out char[b[i + k]]
    }
    return length(out) > longest ? "\\X" hex : out
}

# Begins the network of an access point. The rules fill in: name (hexadecimal digits), mode and
# frequency (as they are to stand in their lines), quality (as it is to stand, and its per cent in
# strength), encrypted ("on", "off" or "" when unknown), authentication ("WPA", "WEP" or "") and
# rates.
function begin_network(of) {
    open = 1
    address = of
    name = mode = frequency = quality = strength = encrypted = authentication = rates = ""
}

# Files the network that has been read. An access point that hides its name stands in the list a
# second time once a probe has found the name: the entry with the name takes the place of the one
# without.
function end_network(    key, slot) {
    if (!open)
        return
    open = 0
    if (name ~ /^(00)*$/)
        name = ""
    key = address " " name
    if (key in seen || name == "" && address in named)
        return
    if (name != "" && (address " ") in seen && !(address in named))
        slot = seen[address " "]
    else
        slot = ++count
    seen[key] = slot
    if (name != "")
        named[address] = 1
    percent[slot] = strength == "" ? -1 : int(strength)
    # "Bit Rates:" last, because it is what closes a network in the program; it reads 511 bytes of a
    # line, and an access point may say that it knows 255 rates.
    record[slot] = " - Address: " address "\n" line_of(1, "ESSID:\"" text_of_bytes(name) "\"") \
        line_of(mode != "", "Mode:" mode) line_of(frequency != "", "Frequency:" frequency) \
        line_of(quality != "", "Quality:" quality) \
        line_of(encrypted != "", "Encryption key:" encrypted) \
        line_of(encrypted == "on" && authentication != "", "Authentication:" authentication) \
        margin "Bit Rates:" (rates != "" ? substr(rates, 1, 400) : "unknown")
}

function line_of(known, text) {
    return known ? margin text "\n" : ""
}

# The strongest first; among equals, in the order in which they came.
function print_networks(    i, p, shown) {
    for (p = 100; p >= -1; p--)
        for (i = 1; i <= count && shown < most; i++)
            if (percent[i] == p || p == 100 && percent[i] > p)
                printf "          Cell %02d%s\n", ++shown, record[i]
    print ""
}
