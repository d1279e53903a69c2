# shellcheck shell=sh
# What iwset, lnk-ifup and lnk-ifdown share: the interface they are given, its folder under /run and
# the processes that they leave behind. "$library" is the path of this file.

# Bytes, one language in the answers of the tools, and files for root's eyes only.
LC_ALL=C
export LC_ALL
PATH=${PATH:+$PATH:}/usr/sbin:/usr/bin:/sbin:/bin
export PATH
umask 077

# shellcheck source=device/linux/managers.sh disable=SC2154
. "${library%/*}/managers.sh"

# say TEXT: one line on standard error. No text here ever holds a key.
say() {
    printf '%s: %s\n' "${0##*/}" "$1" >&2
}

# fail TEXT [STATUS]
fail() {
    say "$1"
    exit "${2:-1}"
}

# use_interface NAME: checks the name, makes the interface's folder "$state" and waits for its turn
# there (descriptor 9), so that two commands never change one interface at the same time.
use_interface() {
    case $1 in
    '' | -* | . | .. | */* | *:* | *[![:graph:]]* | ????????????????*)
        fail 'not the name of an interface' 2
        ;;
    esac
    [ "$(id -u)" -eq 0 ] || fail 'only root may do this'
    interface=$1
    state=/run/wireless-lan/$1
    mkdir -p "$state" || exit 1
    chmod 700 /run/wireless-lan "$state"
    exec 9>"$state/lock"
    flock -w 60 9 || fail "$interface: another command keeps it busy"
}

# need_interface: fails when the interface is not there (yet, or any more).
need_interface() {
    [ -d "/sys/class/net/$interface" ] || fail "$interface: no such interface"
}

# start_time PID: when a living process began, in clock ticks; fails when there is none. With the
# number it makes sure that a process is still the one that was noted, not a later one.
start_time() {
    { read -r line <"/proc/$1/stat"; } 2>/dev/null || return 1
    # The program's name stands in parentheses and may hold anything; numbers follow it.
    # shellcheck disable=SC2086
    set -- ${line##*) }
    [ "$1" != Z ] || return 1
    shift 19
    printf '%s\n' "$1"
}

# note_process FILE PID
note_process() {
    printf '%s %s\n' "$2" "$(start_time "$2")" >"$state/$1"
}

# runs FILE: whether the process noted in FILE lives; sets pid.
runs() {
    pid=
    began=
    [ -f "$state/$1" ] && read -r pid began <"$state/$1"
    [ -n "$began" ] && [ "$(start_time "$pid")" = "$began" ]
}

# stop_process FILE: ends the process noted there and waits until it has gone.
stop_process() {
    if runs "$1"; then
        kill "$pid" 2>/dev/null
        tries=50
        while [ "$tries" -gt 0 ] && runs "$1"; do
            [ "$tries" -gt 1 ] || kill -9 "$pid" 2>/dev/null
            sleep 0.1
            tries=$((tries - 1))
        done
    fi
    rm -f "$state/$1"
}

# drop_address: ends what gets an address, or tries to, and empties the addresses.
drop_address() {
    stop_process lnk-ifup.pid
    stop_process dhcp.pid
    ip -4 address flush dev "$interface" 2>/dev/null
}

# leave_network: ends the supplicant, which leaves its network, and forgets the key.
leave_network() {
    stop_process supplicant.pid
    rm -f "$state/wpa_supplicant.conf" "$state/wpa_supplicant.pid"
}
