# shellcheck shell=sh
# SPDX-License-Identifier: MIT
# How a network stands in wpa_supplicant's configuration: its name and its key arrive there byte
# for byte. The network is in the caller's variables:
#   name        its bytes as hexadecimal digits
#   security    open, wep or wpa
#   key, index, encryption   the key, which of the four WEP keys it is, and open or restricted
#   adhoc       yes for a network of equals
#   hosts       yes where an open network of equals is made here, whoever else has one
#   ap          yes where an access point of our own stands in for a network of equals
#   offered     what the supplicant can do; nothing else is asked of it
# shellcheck disable=SC2154

# start_supplicant: starts one that has no network yet, so that it can be asked what it can do; sets
# supplicant to its number.
start_supplicant() {
    offered=
    common_lines >"$state/wpa_supplicant.conf"
    # Nothing of what wpa_supplicant prints is kept: where it refuses a line it quotes it.
    limited 10 wpa_supplicant -B -i "$interface" -D nl80211,wext -c "$state/wpa_supplicant.conf" \
        -P "$state/wpa_supplicant.pid" >/dev/null 2>&1 || {
        leave_network
        give_up no-driver "wpa_supplicant does not start on $interface"
    }
    tries=50
    while [ ! -s "$state/wpa_supplicant.pid" ] && [ "$tries" -gt 0 ]; do
        pause 0.1
        tries=$((tries - 1))
    done
    read -r supplicant <"$state/wpa_supplicant.pid" || fail 'wpa_supplicant left no process number'
    note_process supplicant.pid "$supplicant"
}

# learn_offer: asks our supplicant what it can do. No build knows every kind of key management, and
# each refuses a whole file for one word that it does not know. Some that it knows it does not name.
learn_offer() {
    answer=$(ask get_capability key_mgmt)
    offered=
    for kind in WPA-PSK FT-PSK SAE OWE; do
        case " $answer " in
        *" $kind "*) offered="$offered$kind " ;;
        esac
    done
    ! offers WPA-PSK || offered="${offered}WPA-PSK-SHA256 "
    ! offers SAE || offered="${offered}H2E "
    ! offers SAE || ! offers FT-PSK || offered="${offered}FT-SAE "
}

# without KIND: offered without it, and a blank after each that is left.
without() {
    for kind in $offered; do
        [ "$kind" = "$1" ] || printf '%s ' "$kind"
    done
}

# read_offer: what the supplicant of this network could do when it was given its networks.
read_offer() {
    offered=
    [ ! -f "$state/offered" ] || read -r offered <"$state/offered"
}

# load_networks COMMAND...: gives our supplicant the networks that COMMAND prints; fails when it
# refuses them. What it refuses although it has offered it is left out.
load_networks() {
    learn_offer
    for less in none H2E FT-SAE WPA-PSK-SHA256 everything; do
        offered=$(without "$less")
        [ "$less" != everything ] || offered=
        printf '%s\n' "$offered" >"$state/offered"
        {
            common_lines
            "$@"
        } >"$state/wpa_supplicant.conf"
        [ "$(ask reconfigure)" != OK ] || return 0
    done
    return 1
}

# offers KIND
offers() {
    case " ${offered-} " in
    *" $1 "*) ;;
    *) return 1 ;;
    esac
}

# common_lines: what stands before the networks. Management frames are protected where the driver
# can: asked for in a network, it would be tried with drivers that cannot, and fail like a wrong key.
# SAE by hash to element as well as by looping is what access points of 6 GHz need.
common_lines() {
    printf 'ctrl_interface=%s/control\n' "$state"
    [ -z "${country-}" ] || printf 'country=%s\n' "$country"
    [ -z "${offered-}" ] || echo 'pmf=1'
    ! offers H2E || echo 'sae_pwe=2'
}

# hex TEXT: its bytes as hexadecimal digits. The texts here are names and keys: they go through
# pipes and shell built-ins, never into another program's arguments.
hex() {
    printf '%s' "$1" | od -An -v -tx1 | tr -d ' \n'
}

# For awk: unescaped(DIGITS), the bytes of a name from the hexadecimal digits of its text. \xNN,
# which the list shows for a byte that cannot be shown, stands for that byte. So do the digits after
# \X for 32 bytes, where that text would be longer than the program keeps; no name has 66 bytes.
unescape='
function value_of(code) {
    if (code ~ /^3[0-9]$/)
        return substr(code, 2)
    if (code ~ /^[46][1-6]$/)
        return substr("abcdef", substr(code, 2), 1)
    return ""
}
function unescaped(text,    i, high, low, result) {
    result = ""
    if (substr(text, 1, 4) == "5c58" && length(text) == 132)
        for (i = 5; i < 132; i += 2)
            result = result value_of(substr(text, i, 2))
    if (length(result) == 64)
        return result
    result = ""
    for (i = 1; i < length(text); i += 2) {
        high = value_of(substr(text, i + 4, 2))
        low = value_of(substr(text, i + 6, 2))
        if (substr(text, i, 4) == "5c78" && high != "" && low != "") {
            result = result high low
            i += 6
        } else
            result = result substr(text, i, 2)
    }
    return result
}'

