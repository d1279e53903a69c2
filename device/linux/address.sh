# shellcheck shell=sh
# SPDX-License-Identifier: MIT
# How the interface loses what it got in a network: its lease, its addresses, its name servers.
# "$interface", "$library" and "$state" are those of wireless-lan.sh.
# shellcheck disable=SC2154

# stop_client: ends our DHCP client, without a word to the server (the network that the lease came
# from may be gone), and the server of a network that is hosted here.
stop_client() {
    stop_process lnk-ifup.pid
    stop_process dhcp.pid
    stop_process dnsmasq.pid
    if [ -f "$state/dhcpcd" ]; then
        # It was handed to a dhcpcd that serves other interfaces as well.
        limited 5 dhcpcd -x "$interface" >/dev/null 2>&1
        rm -f "$state/dhcpcd"
    fi
}

# has_address: whether the interface has an address that others can reach.
has_address() {
    [ -n "$(ip -4 -o address show dev "$interface" scope global 2>/dev/null)" ]
}

# while_for TENTHS COMMAND...: waits while the command succeeds, so many tenths of a second at most.
while_for() {
    tries=$1
    shift
    while [ "$tries" -gt 0 ] && "$@"; do
        pause 0.1
        tries=$((tries - 1))
    done
}

# lacks_lease: whether the interface has an address that dhclient has not written down.
lacks_lease() {
    leased=$(ip -4 -o address show dev "$interface" scope global 2>/dev/null |
        sed -n 's/.* inet \([0-9.]*\).*/\1/p;q')
    [ -n "$leased" ] && ! grep -qF "fixed-address $leased;" "$state/dhclient.leases" 2>/dev/null
}

# release_lease: gives the lease back while the network is there.
release_lease() {
    runs dhcp.pid || return 0
    client=
    { read -r client <"/proc/$pid/comm"; } 2>/dev/null
    case $client in
    # It sends the message, takes the address off and goes on waiting. A further signal before that
    # would take the first one's place.
    udhcpc | busybox)
        kill -USR2 "$pid" 2>/dev/null
        while_for 20 has_address
        ;;
    # It leaves after the message. A signal that comes while its script is running is lost.
    dhcpcd)
        for _ in 1 2 3 4 5 6 7 8 9 10; do
            runs dhcp.pid || break
            kill -ALRM "$pid" 2>/dev/null
            while_for 10 runs dhcp.pid
        done
        ;;
    # It knows from its file what to give back, and writes it a moment after it has set the address.
    dhclient)
        while_for 50 lacks_lease
        limited 10 dhclient -4 -r -lf "$state/dhclient.leases" -pf "$state/dhclient.pid" \
            "$interface" >/dev/null 2>&1
        ;;
    esac
}

# drop_address: ends what gets an address, or tries to, and empties the addresses.
drop_address() {
    stop_client
    ip -4 address flush dev "$interface" 2>/dev/null
    "${library%/*}/name-servers" drop "$interface"
}

# forget_ipv6: the addresses, routes and name servers that the kernel learnt from the routers of a
# network that is being left. It asks the next network's routers anew.
forget_ipv6() {
    switch=/proc/sys/net/ipv6/conf/$interface/disable_ipv6
    disabled=
    { read -r disabled <"$switch"; } 2>/dev/null
    [ "$disabled" = 0 ] || return 0
    if { echo 1 >"$switch" && echo 0 >"$switch"; } 2>/dev/null; then
        return 0
    fi
    ip -6 address flush dev "$interface" scope global 2>/dev/null
    ip -6 route flush dev "$interface" 2>/dev/null
}
