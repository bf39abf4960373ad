#include "report/Lines.h"

#include "report/Format.h"
#include "report/Payload.h"
#include "trace/JsonText.h"
#include "trace/TraceLine.h"
#include "trace/TraceTime.h"

namespace report {

void JsonLines::begin(const Input& input) {
    if (mWithFile) mEnd = R"(, "file": )" + trace::toJson(input.name) + "}\n";
}

void JsonLines::take(const Record& record) {
    const auto& [first, second, third] = record.texts;
    std::string entry;
    switch (record.kind) {
        case Record::Kind::kBoot:
            entry = R"("boot": )" + trace::toJson(first);
            break;
        case Record::Kind::kEvent:
            entry = trace::eventEntry(first, second, third);
            entry.back() = ',';
            entry += R"( "fields": )" + report::toJson(takeApart(second, third)) + '}';
            break;
        case Record::Kind::kProperty:
            entry = trace::propertyEntry(first, second);
            break;
        case Record::Kind::kLog:
            entry = R"("log": {"level": )" + std::to_string(record.number) + R"(, "tag": )" +
                    trace::toJson(first) + R"(, "text": )" + trace::toJson(second) + '}';
            break;
        case Record::Kind::kResult:
            entry = R"("result": {"call": )" + trace::toJson(first) + R"(, "value": )" +
                    std::string(second) + '}';
            break;
        default:
            return;
    }
    mOut->write(R"({"at": )" + trace::formatMs(record.at) + ", " + entry + mEnd);
}

void LogLines::take(const Record& record) {
    const auto& [first, second, third] = record.texts;
    std::string kind;
    std::string text;
    switch (record.kind) {
        case Record::Kind::kBoot:
            kind = "boot";
            text = first;
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
    mOut->write(formatClock(record.at) + "  " + kind + printable(text) + '\n');
}

}  // namespace report
