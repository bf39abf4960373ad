#!/bin/sh
# Plays all examples of docs/trace.md:
#   trace-page.sh FOLDER TOOL
# FOLDER is the project's. Each fenced block of JSON Lines is a trace that must play; one with
# "expect" lines must also be met. Together they must make every call of trace/calls.inc. The page's
# table of variables must be what the library says.
# shellcheck disable=SC2016  # the backquotes are the page's
set -eu
folder=$1
tool=$2
status=0

say() {
    printf 'docs/trace.md: %s\n' "$1"
    status=1
}

work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
cp "$folder"/examples/*.png "$work"
cd "$work"
# A block is named after the line at which it begins.
awk '/^```jsonl$/ { name = NR ".jsonl"; next } /^```$/ { name = "" } name { print > name }' \
    "$folder/docs/trace.md"
for trace in *.jsonl; do
    "$tool" --json "$trace" >played || say "the example at line ${trace%.jsonl} does not play"
    if grep -q '"expect"' "$trace"; then
        "$tool" --check "$trace" >checked || say "the example at line ${trace%.jsonl} is not met"
    fi
done
[ -f checked ] || say 'no example of "expect"'

for call in $("$tool" --list-calls | sed 's/ .*//'); do
    grep -qF "\"call\": \"$call\"" ./*.jsonl || say "no example of $call"
done
for kind in set property display boot expect; do
    grep -q "\"$kind\": " ./*.jsonl || say "no example of \"$kind\""
done

sed -n -e 's/^| `\([A-Za-z]*\)` | integer | \(.*\) |$/int32_t \1 = \2;/p' \
    -e 's/^| `\([A-Za-z]*\)` | bool | \(.*\) |$/bool \1 = \2;/p' "$folder/docs/trace.md" |
    sort >documented
{
    grep -E '^(int32_t|bool) ' "$folder/rgb/LightSensorState.cpp"
    sed -n 's/^int mLogSwitch/int32_t mLogSwitch/p' "$folder/platform/SensorConfig.cpp"
} | sort | diff documented - || say 'its variables are not those of the library'
exit $status
