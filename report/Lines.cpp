#include "report/Lines.h"

#include <string_view>

#include "day/Payload.h"
#include "report/EventText.h"
#include "report/Format.h"
#include "trace/TraceWriter.h"

namespace report {

using base::JsonWriter;
using base::Ms;
using day::EndedUses;
using trace::Record;

namespace {

constexpr int64_t kNsPerUs = 1000;

/** Writes a member whose value is known. */
template <typename T>
void optionalMember(JsonWriter* json, std::string_view key, const std::optional<T>& value) {
    if (value) json->member(key, *value);
}

void packagesMember(JsonWriter* json, const std::vector<std::string>& packages) {
    if (packages.empty()) return;
    json->key("packages").beginArray();
    for (const std::string& package : packages) json->value(package);
    json->endArray();
}

/** Whether `record` has a line of its own. */
bool isShown(Record::Kind kind) {
    return kind <= Record::Kind::kResult;
}

}  // namespace

JsonLines::JsonLines(Stdout* out, bool withFile)
      : mOut(out),
        mWithFile(withFile),
        mTracker([this](const day::Use& use) { mEnded.add(use); }) {}

void JsonLines::begin(const std::string& name) {
    mName = name;
    mTracker.begin();
    mHasNotes = false;
}

void JsonLines::take(const Record& record) {
    if (record.kind == Record::Kind::kExpect) return;  // its time is the recorded device's
    mTracker.take(record);
    writeEnded(record.kind == Record::Kind::kOver ? EndedUses::kAll : record.at);
    if (record.kind == Record::Kind::kBoot &&
        record.value == static_cast<int32_t>(trace::BootKind::kDevice)) {
        mHasTold = false;
        mIsClosed = false;
    }
    if (isShown(record.kind)) {
        writeRecord(record);
    } else if (record.kind >= Record::Kind::kNote) {
        mHasNotes = true;
        writeCapture(record.at);
    }
}

void JsonLines::end(bool) {
    mTracker.end();
    writeEnded(EndedUses::kAll);
}

template <typename Write>
void JsonLines::writeLine(int64_t at, const Write& write) {
    mLine.clear();
    JsonWriter json(&mLine);
    json.beginObject().member("at", Ms{at});
    write(&json);
    if (mWithFile) json.member("file", mName);
    json.endObject();
    mLine += '\n';
    mOut->write(mLine);
}

void JsonLines::writeRecord(const Record& record) {
    const auto& [first, second, third] = record.texts;
    const auto aheadMember = [&](JsonWriter* json) {
        if (mTracker.notes().isAhead(record.at)) json->member("ahead", true);
    };
    writeLine(record.at, [&, &one = first, &two = second, &three = third](JsonWriter* json) {
        switch (record.kind) {
            case Record::Kind::kBoot:
                json->member("boot", nameOf(static_cast<trace::BootKind>(record.value)));
                return;
            case Record::Kind::kEvent:
                json->key("event").beginObject().member("module", one).member("id", two);
                json->member("payload", three).key("fields");
                writeFields(day::takeApart(two, three).fields, json);
                json->endObject();
                return aheadMember(json);
            case Record::Kind::kProperty:
                json->key("property").beginObject().member("name", one).member("value", two);
                json->endObject();
                return aheadMember(json);
            case Record::Kind::kLog:
                json->key("log").beginObject().member("level", record.number);
                json->member("tag", one).member("text", two).endObject();
                return;
            default:
                json->key("result").beginObject().member("call", one).key("value").raw(two);
                json->endObject();
        }
    });
}

void JsonLines::writeCapture(int64_t at) {
    const auto& capture = mTracker.notes().capture;
    if (!capture || mHasTold) return;
    mHasTold = true;
    writeLine(at, [&](JsonWriter* json) {
        json->key("capture").beginObject();
        optionalMember(json, "taken", capture->taken);
        optionalMember(json, "midnight", capture->midnight);
        json->member("registrations", capture->registrations);
        json->member("knownTo", capture->knownTo).endObject();
    });
}

void JsonLines::writeEnded(int64_t before) {
    for (const day::Use& use : mEnded.take(before)) {
        if (mTracker.notes().namesSensors) writeUse(use);
    }
    const auto& taken = mTracker.notes().taken;
    if (!taken || !mTracker.isClosed() || mIsClosed) return;
    mIsClosed = true;
    writeTaken(*taken, *mTracker.notes().knownTo());
}

void JsonLines::writeUse(const day::Use& use) {
    writeLine(use.to, [&](JsonWriter* json) {
        json->key("use").beginObject().member("pkg", use.pkg).member("opPkg", use.opPkg);
        optionalMember(json, "uid", use.uid);
        packagesMember(json, use.packages);
        if (!use.sensor.empty()) json->member("sensor", use.sensor);
        optionalMember(json, "handle", use.handle);
        json->member("type", use.type);
        if (const auto mode = nameOf(use.mode); !mode.empty()) json->member("mode", mode);
        optionalMember(json, "wakeUp", use.wakeUp);
        json->member("from", Ms{use.from}).member("to", Ms{use.to}).member("before", use.before);
        json->member("end", nameOf(use.end));
        json->member("enables", static_cast<int64_t>(use.enables.size()));
        if (use.periodNs) json->member("periodUs", *use.periodNs / kNsPerUs);
        optionalMember(json, "batchUs", use.batchUs);
        json->member("displayKnown", Ms{use.display.known});
        if (use.display.known > 0) json->member("displayOn", Ms{use.display.on});
        json->endObject();
    });
}

void JsonLines::writeTaken(const trace::TakenNote& taken, int64_t at) {
    for (const trace::RefusedNote& refused : taken.refused) {
        writeLine(at, [&](JsonWriter* json) {
            json->key("refused").beginObject().member("pkg", refused.client.pkg);
            optionalMember(json, "uid", refused.client.uid);
            json->member("handle", refused.client.handle).member("count", refused.count);
            json->member("result", refused.result).endObject();
        });
    }
    if (!taken.sinceCharge) return;
    const day::Notes& notes = mTracker.notes();
    for (const trace::ChargeRow& row : taken.sinceCharge->rows) {
        const std::string sensor = notes.nameOf(row);
        writeLine(at, [&](JsonWriter* json) {
            json->key("sinceCharge").beginObject().member("uid", row.uid);
            packagesMember(json, notes.packagesOf(row.uid));
            json->member("handle", row.handle);
            if (!sensor.empty()) json->member("sensor", sensor);
            json->member("ms", row.ms).member("count", row.count);
            optionalMember(json, "backgroundMs", row.background);
            json->member("shared", row.shared);
            optionalMember(json, "onBatteryMs", taken.sinceCharge->onBatteryMs);
            json->endObject();
        });
    }
}

void LogLines::take(const Record& record) {
    const auto& [first, second, third] = record.texts;
    std::string kind;
    std::string text;
    switch (record.kind) {
        case Record::Kind::kBoot:
            kind = "boot";
            text = nameOf(static_cast<trace::BootKind>(record.value));
            break;
        case Record::Kind::kEvent:
            kind = "event";
            text.append(second).append(" ").append(third);
            break;
        case Record::Kind::kProperty:
            kind = "property";
            text.append(first).append(" = ").append(second);
            break;
        case Record::Kind::kLog:
            kind = "log";
            text.append(1, levelLetter(record.number)).append(" ").append(second);
            break;
        case Record::Kind::kResult:
            kind = "result";
            text.append(first).append(" = ").append(second);
            break;
        default:
            return;
    }
    kind.resize(10, ' ');
    mOut->write(formatClock(record.at) + "  " + kind + onOneLine(text) + '\n');
}

}  // namespace report
