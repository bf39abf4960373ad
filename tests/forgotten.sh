#!/bin/sh
# Names what a change to the project in folder $1 has forgotten; $2 is the built library:
#  - a class that is marked as exported and has no entry in the map;
#  - an operation of the facade that no trace can call, nor the stress run, which makes every call;
#  - a call without a row in docs/trace.md;
#  - an event id or a property without a row in docs/output.md;
#  - a property that the recorder does not look at;
#  - an event id whose payload report/Payload.cpp does not take apart.
# shellcheck disable=SC2013  # no line has a blank
set -eu
cd "$1"
status=0

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

for operation in $(nm -D --defined-only --demangle "$2" |
    sed -n 's/.* android::SDCImpl::\([a-z][A-Za-z]*\)(.*/\1/p' | grep -v -e '^handle' -e '^getInstance$'); do  # its own steps
    expect "CALL(SDCImpl, $operation, " trace/calls.inc "the facade's operation $operation"
done

for call in $(sed -n 's/^CALL(\(.*\), \(.*\), .*)/\1.\2/p' trace/calls.inc); do
    expect "| \`$call\` |" docs/trace.md "the call $call"
done

strings() {
    sed 's|//.*||' core/*.cpp exception/*.cpp rgb/*.cpp usage/*.cpp | grep -Eo "\"$1\"" |
        tr -d '"' | sort -u
}
for id in $(strings 'N[0-9]+\|[0-9]+'); do
    expect "\`${id%|*}\\|${id#*|}\`" docs/output.md "the event $id"
    expect "{\"$id\"" report/Payload.cpp "the event $id"
done
for property in $(strings '(persist|ro|service)\.[a-z._]+'); do
    # A row may leave out the first two parts of a name that stand in the name before it.
    suffix=${property#*.*.}
    expect "$suffix\`" docs/output.md "the property $property"
    expect "\"$property\"," record/Surroundings.cpp "the property $property"
done
exit $status
