# shellcheck shell=sh
# For the commands of this folder that stand in front of a tool of the same name.

# Prints the path of the first program called $1 on PATH that does not lie in this command's own
# folder; fails when there is none.
real_tool() {
    case $0 in
    */*) own=$(CDPATH='' cd -P -- "${0%/*}" && pwd) ;;
    *) own=$(pwd -P) ;;
    esac
    left=${PATH-}:/usr/sbin:/usr/bin:/sbin:/bin:
    while [ -n "$left" ]; do
        folder=${left%%:*}
        left=${left#*:}
        : "${folder:=.}"
        if [ -f "$folder/$1" ] && [ -x "$folder/$1" ] &&
            [ "$(CDPATH='' cd -P -- "$folder" && pwd)" != "$own" ]; then
            printf '%s\n' "$folder/$1"
            return 0
        fi
    done
    printf '%s: no other %s on PATH\n' "$1" "$1" >&2
    return 1
}
