# shellcheck shell=sh
# SPDX-License-Identifier: MIT
# Other programs that hold a wireless interface: how each is asked to let go, and how it gets the
# interface back. "$state/taken" notes, one word a line, from whom it was taken.
# "$interface" and "$state" are those of wireless-lan.sh.
# shellcheck disable=SC2154

# note_taken WORD: it is to be given back.
note_taken() {
    grep -qx "$1" "$state/taken" 2>/dev/null || echo "$1" >>"$state/taken"
}

# look_around: sets others to the processes that may hold an interface, NAME:NUMBER one a word. Those
# of another network cannot hold this one.
look_around() {
    others=
    for process in /proc/[0-9]*; do
        name=
        { read -r name <"$process/comm"; } 2>/dev/null
        case $name in
        dhclient | dhcpcd | hostapd | iwd | systemd-network | udhcpc)
            ! shares_network "$process" || others="$others $name:${process#/proc/}"
            ;;
        esac
    done
}

# words PID: the arguments of a process, one a line.
words() {
    { tr '\0' '\n' <"/proc/$1/cmdline"; } 2>/dev/null
}

# is_other_client NAME:NUMBER: whether it is a DHCP client of this interface, and not ours. dhcpcd
# calls itself "dhcpcd: IF [ip4]".
is_other_client() {
    case $1 in
    dhclient:* | dhcpcd:* | udhcpc:*) ;;
    *) return 1 ;;
    esac
    runs dhcp.pid && [ "$pid" = "${1#*:}" ] && return 1
    words "${1#*:}" | grep -qxF -e "$interface" -e "dhcpcd: $interface" -e "dhcpcd: $interface [ip4]" \
        -e "dhcpcd: $interface [ip4] [ip6]"
}

take_from_network_manager() {
    [ "$(limited 3 nmcli -t -f RUNNING general 2>/dev/null)" = running ] || return 0
    case $(limited 3 nmcli -g GENERAL.STATE device show "$interface" 2>/dev/null) in
    '' | 10 | '10 '*) ;; # not known there, or not managed
    *)
        if limited 5 nmcli device set "$interface" managed no >/dev/null 2>&1; then
            note_taken NetworkManager
            say "$interface is no longer managed by NetworkManager"
        else
            say "NetworkManager does not let go of $interface"
        fi
        ;;
    esac
}

# take_from_clients: ends other DHCP clients of the interface, which would set its address again: by
# ifupdown where it has started them, else by their numbers.
take_from_clients() {
    for other in $others; do
        is_other_client "$other" || continue
        if limited 2 ifquery --state "$interface" 2>/dev/null | grep -q . &&
            limited 15 ifdown "$interface" >/dev/null 2>&1; then
            say "ifupdown has brought $interface down; its stanza in /etc/network/interfaces should go"
        fi
        if is_other_client "$other"; then
            # What it has begun to do with a lease it does to the end.
            end_process "${other#*:}"
            say "another DHCP client on $interface has been ended: ${other%:*}"
        fi
    done
}

# take_from_dhcpcd: one that serves all interfaces would set an address of its own beside ours.
take_from_dhcpcd() {
    for other in $others; do
        case $other in dhcpcd:*) ;; *) continue ;; esac
        words "${other#*:}" | grep -q '^dhcpcd: \[ma[a-z]*\]' || continue
        ! grep -Eq "^[[:space:]]*denyinterfaces([[:space:]].*)?[[:space:],]$interface([[:space:],]|\$)" \
            /etc/dhcpcd.conf 2>/dev/null || return 0
        if limited 5 dhcpcd -x "$interface" >/dev/null 2>&1; then
            note_taken dhcpcd
            say "$interface is no longer served by the system's dhcpcd"
        else
            say "the system's dhcpcd may set addresses, too: 'denyinterfaces $interface' in /etc/dhcpcd.conf keeps it off"
        fi
        return 0
    done
}

