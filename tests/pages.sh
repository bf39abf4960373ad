#!/bin/sh
# Checks the pages of the project in folder $1:
#  - outside of tables and examples, no line is wider than 100 columns;
#  - each link to a file or to a heading leads there;
#  - each folder, and each file of one of them, that stands in backquotes is there;
#  - what a page shows of a summary (```text) stands in that of registrations.capture.txt.
# shellcheck disable=SC2013,SC2016  # no link has a blank; backquotes are the pages'
set -eu
cd "$1"
status=0
folders=$(find . -mindepth 1 -maxdepth 1 -type d -name '[a-z]*' ! -name build | cut -c3- |
    paste -sd '|')

say() {
    printf '%s\n' "$1"
    status=1
}

# The headings of page $1 as links write them.
anchors() {
    sed -n 's/^##* //p' "$1" | tr 'A-Z ' 'a-z-' | tr -cd 'a-z0-9\n_-'
}

for page in README.md CHANGELOG.md docs/*.md examples/*/*.md; do
    # Bytes of UTF-8 that go on with a character have no width.
    LC_ALL=C sed -e '/^ *```/,/^ *```/s/.*//' -e 's/^ *|.*//' -e 's/[\x80-\xBF]//g' "$page" |
        LC_ALL=C awk -v page="$page" 'length > 100 { print page ":" NR ": wider than 100 columns" }' |
        grep . && status=1

    for link in $(grep -o ']([^)]*)' "$page" | sed 's/](\(.*\))/\1/' | grep -v '^http'); do
        file=$page
        [ "${link%%#*}" = "" ] || file=$(dirname "$page")/${link%%#*}
        if [ ! -e "$file" ]; then
            say "$page: no file ${link%%#*}"
        elif [ "$link" != "${link#*#}" ] && ! anchors "$file" | grep -qx -e "${link#*#}"; then
            say "$page: no heading ${link#*#}"
        fi
    done

    # A class stands for its files. The heart rate is the example of a module that is to be written.
    for path in $(grep -oE "\`($folders)/[A-Za-z0-9./_-]*\`" "$page" | tr -d '`' |
        grep -vi 'heart-*rate' | sort -u); do
        set -- "$path"*
        [ -e "$1" ] || say "$page: no file $path"
    done

    sed -n '/^```text$/,/^```$/p' "$page" | grep -v '^```' |
        { grep -vxFf examples/registrations.capture.txt.summary || true; } |
        sed "s|^|$page: not in a summary: |" | grep . && status=1
done
exit $status
