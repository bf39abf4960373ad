#!/bin/sh
# Plays examples with the tool and compares what it makes of them with the golden files beside each:
#   golden.sh [--update] TOOL EXAMPLE...
# NAME.golden is there for each example. NAME.summary, NAME.timeline, NAME.page, NAME.uses and
# NAME.since-charge are there for some. Of X.after.Y, X.after.Y.compared holds it against X.before.Y,
# and X.after.Y.timelines has both.
# With --update a golden file that differs is replaced, and named.
set -eu
update=
[ "$1" != --update ] || { update=yes && shift; }
tool=$1
shift

made=$(mktemp)
trap 'rm -f "$made"' EXIT

# Compares what was made with golden file $1.
compare() {
    if [ -z "$update" ]; then
        diff "$1" "$made" || {
            printf '%s differs. If the change is wanted: ./test --update-golden\n' "$1"
            exit 1
        }
    elif ! cmp -s "$1" "$made"; then
        cat "$made" >"$1"
        printf 'wrote %s\n' "$1"
    fi
}

for example; do
    cd "$(dirname "$example")"
    name=$(basename "$example")
    "$tool" --json "$name" >"$made"
    compare "$name.golden"
    if [ -f "$name.summary" ]; then
        "$tool" "$name" | sed 's/, in [0-9.]* s\.$/, in ... s./' >"$made"  # the one line with real time
        compare "$name.summary"
    fi
    if [ -f "$name.timeline" ]; then
        "$tool" --timeline "$made" "$name" >/dev/null
        compare "$name.timeline"
    fi
    if [ -f "$name.page" ]; then
        "$tool" --page "$made" "$name" >/dev/null
        # Its style and its script are the same on each page.
        sed -i -e '/^<style>/,/^<\/style>/d' -e '/^<script type="module">/,/^<\/script>/d' \
            -e "s|sha256-[^']*|sha256-...|g" "$made"
        compare "$name.page"
    fi
    for table in uses since-charge; do
        [ -f "$name.$table" ] || continue
        "$tool" "--$table" "$made" "$name" >/dev/null
        compare "$name.$table"
    done
    before=${name%%.after.*}.before.${name#*.after.}
    if [ -f "$name.compared" ]; then
        "$tool" --baseline "$before" "$name" >"$made"
        "$tool" --json --baseline "$before" "$name" >>"$made"
        compare "$name.compared"
    fi
    if [ -f "$name.timelines" ]; then
        "$tool" --timeline "$made" "$before" "$name" >/dev/null
        compare "$name.timelines"
    fi
done
