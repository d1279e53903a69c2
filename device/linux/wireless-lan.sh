# shellcheck shell=sh
# SPDX-License-Identifier: MIT
# What the device's commands share: how they say what went wrong, the limit of time for what they
# wait for, the interface they are given, its directory under /run and the processes that they leave
# behind. Nothing here needs more than a POSIX shell and what busybox has. "$library" is the path of
# this file.

# Bytes, one language in the answers of the tools, and files for root's eyes only.
LC_ALL=C
export LC_ALL
umask 077
# Root runs these commands from the environments of others: their PATH does not count.
PATH=/usr/local/sbin:/usr/local/bin:/usr/sbin:/usr/bin:/sbin:/bin
export PATH

run_dir=/run/wireless-lan

# shellcheck source=device/linux/managers.sh disable=SC2154
. "${library%/*}/managers.sh"
# shellcheck source=device/linux/automatic.sh
. "${library%/*}/automatic.sh"
# shellcheck source=device/linux/address.sh
. "${library%/*}/address.sh"

# say TEXT: one line on standard error. No text here ever holds a key.
say() {
    printf '%s: %s\n' "${0##*/}" "$1" >&2
}

# fail TEXT [STATUS]
fail() {
    say "$1"
    exit "${2:-1}"
}

# reason WORD [DETAIL]: leaves the reason of a failure where the program finds it, one line of UTF-8.
# The program knows these words and translates them: wrong-key, not-found, refused, rfkill-soft,
# rfkill-hard, not-root, no-interface, no-driver, no-answer, no-scan, no-wep, no-hosting, no-dhcp,
# no-lease, bad-name, bad-wep-key, bad-wpa-key, busy, missing-tool TOOL. Whatever else it finds it
# shows as it stands.
reason() {
    # Only root has a directory there, and a reason that cannot be left is no further failure.
    { mkdir -p "$run_dir" && printf '%s\n' "$*" >"$run_dir/reason.$$" &&
        mv -f "$run_dir/reason.$$" "$run_dir/reason"; } 2>/dev/null || :
}

# no_reason: forgets the reason of an earlier failure.
no_reason() {
    rm -f "$run_dir/reason" 2>/dev/null || :
}

# give_up WORD TEXT [DETAIL]: leaves the reason, says the text and ends the command.
give_up() {
    reason "$1" ${3+"$3"}
    fail "$2"
}

# need TOOL...: ends the command at once when one of these is not installed.
need() {
    for tool in "$@"; do
        command -v "$tool" >/dev/null ||
            give_up missing-tool "$tool is missing: it has to be installed" "$tool"
    done
}

# seconds: the time since the machine was started, which no clock that is set can change; in $now.
seconds() {
    read -r now _ </proc/uptime
    now=${now%%.*}
}

# limited SECONDS COMMAND...: the command's own status, or 124 when it takes longer; then it is
# ended, with every process that it started. It has no standard input.
limited() {
    limit=$1
    shift
    seconds
    deadline=$((now + limit))
    setsid "$@" </dev/null 9>&- &
    limited=$!
    # In a group of its own, so that its sleep can be ended with it.
    # shellcheck disable=SC2016 # the inner shell's
    setsid sh -c 'sleep "$1"; kill -TERM "-$2"; sleep 1; kill -KILL "-$2"' limited "$limit" "$limited" \
        </dev/null >/dev/null 2>&1 9>&- &
    watchdog=$!
    wait "$limited" 2>/dev/null
    status=$?
    # It may not have got as far as its own group yet.
    kill -TERM "-$watchdog" 2>/dev/null || kill "$watchdog" 2>/dev/null
    kill -TERM "-$watchdog" 2>/dev/null
    wait "$watchdog" 2>/dev/null
    seconds
    [ "$status" -ne 0 ] && [ "$now" -ge "$deadline" ] || return "$status"
    # Whoever of its group has not ended at the first signal.
    kill -KILL "-$limited" 2>/dev/null
    return 124
}

