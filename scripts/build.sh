#!/bin/sh
# Builds the presets of CMakePresets.json, for scripts to source. They stand in the project's folder.

# A copied or moved folder brings builds along that still compile the sources of the other place, and
# a link to their compile commands. Builds of this place stay.
dropForeignBuilds() {
    for cache in build/*/CMakeCache.txt; do
        [ -f "$cache" ] || continue
        home=$(sed -n 's/^CMAKE_HOME_DIRECTORY:INTERNAL=//p' "$cache")
        [ "$(cd "$home" 2>/dev/null && pwd -P)" = "$(pwd -P)" ] || rm -rf "${cache%/*}"
    done
    case $(readlink compile_commands.json) in
        /*) rm compile_commands.json ;;
        ?*) [ -e compile_commands.json ] || rm compile_commands.json ;;
    esac
}

# Builds a preset, or what further arguments say of it. A terminal sees the progress if there is
# something to build; all else sees errors only.
build() {
    dropForeignBuilds
    rules="build/$1/build.ninja"
    if [ -z "$(find "$rules" -newer CMakePresets.json 2>/dev/null)" ]; then
        cmake --preset "$1" >/dev/null
        touch "$rules"
    fi
    if [ -t 2 ] && ! ninja -C "build/$1" -n | grep -q 'no work to do'; then
        cmake --build --preset "$@" >&2
    else
        said=$(cmake --build --preset "$@" -- --quiet 2>&1) || {
            printf '%s\n' "$said" >&2
            return 1
        }
    fi
}
