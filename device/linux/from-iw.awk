# SPDX-License-Identifier: MIT
# Rules for networks.awk: what "iw dev IF scan" and "iw dev IF scan dump" print.
#
# A network's own values stand before its elements, one tab from the margin, and the first of each
# counts: some texts of elements (the maker's name of a router) are printed as they are on the air,
# line ends included.

BEGIN {
    pair = "[0-9a-f][0-9a-f]"
    beginning = "^BSS " pair ":" pair ":" pair ":" pair ":" pair ":" pair "\\("
}

$0 ~ beginning {
    finish()
    begin_network(toupper(substr($0, 5, 17)))
    capability = section = ""
    named_line = wpa = owe = other = 0
    next
}

!open {
    next
}

/^\t[^\t]/ {
    section = substr($0, 2)
    sub(/:.*/, "", section)
}

/^\tfreq: [0-9]+(\.[0-9]+)?$/ && frequency == "" {
    frequency = sprintf("%g GHz", $2 / 1000) channel_of($2)
}

/^\tcapability: / && capability == "" {
    capability = substr($0, 14) " "
}

# The scale of the kernel for its older interface: -110 dBm to -40 dBm are 0 to 70.
/^\tsignal: -?[0-9]+(\.[0-9]+)? dBm$/ && quality == "" {
    strength = int(($2 < -110 ? 0 : $2 > -40 ? 70 : $2 + 110) * 100 / 70 + 0.5)
    quality = strength "/100  Signal level:" int($2) " dBm"
}

/^\tsignal: [0-9]+\/100$/ && quality == "" {
    strength = $2 + 0 > 100 ? 100 : $2 + 0
    quality = strength "/100"
}

# Bytes that are not printable ASCII, the backslash and a blank at either end are printed as \xNN.
/^\tSSID:/ && !named_line {
    named_line = 1
    name = bytes_of_text(substr($0, 8))
    # No name: what the tool says of an element that is too long.
    if (length(name) > 64)
        name = ""
}

/^\t(RSN|WPA):/ {
    wpa = 1
}

# Nobody has a key for a network that offers nothing but opportunistic encryption.
section == "RSN" && /^\t\t \* Authentication suites:/ {
    suites = $0
    sub(/.*suites: */, "", suites)
    if (suites ~ /^(OWE|00-0f-ac:18) *$/)
        owe = 1
    else
        other = 1
}

section == "WPA" {
    other = 1
}

/^\t(Supported rates|Extended supported rates):/ {
    sub(/.*rates:/, "")
    for (i = 1; i <= NF; i++)
        if ($i ~ /^[0-9]+\.[0-9]\*?$/)
            rates = rates (rates != "" ? "; " : "") ($i + 0) " Mb/s"
}

# The channel's number where the band has numbers.
function channel_of(mhz,    channel) {
    channel = mhz == 2484 ? 14 : mhz >= 2412 && mhz <= 2472 ? (mhz - 2407) / 5 : \
        mhz >= 5160 && mhz <= 5885 ? (mhz - 5000) / 5 : \
        mhz >= 5955 && mhz <= 7115 ? (mhz - 5950) / 5 : 0
    return channel > 0 && channel == int(channel) ? " (Channel " channel ")" : ""
}

# A mesh, a device that offers itself for a direct connection: nothing that a station joins.
function finish() {
    if (capability ~ /^(ESS|AP) /)
        mode = "Master"
    else if (capability ~ /^IBSS /)
        mode = "Ad-Hoc"
    else
        open = 0
    encrypted = capability ~ / Privacy / && !(owe && !other) ? "on" : "off"
    authentication = wpa ? "WPA" : "WEP"
    end_network()
}

END {
    finish()
    print_networks()
}
