#!/bin/sh
# Plays the file $3 by two builds of sensor-replay, $1 and $2, in every form: but for the time that it
# took, both give the same bytes on both streams and in files, and the same exit status.
set -eu
folder=$(mktemp -d)
trap 'rm -r "$folder"' EXIT

for build in 1 2; do
    [ $build = 1 ] && tool=$1 || tool=$2
    mkdir "$folder/$build"
    cd "$folder/$build"
    for form in all log json print-trace page=page.html timeline=timeline.json; do
        status=0
        "$tool" "--$form" "$3" >"$form.out" 2>"$form.err" || status=$?
        printf 'exit status %s\n' $status >>"$form.err"
    done
    sed -i 's/^\(Played .*, in \).*/\1some time/' ./*
done
diff -r "$folder/1" "$folder/2"
