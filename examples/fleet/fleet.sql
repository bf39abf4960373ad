-- Loads fleet.jsonl, what `sensor-replay --json` prints of many reports, for questions in SQL:
--   sqlite3 -init fleet.sql fleet.db
-- The platform and the day come from the reports' paths: FOLDER/PLATFORM/YYYY-MM-DD/NAME.
.bail on

-- One row for each line.
drop table if exists line;
create table line (json text);
.mode ascii
.separator "\037" "\n"
.import fleet.jsonl line

-- One row for each report. It is played to the evening of the day on which it was taken.
drop table if exists report;
create table report as
    with played as (
        select json ->> '$.file' as file, max((json ->> '$.at') / 86400000) as last_day,
               '[' || replace(json_quote(json ->> '$.file'), '/', '","') || ']' as path
        from line group by file
    )
    select file, path ->> '$[#-3]' as platform, path ->> '$[#-2]' as taken, last_day from played;

-- One row for each event. Its fields are JSON.
drop table if exists event;
create table event as
    select report.file, platform,
           date(taken, ((json ->> '$.at') / 86400000 - last_day) || ' days') as day,
           json ->> '$.event.id' as id, json -> '$.event.fields' as fields
    from line join report on report.file = json ->> '$.file'
    where json -> '$.event' is not null;

-- One row for each app in a list of apps, and for each long use of the proximity sensor.
drop view if exists use;
create view use as
    select file, platform, day,
           iif(event.id = 'N273|10003', 'accelerometer', 'gyroscope') as sensor,
           value ->> '$.pkg' as app, cast(value ->> '$.time' as integer) as seconds,
           round(1e9 / (value ->> '$.rate'), 1) as hz
    from event, json_each(fields, '$.app_list') where event.id in ('N273|10003', 'N273|10004')
    union all
    select file, platform, day, 'orientation', value ->> '$.pkg',
           cast(value ->> '$.totalTime' as integer), null
    from event, json_each(fields, '$.info') where event.id = 'N273|10012'
    union all
    select file, platform, day, 'proximity', fields ->> '$.pkg',
           cast(fields ->> '$.time' as integer), null
    from event where id = 'N273|10010';

.mode column
