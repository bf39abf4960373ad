#!/bin/sh
# Installs the build in folder $1 elsewhere and plays the example $2 there: it prints the golden file.
# The tool finds what it loads by its own place, and nothing in the build.
set -eu
folder=$(mktemp -d)
trap 'rm -r "$folder"' EXIT
cmake --install "$1" --prefix "$folder" >"$folder/log"
"$(dirname "$0")/golden.sh" "$folder/bin/sensor-replay" "$2"
for file in "$folder"/bin/* "$folder"/lib/*/sensor-replay/*; do
    case $(objdump -p "$file") in
        *"$1"*)
            printf '%s looks for libraries in %s\n' "$file" "$1"
            exit 1
            ;;
    esac
done
