-- Loads uses.csv, what `sensor-replay --uses` writes of many reports, for questions in SQL:
--   sqlite3 -init uses.sql fleet-uses.db
-- The platform comes from the reports' paths: FOLDER/PLATFORM/YYYY-MM-DD/NAME.
.bail on

drop table if exists uses;
.mode csv
.import uses.csv uses

-- One row for each use, typed; `app` is the client's tag where no package is known.
drop view if exists use_day;
create view use_day as
    with split as (
        select *, '[' || replace(json_quote(file), '/', '","') || ']' as path from uses
    )
    select file, path ->> '$[#-3]' as platform, day, coalesce(nullif(app, ''), client_tag) as app,
           client_tag, sensor, cast(type as integer) as type, mode, "from", "to", end,
           cast(enables as integer) as enables, cast(held_s as real) as held_s,
           cast(display_known_s as real) as display_known_s,
           cast(display_on_s as real) as display_on_s, cast(samples as real) as samples
    from split;

.mode column
