#!/bin/sh
# Records what happens to the library in COMMAND... and compares a replay of the record with it:
#   record.sh RECORDER REPLAY COMMAND...
# If the command prints events and properties as JSON, the replay must give the same at the same times.
set -eu
recorder=$1
replay=$2
shift 2

folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
happened() {
    sed -n -e 's/, "fields": .*//' -e 's/, "ahead": true//' -e '/"event": {/p' -e '/"property": {/p' "$1"
}
env LD_PRELOAD="$recorder" SENSOR_PRIV_RECORD="$folder" "$@" >"$folder/out" 2>"$folder/err" ||
    { cat "$folder/err"; exit 1; }
"$replay" --check "$folder/sensor-priv.jsonl"
"$replay" --json "$folder/sensor-priv.jsonl" >"$folder/replayed"
happened "$folder/out" >"$folder/before"
happened "$folder/replayed" >"$folder/after"
[ ! -s "$folder/before" ] || diff "$folder/before" "$folder/after"
