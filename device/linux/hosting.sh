# shellcheck shell=sh
# SPDX-License-Identifier: MIT
# Addresses for a network that this machine hosts as its access point.
# shellcheck disable=SC2154

# choose_host_address: nobody else can give us an address in a network of our own.
# shellcheck disable=SC2034 # lnk-ifup sets it
choose_host_address() {
    [ "$addrtype" != static ] || [ -z "$address" ] || return 0
    address=10.42.0.1
    netmask=255.255.255.0
    broadcast=
    gateway=
}

# serve_addresses: gives addresses beside our own to whoever joins, where dnsmasq is installed. It
# answers no names: what is beyond is another's business.
serve_addresses() {
    command -v dnsmasq >/dev/null || {
        say 'without dnsmasq whoever joins needs an address of his own'
        return 0
    }
    [ "$bits" -le 24 ] || {
        say "the network of $address is too small to give addresses in"
        return 0
    }
    (
        exec setsid dnsmasq -k -C /dev/null -p 0 -i "$interface" --bind-interfaces --leasefile-ro \
            --dhcp-authoritative --dhcp-option=3 --dhcp-option=6 \
            "--dhcp-range=${address%.*}.100,${address%.*}.199,1h" </dev/null >/dev/null 2>&1 9>&-
    ) &
    note_process dnsmasq.pid "$!"
}
