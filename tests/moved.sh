#!/bin/sh
# A copied or moved folder drops the builds of its old place, and a link to their compile commands:
#   moved.sh FOLDER
# FOLDER is the project's. Builds of its own place stay, whichever name it is called by.
set -eu
. "$1/scripts/build.sh"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

mkdir -p "$work/old/build/release" "$work/old/build/debug"
ln -s old "$work/name"
ln -s build/debug/compile_commands.json "$work/old/compile_commands.json"
printf 'CMAKE_HOME_DIRECTORY:INTERNAL=%s\n' "$work/old" >"$work/old/build/release/CMakeCache.txt"
printf 'CMAKE_HOME_DIRECTORY:INTERNAL=%s\n' "$work/name" >"$work/old/build/debug/CMakeCache.txt"
: >"$work/old/build/debug/compile_commands.json"

# What is left in folder $1 must be the other arguments.
expect() {
    cd "$work/$1"
    shift
    dropForeignBuilds
    left=$(ls -d build/* compile_commands.json 2>/dev/null || true)
    expected=$(printf '%s\n' "$@")
    [ "$left" = "$expected" ] || {
        printf 'left: %s\nexpected: %s\n' "$left" "$expected"
        exit 1
    }
}
expect old build/debug build/release compile_commands.json
cp -R "$work/old" "$work/copy"
expect copy ''
expect name build/debug build/release compile_commands.json
rm "$work/name"
mv "$work/old" "$work/new"
ln -s "$work/copy/compile_commands.json" "$work/copy/compile_commands.json"
expect copy ''
expect new ''
