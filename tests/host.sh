#!/bin/sh
# Lets a host live through a script, and compares what it has sampled, printed and reported, in any
# order, with the golden file beside the script:
#   host.sh [--update] HOST SCRIPT
# With --update a golden file that differs is replaced, and named. Seconds that have passed read as S:
# real time may pass slower than the script says, never faster.
set -eu
update=
[ "$1" != --update ] || { update=yes && shift; }
golden="$2.golden"

made=$(mktemp)
log=$(mktemp)
trap 'rm -f "$made" "$log"' EXIT
out=$("$1" --hour-ms 20 "$2" 2>"$log") || { cat "$log"; exit 1; }
{
    printf '%s\n' "$out"
    sed -En 's/^N273 I [^|]*N273/N273/p' "$log"
} | sed -E 's/([tT]ime("? ?: ?"?))[1-9][0-9]*/\1S/g' | LC_ALL=C sort >"$made"
if [ -z "$update" ]; then
    diff "$golden" "$made" || {
        printf '%s differs. If the change is wanted: ./test --update-golden\n' "$golden"
        exit 1
    }
elif ! cmp -s "$golden" "$made"; then
    cat "$made" >"$golden"
    printf 'wrote %s\n' "$golden"
fi
