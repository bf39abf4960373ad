#!/bin/sh
# Compares the lines that the page $1 shows of a device's log and properties with what the library
# logs and sets in the golden file $2: all but the log lines of all totals, which are wide.
set -eu
shown=$(mktemp)
trap 'rm -f "$shown"' EXIT
grep -E '^([DIE]/_Z_ZSensorFusion: |\[persist)' "$1" >"$shown"
{
    sed -nE 's/.*"log": \{"level": (.), "tag": "(.*)", "text": "(.*)"\}\}$/\1\/\2: \3/p' "$2" |
        sed -E -e 's/^3/D/' -e 's/^4/I/' -e 's/^6/E/' -e 's/ +$//' -e '/FastChargeUT/d'
    sed -nE 's/.*"property": \{"name": "(.*)", "value": "(.*)"\}\}$/[\1]: [\2]/p' "$2" |
        LC_ALL=C sort -u
} | diff "$shown" -
