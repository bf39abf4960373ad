#include "report/Output.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

#include <unistd.h>

#include "replay/VirtualClock.h"
#include "trace/FileIo.h"
#include "trace/JsonText.h"
#include "trace/TraceTime.h"

namespace report {

using trace::formatMs;
using trace::kNsPerMs;
using trace::toJson;

namespace {

constexpr size_t kFlushSize = size_t{64} << 10;

/** The clock as a person reads it: the day since the boot and the time of that day. */
std::string formatClock(int64_t ns) {
    const auto ms = static_cast<long long>(ns / kNsPerMs);
    char text[64];
    int length = std::snprintf(text, sizeof(text), "day %lld %02lld:%02lld:%02lld.%03lld",
                               ms / 86'400'000 + 1, ms / 3'600'000 % 24, ms / 60'000 % 60,
                               ms / 1000 % 60, ms % 1000);
    if (const auto rest = static_cast<int>(ns % kNsPerMs)) {
        length += std::snprintf(text + length, sizeof(text) - length, "%06d", rest);
    }
    return std::string(text, length);
}

/**
 * `text` on one line: every run of blanks and tabs as one blank, since lists are indented for a
 * page, and other control characters, which might move the terminal's cursor, as "?".
 */
std::string printable(std::string_view text) {
    std::string result;
    for (const char c : text) {
        const bool blank = c == ' ' || c == '\t';
        const bool control = static_cast<unsigned char>(c) < ' ' || c == '\x7f';
        if (!blank || result.empty() || result.back() != ' ') {
            result += blank ? ' ' : control ? '?' : c;
        }
    }
    return result;
}

char levelLetter(int level) {
    constexpr std::string_view kLetters = "??VDIWEFS";
    return level >= 0 && static_cast<size_t>(level) < kLetters.size() ? kLetters[level] : '?';
}

}  // namespace

void Output::boot(std::string_view kind) {
    line(R"("boot": )" + toJson(kind), "boot", kind);
}

void Output::event(std::string_view module, std::string_view id, std::string_view payload) {
    line(R"("event": {"module": )" + toJson(module) + R"(, "id": )" + toJson(id) +
                 R"(, "payload": )" + toJson(payload) + '}',
         "event", std::string(id) + " " + std::string(payload));
}

void Output::property(std::string_view name, std::string_view value) {
    line(R"("property": {"name": )" + toJson(name) + R"(, "value": )" + toJson(value) + '}',
         "property", std::string(name) + " = " + std::string(value));
}

void Output::log(int level, std::string_view tag, std::string_view text) {
    line(R"("log": {"level": )" + std::to_string(level) + R"(, "tag": )" + toJson(tag) +
                 R"(, "text": )" + toJson(text) + '}',
         "log", std::string(1, levelLetter(level)) + " " + std::string(text));
}

void Output::result(std::string_view call, std::string_view json) {
    line(R"("result": {"call": )" + toJson(call) + R"(, "value": )" + std::string(json) + '}',
         "result", std::string(call) + " = " + std::string(json));
}

void Output::line(std::string_view json, std::string_view kind, std::string_view text) {
    const int64_t now = virtual_clock::now();
    if (mFormat == OutputFormat::kJson) {
        mGathered += R"({"at": )" + formatMs(now) + ", ";
        mGathered.append(json).append("}\n");
    } else {
        mGathered += formatClock(now) + "  ";
        mGathered.append(kind).append(10 - kind.size(), ' ').append(printable(text)).append("\n");
    }
    if (mGathered.size() >= kFlushSize) flush();
}

void Output::flush() {
    if (!trace::writeAll(STDOUT_FILENO, mGathered.data(), mGathered.size())) {
        std::fprintf(stderr, "cannot write standard output: %s\n", std::strerror(errno));
        _exit(1);
    }
    mGathered.clear();
}

}  // namespace report
