# shellcheck shell=sh
# SPDX-License-Identifier: MIT
# Other programs that hold a wireless interface: how each is asked to let go.

# take_over: asks the managers that a desktop may run to leave $interface alone, and says so.
# shellcheck disable=SC2154
take_over() {
    if [ "$(nmcli -t -f RUNNING general 2>/dev/null)" = running ]; then
        case $(nmcli -g GENERAL.STATE device show "$interface" 2>/dev/null) in
        '' | 10 | '10 '*) ;; # not known there, or not managed
        *)
            if nmcli device set "$interface" managed no >/dev/null 2>&1; then
                say "$interface is no longer managed by NetworkManager"
            else
                say "NetworkManager does not let go of $interface"
            fi
            ;;
        esac
    fi
    # A supplicant that is left on the interface is somebody else's: ours has another folder. The
    # one that served a manager goes by itself within a moment.
    tries=20
    while [ -S "/run/wpa_supplicant/$interface" ] && [ "$tries" -gt 0 ] &&
        wpa_cli -p /run/wpa_supplicant -i "$interface" ping >/dev/null 2>&1; do
        if [ "$tries" -eq 10 ]; then
            wpa_cli -p /run/wpa_supplicant -i "$interface" terminate >/dev/null 2>&1
            say "another wpa_supplicant on $interface has been ended"
            # ConnMan cannot let go of one interface. Switching wireless off there would block the
            # radio, and unblocking it would switch it on again; without its supplicant it is idle.
            ! connmanctl state >/dev/null 2>&1 ||
                say "NetworkInterfaceBlacklist=$interface in /etc/connman/main.conf keeps ConnMan off it"
        fi
        sleep 0.1
        tries=$((tries - 1))
    done
}