# read_defaults: sets default_interface and country from /etc/default/wireless-lan. Its lines are
# data, as in INTERFACE=wlan1 or COUNTRY="DE"; nothing in it is ever run.
# shellcheck disable=SC2034 # the commands use them
read_defaults() {
    default_interface=
    country=
    [ -r /etc/default/wireless-lan ] || return 0
    while read -r line || [ -n "$line" ]; do
        value=${line#*=}
        case $value in
        \"*\" | \'*\')
            value=${value#?}
            value=${value%?}
            ;;
        esac
        case $line in
        INTERFACE=*) ! is_interface_name "$value" || default_interface=$value ;;
        COUNTRY=[A-Z][A-Z] | COUNTRY=[\"\'][A-Z][A-Z][\"\']) country=$value ;;
        esac
    done </etc/default/wireless-lan
}

# is_interface_name TEXT: whether the kernel could give an interface this name, and no tool could
# take it for something else.
is_interface_name() {
    case $1 in
    '' | -* | . | .. | */* | *:* | *[![:graph:]]* | ????????????????*) return 1 ;;
    esac
}

# owned FILE: whether the process that the symbolic link FILE names lives; sets owner to its text.
owned() {
    owner=$(readlink "$1") && [ "$(start_time "${owner%:*}")" = "${owner#*:}" ]
}

# try_turn: takes the lock if nobody holds it. The kernel's lock ends with its holder (descriptor 9);
# where there is no flock, a link that names its holder stands in for it.
try_turn() {
    if command -v flock >/dev/null; then
        flock -n 9
        return
    fi
    ! ln -s "$$:$(start_time $$)" "$state/owner" 2>/dev/null || return 0
    owned "$state/owner" || {
        # Only one can move a link that was left behind; whoever finds that it has moved another's
        # puts it back.
        left_behind=$owner
        ! mv "$state/owner" "$state/owner.$$" 2>/dev/null ||
            [ "$(readlink "$state/owner.$$")" = "$left_behind" ] ||
            ln -s "$(readlink "$state/owner.$$")" "$state/owner"
        rm -f "$state/owner.$$"
    }
    return 1
}

# take_turn: waits until no other command changes the interface, 20 seconds at most (busybox has no
# flock that waits for a time).
take_turn() {
    exec 9>"$state/lock"
    tries=100
    until try_turn; do
        [ "$tries" -gt 0 ] || give_up busy "$interface: another command keeps it busy"
        tries=$((tries - 1))
        pause 0.2
    done
}

# end_turn: lets the next command have its turn.
end_turn() {
    exec 9>&-
    [ "$(readlink "$state/owner")" != "$$:$(start_time $$)" ] || rm -f "$state/owner"
}

# use_interface NAME: checks the name, makes the interface's directory "$state" and waits for its
# turn there, so that two commands never change one interface at the same time.
use_interface() {
    is_interface_name "$1" || fail 'not the name of an interface' 2
    [ "$(id -u)" -eq 0 ] || give_up not-root 'only root may do this'
    interface=$1
    state=$run_dir/$1
    mkdir -p "$state" || exit 1
    chmod 700 "$run_dir" "$state"
    need ip awk setsid
    take_turn
}

# need_interface: fails when the interface is not there (yet, or any more).
need_interface() {
    [ -d "/sys/class/net/$interface" ] || give_up no-interface "$interface: no such interface"
}

# pause SECONDS: a fraction where the shell's sleep knows fractions.
pause() {
    sleep "$1" 2>/dev/null || sleep 1
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

# family PID: prints the number of a process and of all that it has started, but not ours.
family() {
    [ "$1" != "$$" ] || return 0
    printf '%s\n' "$1"
    for entry in /proc/[0-9]*; do
        { read -r line <"$entry/stat"; } 2>/dev/null || continue
        line=${line##*) ? }
        [ "${line%% *}" != "$1" ] || family "${entry##*/}"
    done
}

# end_process PID: ends a process and waits until it has gone. One that has no time to end by itself
# leaves its helpers behind, as dhcpcd does: they are ended with it.
end_process() {
    since=$(start_time "$1") || return 0
    kill "$1" 2>/dev/null
    tries=70
    while [ "$tries" -gt 0 ] && [ "$(start_time "$1")" = "$since" ]; do
        # shellcheck disable=SC2046 # one argument a number
        [ "$tries" -gt 20 ] || kill -KILL $(family "$1") 2>/dev/null
        pause 0.1
        tries=$((tries - 1))
    done
}

# stop_process FILE: ends the process noted there and waits until it has gone.
stop_process() {
    ! runs "$1" || end_process "$pid"
    rm -f "$state/$1"
}

# shares_network DIRECTORY: whether the process that has this directory under /proc is in our network.
# An interface has its name in one network namespace: the processes of others are of another machine.
# To read ns/net takes the right to trace the process, which the systemd unit does not have.
shares_network() {
    # shellcheck disable=SC3013 # all of our shells know it
    [ "$1/net/dev" -ef /proc/self/net/dev ]
}

# processes NAME WORD: prints the numbers of the processes of this name that have WORD among their
# arguments.
processes() {
    for entry in /proc/[0-9]*; do
        { read -r comm <"$entry/comm"; } 2>/dev/null || continue
        [ "$comm" = "$1" ] || continue
        shares_network "$entry" || continue
        ! tr '\000' '\n' <"$entry/cmdline" 2>/dev/null | grep -qxF -e "$2" || echo "${entry##*/}"
    done
}

# leave_network: ends the supplicant, which leaves its network, and forgets the key. A command that
# was killed may have left a supplicant without a note: it is known by its configuration.
leave_network() {
    stop_following
    forget_ipv6
    stop_process supplicant.pid
    for left_behind in $(processes wpa_supplicant "$state/wpa_supplicant.conf"); do
        end_process "$left_behind"
    done
    rm -f "$state/wpa_supplicant.conf" "$state/wpa_supplicant.pid" "$state/events" "$state/hosting" \
        "$state/offered"
}

# unblock_radio: lifts the soft block of the interface's radio. Ends the command when the radio stays
# blocked: nothing can be heard or sent then.
unblock_radio() {
    for radio in "/sys/class/net/$interface/phy80211"/rfkill* \
        "/sys/class/net/$interface/device/rfkill"/rfkill*; do
        [ -r "$radio/soft" ] || continue
        read -r blocked <"$radio/soft"
        if [ "$blocked" = 1 ]; then
            { echo 0 >"$radio/soft"; } 2>/dev/null
            read -r blocked <"$radio/soft"
            [ "$blocked" = 0 ] || limited 2 rfkill unblock "${radio##*/rfkill}" 2>/dev/null
            read -r blocked <"$radio/soft"
            [ "$blocked" = 0 ] ||
                give_up rfkill-soft "the radio of $interface is switched off and stays so"
        fi
        read -r blocked <"$radio/hard"
        [ "$blocked" = 0 ] ||
            give_up rfkill-hard "a switch on the machine has turned the radio of $interface off"
    done
}
