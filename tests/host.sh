#!/bin/sh
# Lets the host $1 live through the script $2 and compares what it has sampled, printed and reported,
# in any order, with the golden file beside the script. Seconds that have passed read as S: real time
# may pass slower than the script says, never faster.
set -eu
log=$(mktemp)
trap 'rm -f "$log"' EXIT
out=$("$1" --hour-ms 20 "$2" 2>"$log") || { cat "$log"; exit 1; }
{
    printf '%s\n' "$out"
    sed -En 's/^N273 I [^|]*N273/N273/p' "$log"
} | sed -E 's/([tT]ime("? ?: ?"?))[1-9][0-9]*/\1S/g' | LC_ALL=C sort | diff "$2.golden" -