# systemd-networkd lets go of a link that a file calls unmanaged; in /run the file lasts until the
# next start of the machine.
take_from_networkd() {
    link=/run/systemd/netif/links/$(this_card)
    case $others in *' systemd-network:'*) ;; *) return 0 ;; esac
    state_line=$(grep '^ADMIN_STATE=' "$link" 2>/dev/null)
    case $state_line in '' | *=unmanaged) return 0 ;; esac
    network=/run/systemd/network/00-wireless-lan-$interface.network
    (
        umask 022
        mkdir -p "${network%/*}" &&
            printf '[Match]\nName=%s\n[Link]\nUnmanaged=yes\n' "$interface" >"$network"
    ) 2>/dev/null && limited 5 networkctl reload >/dev/null 2>&1 &&
        limited 5 networkctl reconfigure "$interface" >/dev/null 2>&1
    note_taken systemd-networkd
    say "$interface is no longer managed by systemd-networkd"
}

# A supplicant that is left on the interface is somebody else's: ours has another directory. The one
# that served a manager goes by itself within a moment. One that serves other cards as well only
# loses this one.
take_from_supplicant() {
    tries=20
    while [ -S "/run/wpa_supplicant/$interface" ] && [ "$tries" -gt 0 ] &&
        limited 2 wpa_cli -p /run/wpa_supplicant -i "$interface" ping >/dev/null 2>&1; do
        [ "$tries" -ne 10 ] || end_supplicant
        sleep 0.1
        tries=$((tries - 1))
    done
}

end_supplicant() {
    for socket in /run/wpa_supplicant/global /run/wpa_supplicant-global; do
        if [ -S "$socket" ] &&
            [ "$(limited 2 wpa_cli -g "$socket" interface_remove "$interface" 2>/dev/null)" = OK ]; then
            say "another wpa_supplicant has let go of $interface"
            return 0
        fi
    done
    for socket in /run/wpa_supplicant/*; do
        case ${socket##*/} in
        "$interface" | global | p2p-dev-*) ;;
        *)
            if [ -S "$socket" ] && limited 2 wpa_cli -p /run/wpa_supplicant -i "${socket##*/}" ping \
                >/dev/null 2>&1; then
                give_up busy "a wpa_supplicant holds $interface and ${socket##*/}, and has no global control interface: it must be told to leave $interface"
            fi
            ;;
        esac
    done
    limited 2 wpa_cli -p /run/wpa_supplicant -i "$interface" terminate >/dev/null 2>&1
    say "another wpa_supplicant on $interface has been ended"
    # ConnMan cannot let go of one interface. Switching wireless off there would block the radio, and
    # unblocking it would switch it on again; without its supplicant it is idle.
    ! limited 3 connmanctl state >/dev/null 2>&1 ||
        say "NetworkInterfaceBlacklist=$interface in /etc/connman/main.conf keeps ConnMan off it"
}

# These two cannot be asked to leave one interface, and fight for it.
refuse_others() {
    for other in $others; do
        case $other in
        iwd:*)
            # -i names the interfaces that it serves, -I those that it leaves alone.
            case " $(words "${other#*:}" | tr '\n' ' ')" in
            *" -I $interface "* | *" --nointerfaces $interface "*) ;;
            *" -i $interface "* | *" --interfaces $interface "*) refuse_iwd ;;
            *' -i '* | *' --interfaces '*) ;;
            *) refuse_iwd ;;
            esac
            ;;
        hostapd:*)
            [ ! -S "/run/hostapd/$interface" ] ||
                give_up busy "hostapd holds $interface: it has to be stopped first"
            ;;
        esac
    done
}

refuse_iwd() {
    give_up busy "iwd holds $interface: stop it, or start it with -I $interface"
}

# take_over: asks whoever holds the interface to leave it alone, and says so; fails where that
# cannot be asked.
take_over() {
    look_around
    refuse_others
    take_from_network_manager
    take_from_networkd
    take_from_clients
    take_from_dhcpcd
    take_from_supplicant
}

# give_back: those from whom it was taken have the interface again.
give_back() {
    [ -f "$state/taken" ] || return 0
    while read -r manager; do
        case $manager in
        NetworkManager) limited 5 nmcli device set "$interface" managed yes >/dev/null 2>&1 ;;
        dhcpcd) limited 5 dhcpcd -n "$interface" >/dev/null 2>&1 ;;
        systemd-networkd)
            rm -f "/run/systemd/network/00-wireless-lan-$interface.network"
            limited 5 networkctl reload >/dev/null 2>&1 &&
                limited 5 networkctl reconfigure "$interface" >/dev/null 2>&1
            ;;
        esac
        say "$interface is given back to $manager"
    done <"$state/taken"
    rm -f "$state/taken"
}
