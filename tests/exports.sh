#!/bin/sh
# Compares what the library $1 exports with the list in $2: the classes, nested ones by themselves, and
# the variables. A helper or an instance of another library's template would show as a name of its own.
set -eu
nm -D --defined-only --demangle "$1" |
    sed -E -e 's/^[0-9a-f]+ . //' -e 's/^(vtable for|VTT for|virtual thunk to) //' \
        -e 's/^(android::[A-Za-z]+)(::[A-Z][A-Za-z]+::)?.*/\1\2/' |
    LC_ALL=C sort -u | diff "$2" -
