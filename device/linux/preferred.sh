# shellcheck shell=sh
# SPDX-License-Identifier: MIT
# The preferred networks of /etc/wireless-user.conf as blocks of wpa_supplicant's configuration,
# which wpa-network.sh writes.
# shellcheck disable=SC2034,SC2154

# read_preferred FILE: one line for each network of the list, in its order:
#   NAME ADHOC MANAGEMENT INDEX ENCRYPTION KEY ALIAS
# NAME is hexadecimal; KEY and ALIAS are octal escapes for printf %b. "-" stands for an empty one.
# The list is read as the window reads it: eight lines a network and by their position alone, a
# line of more than 254 bytes as several, 64 networks at most. Only the key is read whole, blanks
# included, as the window writes it.
read_preferred() {
    # The longest list that counts is far shorter.
    od -An -v -N 262144 -tx1 "$1" 2>/dev/null | awk "$unescape"'
    BEGIN {
        for (i = 0; i < 256; i++) {
            hex = sprintf("%02x", i)
            octal[hex] = sprintf("\\0%03o", i)
            if (i > 32 && i < 127)
                character[hex] = sprintf("%c", i)
        }
        blank["20"] = blank["09"] = blank["0a"] = blank["0b"] = blank["0c"] = blank["0d"] = 1
        position = -1
    }
    {
        for (i = 1; i <= NF; i++) {
            length_read++
            if ($i == "00")
                ended = 1
            if (!ended)
                byte[++count] = $i
            if ($i == "0a" || length_read == 254)
                take_line()
        }
    }
    END {
        if (told < 64 && length_read > 0)
            take_line()
        if (told < 64 && position >= 0)
            tell()
    }

    # What follows the first blank: as it is for a key, without blanks around it for a text.
    function rest(is_key,    first, last, text, i) {
        for (first = 1; first <= count && byte[first] != "20"; first++)
            ;
        first++
        last = count
        if (is_key) {
            while (last >= first && (byte[last] == "0a" || byte[last] == "0d"))
                last--
        } else {
            while (last >= first && byte[last] in blank)
                last--
            while (first <= last && byte[first] in blank)
                first++
        }
        text = ""
        for (i = first; i <= last && i < first + 127; i++)
            text = text byte[i]
        return text
    }
    function word(    i, text) {
        for (i = 1; i <= count && byte[i] in blank; i++)
            ;
        for (; i <= count && !(byte[i] in blank); i++)
            ;
        for (; i <= count && byte[i] in blank; i++)
            ;
        text = ""
        for (; i <= count && !(byte[i] in blank); i++)
            text = text (byte[i] in character ? character[byte[i]] : "?")
        return text
    }
    function number(    text) {
        text = word()
        return match(text, /^[+-]?[0-9]+/) ? substr(text, 1, RLENGTH) + 0 : 0
    }
    function escapes(text,    i, result) {
        result = ""
        for (i = 1; i < length(text); i += 2)
            result = result octal[substr(text, i, 2)]
        return result == "" ? "-" : result
    }
    # A control character could do harm where the log is read.
    function readable(text,    i, pair, result) {
        result = ""
        for (i = 1; i < length(text); i += 2) {
            pair = substr(text, i, 2)
            if (pair < "20" || pair == "7f")
                pair = "3f" # a question mark
            result = result octal[pair]
        }
        return result == "" ? "-" : result
    }
    function tell() {
        name = unescaped(name)
        print (name == "" ? "-" : name), adhoc, management, index_of_key, encryption, key, alias
        position = -1
        if (++told == 64)
            exit
    }
    function take_line(    i, text) {
        if (position < 0) {
            text = ""
            for (i = 1; i <= 8 && i <= count; i++)
                text = text byte[i]
            if (text == "5553455243454c4c") { # USERCELL
                position = 0
                name = ""
                key = alias = "-"
                adhoc = "no"
                management = "wep"
                encryption = "off"
                index_of_key = 1
            }
        } else {
            position++
            if (position == 1)
                alias = readable(rest(0))
            else if (position == 2)
                name = rest(0)
            else if (position == 3)
                adhoc = tolower(word()) == "ad-hoc" ? "yes" : "no"
            else if (position == 4)
                management = number() == 0 ? "wep" : "wpa"
            else if (position == 5)
                index_of_key = number() + 1
            else if (position == 6) {
                text = word()
                encryption = text == "open" || text == "restricted" ? text : "off"
            } else {
                key = escapes(rest(1))
                tell()
            }
        }
        count = length_read = ended = 0
    }'
}

# preferred_blocks FILE: a block for each network of the list that can be joined, the first with the
# highest priority. A network that cannot is left out, which one line with its alias says.
preferred_blocks() {
    read_preferred "$1" | {
        priority=65
        while read -r name adhoc security index encryption key alias; do
            priority=$((priority - 1))
            alias=$(printf '%b.' "${alias#-}")
            alias=${alias%.}
            key=$(printf '%b.' "${key#-}")
            key=${key%.}
            : "${key:=off}"
            wanted=
            case ${#name}:$adhoc in
            *:yes) wanted='an Ad-Hoc network is joined by hand' ;;
            1:*) wanted='it has no name' ;;
            [0-9]:* | [1-5][0-9]:* | 6[0-4]:*) ;;
            *) wanted='its name has more than 32 bytes' ;;
            esac
            choose_security
            if [ -z "$wanted" ] && [ "$security" = wep ]; then
                case ${without_wep-no}:$index in
                yes:*) wanted='this wpa_supplicant knows no WEP' ;;
                no:[1-4]) ;;
                *) wanted='its key has no number from 1 to 4' ;;
                esac
            fi
            if [ -z "$wanted" ]; then
                # Whole or not at all.
                if block=$(network_block scan_ssid=1 "priority=$priority"); then
                    printf '%s\n' "$block"
                else
                    wanted='its key has an impossible length'
                fi
            fi
            [ -z "$wanted" ] || say "$alias is left out: $wanted"
        done
    }
}
