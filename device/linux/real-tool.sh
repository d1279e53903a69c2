# shellcheck shell=sh
# SPDX-License-Identifier: MIT
# For the commands of this directory that stand in front of a tool of the same name. "$own" is this
# directory.

# real_tool NAME: prints the path of the system's program NAME, the first that does not lie in this
# directory; fails when there is none. The caller's PATH does not count: it is root who runs this.
real_tool() {
    # shellcheck disable=SC2154 # the command's
    own_path=$(CDPATH='' cd -P -- "$own" && pwd)
    for place in /usr/local/sbin /usr/local/bin /usr/sbin /usr/bin /sbin /bin; do
        if [ -f "$place/$1" ] && [ -x "$place/$1" ] &&
            [ "$(CDPATH='' cd -P -- "$place" && pwd)" != "$own_path" ]; then
            printf '%s\n' "$place/$1"
            return 0
        fi
    done
    return 1
}

# pass_on NAME ARGUMENT...: becomes the system's program NAME.
pass_on() {
    name=$1
    shift
    real=$(real_tool "$name") || {
        printf '%s: there is no other %s on this system\n' "$name" "$name" >&2
        exit 127
    }
    exec "$real" "$@"
}
