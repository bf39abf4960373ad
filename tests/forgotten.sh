#!/bin/sh
# Names what a change to the project in folder $1 has forgotten; $2 and $3 are the built library and
# sensor-replay:
#  - a class that is marked as exported and has no entry in the map;
#  - an operation of the facade that no trace can call, nor the stress run, which makes every call;
#  - a call without a row in docs/trace.md, and its class in the recorder's map;
#  - an event id, a property or a cause of the summary without a row in docs/output.md;
#  - a property that the recorder does not look at;
#  - an event id, or a property, that trace/Words.h does not have;
#  - an event, a property that is kept, or a column of a daily list that report/EventText.cpp has no
#    words for;
#  - a sensor whose connections are routed and that trace/Words.h takes for one that nobody watches;
#  - an option of sensor-replay that its manual or the completion does not have, and the reverse;
#  - a version that the list of changes does not have.
# shellcheck disable=SC2013  # no line has a blank
set -eu
cd "$1"
status=0
causes=$(mktemp)
trap 'rm -f "$causes"' EXIT

# $1 must stand in file $2; $3 says what it is.
expect() {
    grep -qF "$1" "$2" && return
    printf '%s: nothing about %s\n' "$2" "$3"
    status=1
}

for class in $(sed -n 's/^class SENSOR_PRIV_EXPORT \([A-Za-z]*\).*/\1/p' \
    core/*.h exception/*.h rgb/*.h usage/*.h); do
    expect "    android::$class::*;" core/sensor-priv.map "the exported class $class"
done

# Left out: the steps of its own operations, and getInstance.
for operation in $(nm -D --defined-only --demangle "$2" |
    sed -n 's/.* android::SDCImpl::\([a-z][A-Za-z]*\)(.*/\1/p' | grep -v -e ^handle -e ^get); do
    expect "(SDCImpl, $operation," trace/calls.inc "the facade's operation $operation"
done

for call in $(sed -n 's/^CALL(\([A-Za-z]*\), \([A-Za-z]*\), .*/\1.\2/p' trace/calls.inc); do
    expect "| \`$call\` |" docs/trace.md "the call $call"
done

for class in $(sed -n 's/^SINGLETON(\([A-Za-z]*\))/\1/p' trace/calls.inc); do
    expect "    android::$class::*;" record/sensor-priv-record.map "the class $class, which hosts call"
done

strings() {
    sed 's|//.*||' core/*.cpp exception/*.cpp rgb/*.cpp usage/*.cpp | grep -Eo "\"$1\"" |
        tr -d '"' | sort -u
}
for id in $(strings 'N[0-9]+\|[0-9]+'); do
    expect "\`${id%|*}\\|${id#*|}\`" docs/output.md "the event $id"
    expect "\"$id\"" trace/Words.h "the event $id"
done
for property in $(strings '(persist|ro|service)\.[a-z._]+'); do
    # A row may leave out the first two parts of a name that stand in the name before it.
    suffix=${property#*.*.}
    expect "$suffix\`" docs/output.md "the property $property"
    expect "\"$property\"," trace/Words.h "the property $property"
done

# The names of the enum $1, up to the first of those that $2 matches.
names() {
    sed -n "/^enum class $1 {/,/^};/s/^ *\(k[A-Za-z]*\),.*/\1/p" trace/Words.h | sed "/$2/,\$d"
}
for kind in $(names EventKind kUnknown); do
    expect "{EventKind::$kind, \"" report/EventText.cpp "the event $kind"
done
for property in $(names Property kSkipRestriction); do
    expect "{Property::$property, \"" report/EventText.cpp "the property $property"
done
for column in $(sed -n 's/.*(\*entry)\["\([A-Za-z]*\)"\].*/\1/p' usage/*.cpp exception/*.cpp | sort -u); do
    expect "{\"$column\", \"" report/EventText.cpp "the column $column"
done
for sensor in $(sed -n 's/^ *{\(SENSOR_TYPE_[A-Z_]*\), Route::.*/\1/p' core/SDCImpl.cpp); do
    expect "{$sensor, Watch::" trace/Words.h "the watched sensor $sensor"
done

sed -n '/kTexts\[\]/,/};/p' report/CauseText.cpp | tr -d '\n' | sed 's/" *"//g' |
    grep -o '"[^"]*"' | tr -d '"' >"$causes"
while read -r cause; do
    expect "| $cause |" docs/output.md "the cause"
done <"$causes"

options=$("$3" --help | sed -n 's/^  \(-h,\)\{0,1\}\(--[a-z-]*\).*/\2/p')
for option in $options; do
    grep -qE -e "^\.It .*Fl -?${option#-}( |$)" docs/sensor-replay.1 || {
        printf 'docs/sensor-replay.1: nothing about the option %s\n' "$option"
        status=1
    }
done
completed=$(grep -oE -e '--[a-z]+(-[a-z]+)*' packaging/sensor-replay.bash | sort -u)
expected=$(printf '%s\n' "$options" | sort -u)
[ "$completed" = "$expected" ] || {
    printf 'packaging/sensor-replay.bash: has %s\nsensor-replay has %s\n' "$completed" "$expected"
    status=1
}
for option in $(sed -n 's/^\.It.*Fl -\([a-z-]*\).*/--\1/p' docs/sensor-replay.1); do
    printf '%s\n' "$options" | grep -qx -e "$option" || {
        printf 'docs/sensor-replay.1: there is no option %s\n' "$option"
        status=1
    }
done

version=$("$3" --version)
expect "## ${version#* }" CHANGELOG.md "the version ${version#* }"
exit $status
