#!/bin/sh
# Plays a small fleet as docs/many-captures.md says, and asks its questions:
#   fleet.sh FOLDER TOOL
# FOLDER is the project's. The tasks of the job array run one after another, without Slurm.
set -eu
folder=$1
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
cd "$work"

mkdir -p bin out 'reports/13/2024-03-02'
ln -s "$2" bin/sensor-replay
PATH=$work/bin:$PATH
export PATH
cp "$folder/examples/registrations.capture.txt" 'reports/13/2024-03-02/a "phone".txt'
echo 'no capture' >reports/13/2024-03-02/broken.txt
cp "$folder/examples/registrations.capture.txt" reports/13/2024-03-02/other.txt
find reports -type f | sort >list
for task in 1 2; do
    SLURM_ARRAY_JOB_ID=7 SLURM_ARRAY_TASK_ID=$task SLURM_ARRAY_TASK_COUNT=2 \
        "$folder/examples/fleet/replay.sbatch" list out
done
echo reports/13/2024-03-02/broken.txt | diff - out/7-2.failed
cat out/*.jsonl >fleet.jsonl

ask() {
    sqlite3 -init "$folder/examples/fleet/fleet.sql" fleet.db
}
ask >used <<'END'
.mode list
.headers off
.separator "|" "\n"
select day, sensor, app, count(distinct file), sum(seconds), hz from use group by 1, 2, 3;
END
diff - used <<'END'
2024-03-01|accelerometer|com.example.launcher.OrientationListener/android|2|23400|15.0
2024-03-01|accelerometer|com.example.pedometer/com.example.pedometer|2|10800|50.0
2024-03-01|proximity|com.example.dialer/com.example.dialer|2|4800|
2024-03-02|accelerometer|com.example.launcher.OrientationListener/android|2|7200|15.0
2024-03-02|accelerometer|com.example.pedometer/com.example.pedometer|2|10800|50.0
2024-03-02|gyroscope|com.example.panorama.GyroReader$Listener/com.example.panorama.GyroReader$Listener|2|170|200.0
END

# The same of uses: those of `--uses` are those of the lines.
mkdir -p reports/16/2024-03-05
cp "$folder/examples/what-is-on.capture.txt" reports/16/2024-03-05/new.txt
find reports -type f ! -name broken.txt -print0 | sort -z >sound
xargs -0 bin/sensor-replay --uses uses.csv <sound >/dev/null
xargs -0 bin/sensor-replay --json <sound >lines.jsonl
askUses() {
    sqlite3 -init "$folder/examples/fleet/uses.sql" uses.db
}
printf '.mode list\n.headers off\nselect count(*) from use_day;\n' | askUses >counted
grep -c '"use": ' lines.jsonl | diff - counted
# One that is on through a night, and one that is just not.
printf 'reports/%s,,,night,n,,Clock,1,,,,n,2024-03-%s,2024-03-%s,,,0,off,1,,,,1,0,,\r\n' \
    9/x/a 01T23:00:00 02T04:00:00 8/x/b 02T02:00:01 03T03:59:59 >>uses.csv
awk '/^```sql uses$/ { name = NR ".uses"; next } /^```$/ { name = "" } name { print > name }' \
    "$folder/docs/many-captures.md"
for question in *.uses; do
    printf '.headers off\n.mode list\n' | cat - "$question" | askUses
done >answers
diff - answers <<'END'
com.example.chat|Example Accelerometer|1|0.38
com.example.fitness|Example Step Counter|1|0.38
com.example.game|Example Gyroscope|1|0.38
android|Example Motion Detector|1|0.24
com.example.map|Example Accelerometer|1|0.14
android|Example Proximity|1|0.0
16|com.example.chat|Example Accelerometer|0.38
16|com.example.fitness|Example Step Counter|0.38
16|com.example.game|Example Gyroscope|0.38
16|android|Example Motion Detector|0.24
16|com.example.map|Example Accelerometer|0.14
16|android|Example Proximity|0.0
9|Clock|1
END

# Each question of the page has an answer.
awk '/^```sql$/ { name = NR ".sql"; next } /^```$/ { name = "" } name { print > name }' \
    "$folder/docs/many-captures.md"
for question in *.sql; do
    ask <"$question" >answer
    [ -s answer ] || { printf 'no answer to line %s\n' "${question%.sql}" && exit 1; }
done
