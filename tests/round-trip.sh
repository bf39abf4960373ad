#!/bin/sh
# Holds the trace that is printed of a capture to the capture itself: all outputs are the same.
#   round-trip.sh TOOL CAPTURE...
# Only the file's name and the seconds that the replay took may differ. Several captures are merged
# as well.
set -eu
tool=$1
shift
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
status=0

# All outputs of the input that the arguments name, in folder $1.
play() {
    folder=$1
    shift
    mkdir "$folder"
    "$tool" --all --page "$folder/page" --timeline "$folder/timeline" "$@" 2>"$folder/errors" |
        sed -e 1d -e 's/, in [0-9.]* s\.$//' >"$folder/summary"
    "$tool" --json "$@" >"$folder/json" 2>>"$folder/errors"
    "$tool" --log "$@" >"$folder/log" 2>>"$folder/errors"
    sed -i '/^<title>/d; /^<h1>/d; /^<h2 id="input-1">/d' "$folder/page"
}

hold() {
    rm -rf "${work:?}"/*
    "$tool" --print-trace "$@" >"$work/trace" 2>"$work/warnings"
    play "$work/capture" "$@"
    play "$work/printed" "$work/trace"
    grep -q '"use": ' "$work/capture/json" && [ ! -s "$work/printed/errors" ] &&
        rm "$work/capture/errors" "$work/printed/errors" &&
        diff -r "$work/capture" "$work/printed" >"$work/differences" && return
    printf '%s: its trace plays differently\n' "$*"
    head -n 5 "$work/differences"
    status=1
}

for capture; do hold "$capture"; done
[ $# -eq 1 ] || hold --merge "$@"
exit $status
