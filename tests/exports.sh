#!/bin/sh
# Compares what the library $1 exports with its map $2: the classes, nested ones by themselves, and the
# variables. A helper, an instance of another library's template, and a class of the map that nobody
# defines show as a difference. (That every single name of the map is defined, the linker checks.)
set -eu
map=$(sed -n -E -e 's/^ *([A-Za-z]+);$/\1/p' -e 's/^ *(android::[A-Za-z]+)::\*;$/\1/p' "$2" |
    LC_ALL=C sort)
exports=$(nm -D --defined-only --demangle "$1" |
    sed -E -e 's/^[0-9a-f]+ . //' -e 's/^(vtable for|VTT for|virtual thunk to) //' \
        -e 's/^(android::[A-Za-z]+)(::[A-Z][A-Za-z]+::)?.*/\1\2/' | LC_ALL=C sort -u)
[ "$map" = "$exports" ] || {
    printf 'in the map:\n%s\nexported:\n%s\n' "$map" "$exports"
    exit 1
}
