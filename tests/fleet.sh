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
grep -v broken list | tr '\n' '\0' >sound
xargs -0 bin/sensor-replay --uses uses.csv <sound >/dev/null
xargs -0 bin/sensor-replay --json <sound >lines.jsonl
askUses() {
    sqlite3 -init "$folder/examples/fleet/uses.sql" uses.db
}
printf '.mode list\n.headers off\nselect count(*) from use_day;\n' | askUses >counted
grep -c '"use": ' lines.jsonl | diff - counted
awk '/^```sql uses$/ { name = NR ".uses"; next } /^```$/ { name = "" } name { print > name }' \
    "$folder/docs/many-captures.md"
for question in *.uses; do
    askUses <"$question" >answer || { printf 'no answer to line %s\n' "${question%.uses}" && exit 1; }
done

# Each question of the page has an answer.
awk '/^```sql$/ { name = NR ".sql"; next } /^```$/ { name = "" } name { print > name }' \
    "$folder/docs/many-captures.md"
for question in *.sql; do
    ask <"$question" >answer
    [ -s answer ] || { printf 'no answer to line %s\n' "${question%.sql}" && exit 1; }
done
