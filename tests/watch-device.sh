#!/bin/sh
# Watches a stand-in for a device that keeps its newest three registrations and is unplugged now and
# then: watch-device.sh SENSOR_REPLAY SCRIPT. What is merged must hold all registrations; the one
# gap must be named.
set -eu
replay=$1
script=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
mkdir "$work/bin"
cat >"$work/bin/adb" <<'END'
#!/bin/sh
# Answers as the device does at its minute n; the clock, which is asked last, lets a minute pass.
n=$(cat "$WORK/minute")
lines() {
    for i in $(seq "$1" -1 $(($1 - 2))); do
        printf '10:%02d:00 + 0x00000001 pid=  100 uid=10001 package=app%s samplingPeriod=20000us batchingPeriod=0us\r\n' "$i" "$i"
    done
}
[ "$1" = shell ] || exit 9
case $n in 4 | 14) online=no ;; *) online=yes ;; esac
case "$2 $3" in
    'date '*)
        [ "$n" -lt 22 ] || kill -INT "$(cat "$WORK/pid")"
        asked=$(cat "$WORK/asked")
        echo $((1 - asked)) >"$WORK/asked"
        [ "$online" = yes ] || { echo 1 >"$WORK/asked"; asked=1; }
        [ "$asked" = 0 ] || echo $((n + (n == 14 ? 5 : 2))) >"$WORK/minute"
        [ "$online" = yes ] || { echo 'error: no devices found' >&2; exit 1; }
        printf '2024-05-01_10:%02d:30\r\n' "$n" ;;
    'dumpsys sensorservice')
        printf 'Sensor List:\r\n'
        printf '0x00000001) Acc | Maker | ver: 1 | type: android.sensor.accelerometer(1) | perm: n/a\r\n'
        printf 'Previous Registrations:\r\n'
        lines "$n" ;;
    'dumpsys batterystats')
        printf 'Battery History (1%% used, 1KB used of 256KB, 1 strings using 3):\r\n'
        printf '   0 (1) RESET:TIME: 2024-05-01-09-00-00\r\n'
        printf '   0 (2) 050 status=charging plug=usb +screen\r\n'
        [ "$n" -lt 8 ] || printf '   +1h08m00s000ms (2) 050 -screen\r\n'
        printf '\r\n' ;;
    *) exit 9 ;;
esac
END
chmod +x "$work/bin/adb"
echo 2 >"$work/minute"
echo 0 >"$work/asked"
export WORK="$work"
cat >"$work/expected" <<'END'
35990000 [[2, 0, 2]]}
35990000 [2]}
35990000 [[10, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0]]}
35990000 [[7, 0, 0, 0, 0, 0, 0, 0]]}
36480000 [[2, 0, 1]]}
37290000 [0]}
END
folder="$work/a day"
PATH=$work/bin:$PATH sh -c 'echo $$ >"$WORK/pid"; exec "$0" --every 0 "$1"' "$script" "$folder" \
    >"$work/out" 2>"$work/err" </dev/null

fail() {
    printf '%s\n' "$1" >&2
    cat "$work/out" "$work/err" >&2
    exit 1
}
[ "$(cat "$work/out")" = "Play them: sensor-replay --merge '$folder'/*" ] || fail 'no advice'
grep -q '^No answer: error: no devices found. Waiting' "$work/err" || fail 'no word when unplugged'
[ "$(grep -c '^The device answers' "$work/err")" = 3 ] || fail 'no word when plugged again'

"$replay" --merge --print-trace "$folder"/* >"$work/trace" 2>"$work/warnings"
grep -o '"app[0-9]*", "a' "$work/trace" | tr -dc '0-9\n' >"$work/apps"
{ seq 0 2 && seq 6 12 && seq 19 21; } | diff - "$work/apps" || fail 'not the registrations expected'
[ "$(sed 's/.*: warning: //' "$work/warnings")" = \
"registrations are missing from 2024-05-01 10:02:00 to 2024-05-01 10:06:00
registrations are missing from 2024-05-01 10:12:00 to 2024-05-01 10:19:00" ] || fail 'other warnings'
# The charger from the start on, the display off at 10:08, the end with the last answer.
sed -n 's/{"at": \([0-9]*\), "call": "SDCImpl.s[a-z]*\(Notification\|ChargeState\)", "args": /\1 /p' \
    "$work/trace" | diff - "$work/expected" || fail 'not the states expected'
