#!/bin/sh
# Opens the page of an example in a real browser: browser.sh TOOL EXAMPLE
# The browser must see a slice for each time that a sensor was held, every name as text and not as
# markup, and nothing to complain of.
set -eu
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
"$1" --page "$folder/page.html" "$2" >/dev/null

chromium --headless --no-sandbox --disable-gpu --disable-quic --no-first-run \
    --disable-background-networking --disable-component-update --disable-sync \
    --user-data-dir="$folder/profile" --enable-logging=stderr --dump-dom \
    "file://$folder/page.html" >"$folder/dom" 2>"$folder/log"

status=0
# $1 is what is counted, $2 the pattern of what it stands in, $3 how often it must be there.
expect() {
    found=$(grep -o "$2" "$folder/dom" | wc -l)
    [ "$found" -eq "$3" ] && return
    printf '%s: %s found, %s expected\n' "$1" "$found" "$3"
    status=1
}
expect slices '<rect class="slice"' 11  # 8 uses, 3 of them on two days
expect 'bands of the display' '<rect class="display"' 1
expect 'bands of the charger' '<rect class="charge"' 1
expect reports '<line class="report"' 2
expect tables '<table>' 4
expect 'names as text' '&lt;script&gt;alert' 8
expect scripts '<script' 0
expect 'text that turns its direction' "$(printf '\342\200\256')" 0
if grep -E 'CONSOLE|Uncaught|Refused' "$folder/log"; then status=1; fi
exit $status
