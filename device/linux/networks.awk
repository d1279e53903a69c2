# SPDX-License-Identifier: MIT
# The awk program of iwlist: the answer of the real iwlist in the form that the program reads.
#
# One network a record: the seven lines in the program's order, "Bit Rates:" last because it is
# what closes a network there. Names travel as hexadecimal digits and are put into words at the end.

BEGIN {
    for (i = 0; i < 256; i++) {
        byte[sprintf("%02X", i)] = i
        if (i > 0) {
            char[i] = sprintf("%c", i)
            code[char[i]] = sprintf("%02X", i)
        }
    }
}

# The bytes of a name as iwlist prints it: \xNN where it escaped one, the character otherwise.
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
# end) or cuts at (the eighth of a run). iwset turns each \xNN back, so that every name can be
# joined exactly.
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
    return out
}

# Files the network that has been read. An access point that hides its name stands in the list a
# second time once a probe has found the name: the entry with the name takes the place of the one
# without.
function file(    name, key) {
    if (!open)
        return
    open = 0
    name = element != "" ? element : bytes_of_text(essid)
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
    record[slot] = sprintf(" - Address: %s\n%sESSID:\"%s\"\n", address, margin, text_of_bytes(name))
    if (mode != "")
        record[slot] = record[slot] margin mode "\n"
    if (frequency != "")
        record[slot] = record[slot] margin frequency "\n"
    if (quality != "")
        record[slot] = record[slot] margin quality "\n"
    if (encryption != "")
        record[slot] = record[slot] margin encryption "\n"
    record[slot] = record[slot] margin "Bit Rates:" (rates != "" ? rates : "unknown")
}

BEGIN {
    margin = "                    "
}

/^ +Cell [0-9]+ - Address: / {
    file()
    open = 1
    address = $5
    essid = element = mode = frequency = quality = encryption = rates = ""
    named_line = more_rates = 0
    next
}

!open {
    if ($0 !~ /Cell/)
        print
    next
}

{
    line = $0
    sub(/^ +/, "", line)
}

# The rest of a "Bit Rates:" line stands below it, indented further.
more_rates && line ~ /^[0-9]/ {
    rates = rates "; " line
    next
}

{
    more_rates = 0
}

line ~ /^ESSID:/ && !named_line {
    named_line = 1
    if (match(line, /".*"/))
        essid = substr(line, RSTART + 1, RLENGTH - 2)
}

# The element that carried the name, where the driver hands it on, is exact; the text is not: a
# name that ends in a backslash, x and two digits is printed as if it ended in an escaped byte.
line ~ /^IE: Unknown: 00/ && element == "" {
    hex = substr(line, 14)
    if (length(hex) == 4 + 2 * byte[substr(hex, 3, 2)])
        element = substr(hex, 5)
}

line ~ /^Mode:/ {
    mode = line
}

line ~ /^Frequency:/ {
    frequency = line
}

# The equals sign says no more than that the value is fresh.
line ~ /^Quality[:=]/ {
    quality = line
    gsub(/=/, ":", quality)
}

# A key that iwlist could read would stand in the place of "on".
line ~ /^Encryption key:/ {
    encryption = line ~ /:off/ ? "Encryption key:off" : "Encryption key:on"
}

line ~ /^Bit Rates:/ {
    rates = (rates != "" ? rates "; " : "") substr(line, 11)
    more_rates = 1
}

END {
    file()
    for (i = 1; i <= count; i++)
        printf "          Cell %02d%s\n", i, record[i]
    print ""
}
