#include "report/Compare.h"

#include <cmath>
#include <cstdlib>
#include <utility>

#include "base/Calendar.h"
#include "base/Json.h"
#include "report/Format.h"
#include "report/Names.h"
#include "report/Text.h"

namespace report {

namespace {

using day::ChangeState;
using day::Difference;
using day::Factor;
using day::Per;
using day::Profile;
using day::Spread;

/** By Per: in JSON, in a table's row, and what it takes to compare it. */
constexpr struct {
    std::string_view key;
    std::string_view title;
    std::string_view missing;
} kPers[day::kPers] = {
        {"hour", "hour", "the whole time: less than 10 minutes are seen on one side"},
        {"displayOff", "hour, display off",
         "the time with the display off: less than 10 minutes of it are known on one side"},
        {"battery", "hour on battery",
         "the battery statistics: one side has none, or less than 10 minutes on battery"},
};

/** By Factor: in JSON and in words, for more and for less of it. */
constexpr struct {
    std::string_view moreKey;
    std::string_view lessKey;
    std::string_view more;
    std::string_view less;
} kFactors[] = {
        {"longerUses", "shorterUses", "longer uses", "shorter uses"},
        {"moreEnables", "fewerEnables", "more enables", "fewer enables"},
        {"fasterRate", "slowerRate", "faster rate", "slower rate"},
        {"lessBatching", "moreBatching", "less batching", "more batching"},
        {"moreDisplayOff", "lessDisplayOff", "more with the display off",
         "less with the display off"},
        {"moreBackground", "lessBackground", "more in the background", "less in the background"},
};

constexpr std::string_view kStates[] = {"changed", "new", "gone", "notCovered"};  // by ChangeState

const auto& wordsOf(Per per) {
    return kPers[static_cast<size_t>(per)];
}

std::string_view keyOf(const day::Change& change) {
    const auto& words = kFactors[static_cast<size_t>(change.factor)];
    return change.isMore ? words.moreKey : words.lessKey;
}

std::string_view textOf(const day::Change& change) {
    const auto& words = kFactors[static_cast<size_t>(change.factor)];
    return change.isMore ? words.more : words.less;
}

/** Seconds in an hour, rounded, with a sign if they are a difference and not rounded to none. */
std::string formatSeconds(double seconds, bool isDifference = false) {
    const int64_t rounded = std::llround(seconds);
    const char* const sign = !isDifference || rounded == 0 ? "" : rounded < 0 ? "-" : "+";
    return sign + formatDuration(std::abs(rounded) * base::kNsPerSecond);
}

std::string formatSpread(const std::optional<Spread>& spread) {
    if (!spread) return "?";
    const std::string smallest = formatSeconds(spread->smallest);
    const std::string largest = formatSeconds(spread->largest);
    const std::string range = smallest == largest ? "" : " (" + smallest + " to " + largest + ')';
    return formatSeconds(spread->median) + range;
}

std::string formatSize(const Difference& difference) {
    if (difference.state == ChangeState::kNotCovered) return "?";
    return formatSeconds(difference.size, true);
}

std::string appOf(const Difference& difference) {
    return difference.key.uid ? nameUid(*difference.key.uid, {}) : difference.key.app;
}

std::string sensorOf(const Difference& difference) {
    const auto& type = difference.key.type;
    if (!type) return difference.sensor;  // GPS
    const bool isKnown = *type != 0 || !difference.sensor.empty();
    return isKnown ? nameSensor(*type, difference.sensor) : "unknown sensor";
}

std::string describeSide(const char* what, const std::vector<Profile>& side) {
    std::string text = std::string(what) + ": " + side.front().name;
    if (side.size() > 1) text += " and " + std::to_string(side.size() - 1) + " more";
    int64_t covered = 0;
    int64_t known = 0;
    int64_t onBattery = 0;
    for (const Profile& profile : side) {
        covered += profile.covered;
        known += profile.display.known;
        onBattery += profile.onBattery;
    }
    return text + ": " + formatDuration(covered) + " seen, " +
           (known > 0 ? "display known for " + formatDuration(known) : "display not known") + ", " +
           (onBattery > 0 ? "battery statistics of " + formatDuration(onBattery)
                          : "no battery statistics");
}

Table differenceTable(size_t limit) {
    return Table({{"App", Table::Column::kCut},
                  {"Sensor", Table::Column::kCut},
                  {"Old", Table::Column::kRight},
                  {"New", Table::Column::kRight},
                  {"Difference", Table::Column::kRight},
                  {"Per"},
                  {"Why", Table::Column::kCut}},
                 limit);
}

void addRow(const Difference& difference, Table* table) {
    std::vector<std::string> why;
    for (const day::Change& change : difference.changes) why.emplace_back(textOf(change));
    table->add({appOf(difference), sensorOf(difference), formatSpread(difference.before),
                formatSpread(difference.after), formatSize(difference),
                std::string(wordsOf(difference.per).title), join(why)});
}

Table differencesOf(const day::Comparison& comparison, ChangeState state, size_t limit) {
    Table table = differenceTable(limit);
    for (const Difference& each : comparison.differences) {
        if (each.state == state) addRow(each, &table);
    }
    return table;
}

std::string describe(const std::optional<trace::Sensor>& sensor) {
    if (!sensor) return "not there";
    std::string text(trace::nameOf(sensor->mode));
    if (text.empty()) text = "there";
    if (sensor->wakeUp && *sensor->wakeUp) text += ", wake-up";
    if (sensor->maxRate) {
        text += ", up to ";
        base::appendFloat(&text, *sensor->maxRate);
        text += " Hz";
    }
    return text;
}

Table sensorTable(const day::Comparison& comparison, size_t limit) {
    Table table({{"Sensor", Table::Column::kCut}, {"Old"}, {"New"}}, limit);
    for (const auto& [sensor, sides] : comparison.sensors) {
        table.add({nameSensor(sensor.second, sensor.first), describe(sides.before),
                   describe(sides.after)});
    }
    return table;
}

Table storedTable(const day::Comparison& comparison, size_t limit) {
    Table table({{"Property", Table::Column::kCut}, {"Old"}, {"New"}}, limit);
    for (const auto& [name, values] : comparison.properties) {
        table.add({name, values.before.value_or("not set"), values.after.value_or("not set")});
    }
    return table;
}

}  // namespace

void Compare::end(bool) {
    mSides.add(mWriter.end());
}

void ComparedSides::add(const day::Journal& journal) {
    if (mBaselines == 0) return;
    (mBefore.size() < mBaselines ? mBefore : mAfter).push_back(day::profileOf(journal));
}

std::optional<day::Comparison> ComparedSides::compare() const {
    if (mBefore.empty() || mAfter.empty()) return std::nullopt;
    return day::compare(mBefore, mAfter);
}

std::optional<Section> ComparedSides::layOut(size_t limit) const {
    const auto comparison = compare();
    if (!comparison) return std::nullopt;
    Section section;
    section.heading = "Old against new";
    section.lines = {safe(describeSide("old", mBefore)), safe(describeSide("new", mAfter))};
    for (size_t per = 0; per < day::kPers; ++per) {
        if (comparison->isCovered[per]) continue;
        section.lines.push_back("not compared: " + std::string(kPers[per].missing));
    }
    const auto add = [&](const char* heading, Table table, const char* caption) {
        if (table.isEmpty()) return;
        Section& part = section.parts.emplace_back();
        part.heading = heading;
        part.add(std::move(table), "compared", caption);
    };
    const std::pair<ChangeState, const char*> kGroups[] = {
            {ChangeState::kChanged, "Changed: time held in an hour"},
            {ChangeState::kNew, "New: not held before"},
            {ChangeState::kGone, "Gone: held before only"},
            {ChangeState::kNotCovered, "Too little is seen to tell"},
    };
    for (const auto& [state, heading] : kGroups) {
        add(heading, differencesOf(*comparison, state, limit), "Time held in an hour");
    }
    add("Sensors that differ", sensorTable(*comparison, limit), "What the device's lists say");
    add("Stored values that differ", storedTable(*comparison, limit), "Properties");
    return section;
}

void CompareSummary::finish() {
    const auto compared = sides().layOut(mLimit);
    if (!compared) return;
    for (const std::string& line : compared->lines) mTerminal.sentence(line, 0);
    for (const Section& part : compared->parts) mTerminal.section(part);
    if (compared->parts.empty()) mTerminal.heading(kNothingDiffers);
    mOut->flush();
}

void CompareLines::finish() {
    const auto comparison = sides().compare();
    if (!comparison) return;
    // Seconds with three decimals, which are written as milliseconds with as many would be.
    const auto rounded = [](double value) {
        return base::Ms{std::llround(value * 1000) * (base::kNsPerMs / 1000)};
    };
    for (const Difference& each : comparison->differences) {
        std::string line;
        base::JsonWriter json(&line);
        json.beginObject().key("compare").beginObject();
        json.member("app", appOf(each));
        if (each.key.type) json.member("type", *each.key.type);
        json.member("sensor", each.sensor);
        json.member("per", wordsOf(each.per).key);
        const auto spread = [&](const char* key, const char* range,
                                const std::optional<Spread>& values) {
            if (!values) return;
            json.member(key, rounded(values->median));
            const base::Ms smallest = rounded(values->smallest);
            const base::Ms largest = rounded(values->largest);
            if (smallest.ns == largest.ns) return;
            json.key(range).beginArray().value(smallest).value(largest).endArray();
        };
        spread("old", "oldRange", each.before);
        spread("new", "newRange", each.after);
        if (each.state != ChangeState::kNotCovered) json.member("difference", rounded(each.size));
        json.key("causes").beginArray();
        for (const day::Change& change : each.changes) json.value(keyOf(change));
        json.endArray().member("state", kStates[static_cast<size_t>(each.state)]);
        json.endObject().endObject();
        mOut->write(line + '\n');
    }
    mOut->flush();
}

}  // namespace report
