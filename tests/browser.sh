#!/bin/sh
# Checks the page, its script and its looks, in a real browser: browser.sh TOOL DAY BEFORE AFTER
# DAY is phone-day.jsonl, the others are captures to compare. The packages that this takes from npm come to the folder
# page-tools beside TOOL, and are no part of the project.
set -eu
tests=$(cd "$(dirname "$0")" && pwd)
tool=$(realpath "$1")
shift
axe=4.14.1
eslint=8.57.1  # the last one that runs on Debian's Node

folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
packages=$(dirname "$tool")/page-tools
if ! [ -e "$packages/$axe-$eslint" ]; then
    rm -rf "$packages"
    mkdir -p "$packages"
    npm install --prefix "$packages" --no-save --no-package-lock --ignore-scripts --no-audit \
        --no-fund --silent "axe-core@$axe" "eslint@$eslint"
    : >"$packages/$axe-$eslint"
fi

script=$tests/../report/page/page.js
"$packages/node_modules/.bin/eslint" --no-eslintrc -c "$tests/page.eslintrc.json" \
    "$script" --parser-options=ecmaVersion:2022
size=$(wc -c <"$script")
[ "$size" -le 20480 ] || { printf '%s: %s bytes, at most 20480\n' "$script" "$size" && exit 1; }

node "$tests/page-check.mjs" "$tool" "$packages/node_modules/axe-core/axe.min.js" "$folder" "$@"
