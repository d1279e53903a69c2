# shellcheck shell=sh
# SPDX-License-Identifier: MIT
# What the commands and the automatic connection tell each other of an interface, through files in
# its directory "$state":
#   choice        what the user wants of it; there is none while the automatic decides
#   automatic     the supplicant that runs was started by the automatic
#   follower.pid  wpa_cli, which tells wpa-action of every association of our supplicant
#   addressed     the moment at which lnk-ifup was asked for an address in this network
#   list          the list that the automatic has worked with last
#   now           it begins at once what it would try again later
#   sleeper.pid   what it waits for until it looks around again
#   no-wep        the supplicant that runs knows no WEP
#   next.conf     the supplicant's next configuration, taken over once its network is lost
# "$interface", "$library" and "$state" are those of wireless-lan.sh.
# shellcheck disable=SC2034,SC2154

# this_card: the number that the kernel gives a card each time that one appears.
this_card() {
    card=
    { read -r card <"/sys/class/net/$interface/ifindex"; } 2>/dev/null
    printf '%s\n' "${card:-none}"
}

# this_boot: a word that is another one after every start of the machine.
this_boot() {
    boot=
    { read -r boot </proc/sys/kernel/random/boot_id; } 2>/dev/null
    printf '%s\n' "${boot:-unknown}"
}

# moment: the time since the machine was started, in hundredths of a second; in $moment.
moment() {
    read -r moment _ </proc/uptime
    moment=${moment%.*}${moment#*.}
}

# note_choice WORD: "hand" for a network that the user has joined, "off" for none at all.
note_choice() {
    printf '%s %s %s\n' "$1" "$(this_boot)" "$(this_card)" >"$state/choice.new" &&
        mv -f "$state/choice.new" "$state/choice"
}

# read_choice: sets choice to hand, off or auto. A choice holds until the machine starts anew, that
# for no network also until the card has been pulled.
read_choice() {
    choice=auto
    chosen_boot=
    chosen_card=
    [ -f "$state/choice" ] || return 0
    read -r word chosen_boot chosen_card <"$state/choice"
    [ "$chosen_boot" = "$(this_boot)" ] || return 0
    case $word:$chosen_card in
    hand:*) choice=hand ;;
    "off:$(this_card)") choice=off ;;
    esac
}

# ask WORD...: one answer of our supplicant.
ask() {
    limited 2 wpa_cli -p "$state/control" -i "$interface" "$@" 2>/dev/null
}

# is_joined: whether our supplicant is in a network; sets network to its number. No answer is not a
# no: it is asked again, since a busy machine may answer late.
is_joined() {
    network=
    state_word=
    for _ in 1 2 3; do
        answer=$(ask status)
        [ -z "$answer" ] || break
    done
    while IFS='=' read -r field value; do
        case $field in
        wpa_state) state_word=$value ;;
        id) network=$value ;;
        esac
    done <<EOT
$answer
EOT
    [ "$state_word" = COMPLETED ]
}

# follow_supplicant: from now on wpa-action is run when our supplicant joins or loses a network.
follow_supplicant() {
    runs supplicant.pid || return 1
    (
        wireless_lan_supplicant=$pid
        export wireless_lan_supplicant
        exec setsid wpa_cli -p "$state/control" -i "$interface" -a "${library%/*}/wpa-action" \
            </dev/null >/dev/null 2>&1 9>&-
    ) &
    note_process follower.pid "$!"
}

# stop_following: forgets the network that is being left.
stop_following() {
    stop_process follower.pid
    rm -f "$state/addressed" "$state/automatic" "$state/next.conf" "$state/no-wep"
}

# adopt_next: the supplicant goes on with its next configuration.
adopt_next() {
    mv -f "$state/next.conf" "$state/wpa_supplicant.conf"
    if grep -q '^network=' "$state/wpa_supplicant.conf"; then
        [ "$(ask reconfigure)" = OK ] || say "$interface: wpa_supplicant refuses the new list"
    else
        drop_address
        leave_network
    fi
}

# command_path NAME: where a command lies that is called as others call it.
command_path() {
    for directory in "${0%/*}" /usr/sbin /sbin; do
        if [ -x "$directory/$1" ]; then
            printf '%s\n' "$directory/$1"
            return 0
        fi
    done
    return 1
}
