#!/bin/sh
# Checks Android.bp in the folder $1 as far as that goes without the device's build system:
#  - it is one module of plain properties, in well-formed syntax;
#  - its sources are the other arguments, the ones that the host's build has, and all that the
#    library's folders hold;
#  - each file and folder that it names exists;
#  - it links the library of each platform header that the sources include, and exports those that
#    the host's headers include.
# shellcheck disable=SC2013,SC2046,SC2086  # lists are words without blanks
set -eu
cd "$1"
shift
here=$(pwd)

fail() {
    printf 'Android.bp: %s\n' "$1" >&2
    exit 1
}

text=$(sed 's|//.*||' Android.bp | tr -d ' \n')
value='("[^",]*"|true|false|\[("[^",]*",)*("[^",]*")?\])'
printf '%s' "$text" | grep -Eqx "cc_library_shared\{([a-z_]+:$value,)*\}" ||
    fail 'not one module of properties that are texts, flags or lists of texts'

# The texts of property $1, a line each.
values() {
    printf '%s' "$text" | grep -Eo "[{,]$1:$value" | grep -Eo '"[^"]*"' | tr -d '"'
}

# Compares two lists of words, in any order; $1 says what they are.
same() {
    [ "$(printf '%s\n' $2 | sort)" = "$(printf '%s\n' $3 | sort)" ] ||
        fail "$1: $(printf '%s ' $2) - expected: $(printf '%s ' $3)"
}

# The libraries of the platform headers that the files named as arguments include.
libraries_of() {
    for header in $(sed -n 's/^#include <\(.*\/.*\)>/\1/p' "$@" | sort -u); do
        case $header in
            android/gui/* | gui/*) echo libgui ;;
            android/log.h) echo liblog ;;
            json/*) echo libjsoncpp ;;
            hardware/* | sys/*) ;;  # headers alone, of the build's global include folders
            *) echo "lib${header%%/*}" ;;
        esac
    done | sort -u
}

same sources "$(ls $(values srcs))" "$(printf '%s\n' "$@" | sed "s|^$here/||")"
same sources "$(ls $(values srcs))" "$(find core exception rgb usage -name '*.cpp')"
for path in $(values export_include_dirs) $(values version_script); do
    [ -e "$path" ] || fail "$path does not exist"
done
same 'linked libraries' "$(values static_libs) $(values shared_libs)" \
    "$(libraries_of core/*.* exception/*.* rgb/*.* usage/*.*) libbase libtally_nc libsensorconfig"
same 'exported libraries' "$(values export_shared_lib_headers)" \
    "$(libraries_of $(grep -l SENSOR_PRIV_EXPORT core/*.h exception/*.h rgb/*.h usage/*.h))"
same 'header libraries' "$(values header_libs)" libbase_headers
same 'exported header libraries' "$(values export_header_lib_headers)" libbase_headers
same 'word size' "$(values compile_multilib)" both
for property in cpp_std vendor local_include_dirs; do
    printf '%s' "$text" | grep -q "[{,]$property:" && fail "$property: must not be set"
done
exit 0
