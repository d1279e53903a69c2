# SPDX-License-Identifier: MIT
# Rules for networks.awk: what "iwlist IF scan" prints.

/^ +Cell [0-9]+ - Address: / {
    finish()
    begin_network($5)
    essid = element = privacy = ""
    named_line = more_rates = elements = wpa = owe = other = 0
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

# Only a driver that hands the elements on says what kind of key a network wants.
line ~ /^IE: / {
    elements = 1
}

# The element that carried the name is exact; the text is not: a name that ends in a backslash, x
# and two digits is printed as if it ended in an escaped byte.
line ~ /^IE: Unknown: 00/ && element == "" {
    hex = substr(line, 14)
    if (length(hex) == 4 + 2 * byte[substr(hex, 3, 2)])
        element = substr(hex, 5)
}

line ~ /^IE: (IEEE 802\.11i\/)?WPA/ {
    wpa = 1
}

# The only kind that this tool's age knows no word for, and the only one that needs no key, is 18.
line ~ /^Authentication Suites/ {
    if (line ~ /: unknown \(18\) *$/)
        owe = 1
    else
        other = 1
}

line ~ /^Mode:/ {
    mode = substr(line, 6)
}

line ~ /^Frequency:/ {
    frequency = substr(line, 11)
}

# The equals sign says no more than that the value is fresh.
line ~ /^Quality[:=]/ {
    quality = substr(line, 9)
    gsub(/=/, ":", quality)
    split(quality, part, /[\/ ]/)
    strength = part[2] > 0 ? 100 * part[1] / part[2] : part[1]
}

# A key that iwlist could read would stand in the place of "on".
line ~ /^Encryption key:/ {
    privacy = line ~ /:off/ ? "off" : "on"
}

line ~ /^Bit Rates:/ {
    rates = (rates != "" ? rates "; " : "") substr(line, 11)
    more_rates = 1
}

function finish() {
    name = element != "" ? element : bytes_of_text(essid)
    encrypted = privacy == "on" && owe && !other ? "off" : privacy
    authentication = wpa ? "WPA" : elements ? "WEP" : ""
    end_network()
}

END {
    finish()
    print_networks()
}
