# shellcheck shell=sh
# SPDX-License-Identifier: MIT
# The settings of the interface in /etc/wireless.conf, and which interface they are for. "$interface" is that of wireless-lan.sh.
# shellcheck disable=SC2034,SC2154

# read_settings: the stanza of the interface. Without one an address comes by DHCP.
read_settings() {
    addrtype=dhcp
    dns=auto
    address=
    netmask=
    broadcast=
    gateway=
    hosting=0
    hosted_name=
    hosted_encryption=off
    [ -r /etc/wireless.conf ] || return 0
    ours=no
    while IFS= read -r line || [ -n "$line" ]; do
        line=${line#"${line%%[![:space:]]*}"}
        keyword=${line%%[[:space:]]*}
        line=${line#"$keyword"}
        line=${line#?}
        value=${line#"${line%%[![:space:]]*}"}
        value=${value%%[[:space:]]*}
        case $ours:$keyword in
        *:iface)
            ours=no
            [ "$value" != "$interface" ] || ours=yes
            ;;
        yes:addrtype) addrtype=$value ;;
        yes:dns) dns=$value ;;
        yes:address) address=$value ;;
        yes:netmask) netmask=$value ;;
        yes:broadcast) broadcast=$value ;;
        yes:gateway) gateway=$value ;;
        yes:wifigroup) hosting=$value ;;
        yes:ESSID) hosted_name=$line ;;
        yes:Encryption) hosted_encryption=$value ;;
        esac
    done </etc/wireless.conf
}

# first_settings: the file that the settings dialog would write for a card that gets its address
# and its name servers from the network, where there is no file yet.
first_settings() {
    [ ! -e /etc/wireless.conf ] && [ ! -L /etc/wireless.conf ] || return 0
    # A hosted network may have a key: the file is for root alone.
    if ! (
        umask 077
        set -C
        printf '%s\n' "iface $interface" 'addrtype dhcp' 'dns auto' 'wifigroup 0' 'ESSID ' \
            'MODE Ad-Hoc' 'KEY ' 'Encryption off' >/etc/wireless.conf
    ) 2>/dev/null; then
        # Read-only, or somebody else was quicker.
        [ -e /etc/wireless.conf ] || say 'no first /etc/wireless.conf can be written'
    fi
}

# first_interface: the card that the window works with.
first_interface() {
    "${library%/*}/cat" /proc/net/wireless | while IFS=': ' read -r name _; do
        case $name in
        Inter-* | face) ;;
        *)
            printf '%s\n' "$name"
            break
            ;;
        esac
    done | grep .
}
