#!/bin/sh
# Plays the file $3 by two builds of sensor-replay, $1 and $2, in every form: but for the time that it
# took, both give the same bytes on both streams, and the same exit status.
set -eu
folder=$(mktemp -d)
trap 'rm -r "$folder"' EXIT

# Runs the command after $1 and keeps what it gives as $1.
keep() {
    name=$1
    shift
    status=0
    "$@" >"$name.out" 2>"$name.err" || status=$?
    printf 'exit status %s\n' $status >>"$name.err"
    sed -i 's/^\(Played .*, in \).*/\1some time/' "$name.out"
}
for form in --all --log --json --print-trace; do
    keep "$folder/first" "$1" $form "$3"
    keep "$folder/second" "$2" $form "$3"
    diff "$folder/first.out" "$folder/second.out"
    diff "$folder/first.err" "$folder/second.err"
done
