#!/bin/sh
# Plays examples with the tool and compares what it prints with the golden file beside each:
#   golden.sh [--update] TOOL EXAMPLE...
# With --update a golden file that differs is replaced, and named.
set -eu
update=
[ "$1" != --update ] || { update=yes && shift; }
tool=$1
shift

made=$(mktemp)
trap 'rm -f "$made"' EXIT
for example; do
    golden="$example.golden"
    "$tool" --json "$example" >"$made"
    if [ -z "$update" ]; then
        diff "$golden" "$made"
    elif ! cmp -s "$golden" "$made"; then
        cat "$made" >"$golden"
        printf 'wrote %s\n' "$golden"
    fi
done