# name_hex NAME: the bytes of a name as the list shows it.
name_hex() {
    hex "$1" | awk "$unescape"'
    {
        print unescaped($0)
    }'
}

# Whether TEXT is hexadecimal digits alone.
is_hex() {
    case $1 in
    '' | *[!0-9A-Fa-f]*) return 1 ;;
    esac
}

# wep_lines KEY INDEX WORD: the key under its index, and how the station proves that it has it.
wep_lines() {
    case ${#1} in
    5 | 13 | 16) wep_key=$(hex "$1") ;;
    10 | 26 | 32)
        is_hex "$1" || return 1
        wep_key=$1
        ;;
    *) return 1 ;;
    esac
    printf 'key_mgmt=NONE\nwep_key%d=%s\nwep_tx_keyidx=%d\n' "$2" "$wep_key" "$2"
    case $3 in
    restricted) echo 'auth_alg=SHARED' ;;
    *) echo 'auth_alg=OPEN' ;;
    esac
}

# name_bytes: the bytes of the name, and a full stop after them, which keeps a line end at the end.
name_bytes() {
    rest=$name
    while [ -n "$rest" ]; do
        more=${rest#??}
        printf '%b' "\\0$(printf '%o' "$((0x${rest%"$more"}))")"
        rest=$more
    done
    printf .
}

# wpa_lines KEY: 64 hexadecimal digits are the key itself, 8 to 63 characters the phrase that it is
# made from.
wpa_lines() {
    phrase=
    management=WPA-PSK
    for kind in WPA-PSK-SHA256 FT-PSK; do
        ! offers "$kind" || management="$management $kind"
    done
    case ${#1} in
    64)
        is_hex "$1" || return 1
        psk=$1
        ;;
    [89] | [1-5][0-9] | 6[0-3])
        # wpa_supplicant takes the phrase as it stands between the first and the last quotation
        # mark of the line, and refuses control characters.
        case $1 in
        *[[:cntrl:]]*) return 1 ;;
        esac
        psk=\"$1\"
        for kind in SAE FT-SAE; do
            ! offers "$kind" || management="$management $kind"
        done
        case $1 in
        *\"*\#*)
            # Here it would see a comment: it gets the key that the phrase makes under this name.
            made_for=$(name_bytes)
            made_for=${made_for%.}
            # Later releases of it read from a terminal alone.
            psk=$(printf '%s\n' "$1" | wpa_passphrase "$made_for" 2>/dev/null) ||
                psk=$(wpa_passphrase "$made_for" "$1" 2>/dev/null)
            psk=${psk##*psk=}
            psk=${psk%%[!0-9a-f]*}
            [ ${#psk} -eq 64 ] || return 1
            ! offers SAE || phrase=$(hex "$1")
            ;;
        esac
        ;;
    *) return 1 ;;
    esac
    if [ "$adhoc" = yes ]; then
        # Among equals only WPA2 is defined.
        printf 'proto=RSN\nkey_mgmt=WPA-PSK\npairwise=CCMP\ngroup=CCMP\npsk=%s\n' "$psk"
    else
        printf 'key_mgmt=%s\npsk=%s\n' "$management" "$psk"
        [ -z "$phrase" ] || printf 'sae_password=%s\n' "$phrase"
    fi
}

# choose_security: "off" is what the program gives for no key. A hosted network is given no other,
# whatever its encryption, and is open.
choose_security() {
    if [ "$key" = off ] && { [ "$security" = wep ] || [ "$encryption" = off ]; } ||
        [ "$security:$encryption" = wep:off ]; then
        security=open
    fi
}

# network_block LINE...: the network with these further lines; fails when it cannot have its key.
network_block() {
    if [ "$security:$adhoc" = open:no ] && offers OWE; then
        # Whoever is open for everybody may yet encrypt.
        printf 'network={\nssid=%s\n' "$name"
        printf '%s\n' "$@" 'key_mgmt=OWE' '}'
    fi
    printf 'network={\nssid=%s\n' "$name"
    printf '%s\n' "$@"
    if [ "$adhoc" = yes ]; then
        # Channel 1 is where the network is made when nobody else has made it yet.
        [ "${ap-}" = yes ] && echo 'mode=2' || echo 'mode=1'
        echo 'frequency=2412'
        # To look for it on all channels first takes longer than a caller waits.
        [ "${hosts-}:$security" != yes:open ] || echo 'scan_freq=2412'
    fi
    case $security in
    open) echo 'key_mgmt=NONE' ;;
    wep) wep_lines "$key" "$((index - 1))" "$encryption" || return 1 ;;
    wpa) wpa_lines "$key" || return 1 ;;
    esac
    echo '}'
}
