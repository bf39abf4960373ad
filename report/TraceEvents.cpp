#include "report/TraceEvents.h"

#include <utility>

#include "trace/JsonText.h"

namespace report {

using trace::toJson;

namespace {

/** Microseconds, as the format has it, with the nanoseconds behind the point. */
std::string microseconds(int64_t ns) {
    std::string text = std::to_string(ns / 1000);
    if (const int64_t rest = ns % 1000; rest != 0)
        text += '.' + std::to_string(1000 + rest).substr(1);
    return text;
}

std::string object(const EventArguments& arguments) {
    std::string json;
    for (const auto& [name, value] : arguments) {
        json += (json.empty() ? "" : ", ") + toJson(name) + ": " + value;
    }
    return '{' + json + '}';
}

}  // namespace

TraceEvents::TraceEvents(std::FILE* file) : mFile(file) {
    std::fputs(R"({"displayTimeUnit": "ms", "traceEvents": [)", mFile);
}

TraceEvents::~TraceEvents() {
    if (mFile != nullptr) std::fclose(mFile);
}

bool TraceEvents::close() {
    std::fputs("\n]}\n", mFile);
    const bool isGood = std::ferror(mFile) == 0;
    return std::fclose(std::exchange(mFile, nullptr)) == 0 && isGood;
}

void TraceEvents::slice(const Process& process, std::string_view track, std::string_view name,
                        int64_t from, int64_t to, const EventArguments& arguments) {
    event("X", name, trackOf(process, track), from, R"(, "dur": )" + microseconds(to - from),
          arguments);
}

void TraceEvents::instant(const Process& process, std::string_view track, std::string_view name,
                          int64_t at, const EventArguments& arguments) {
    event("i", name, trackOf(process, track), at, R"(, "s": "t")", arguments);
}

void TraceEvents::counter(const Process& process, std::string_view name, int64_t at,
                          const EventArguments& values) {
    event("C", name, {processOf(process), 0}, at, "", values);
}

size_t TraceEvents::processOf(const Process& process) {
    const auto [it, isNew] = mProcesses.try_emplace(process, mProcesses.size() + 1);
    if (isNew) {
        nameEvent("process_name", {it->second, 0}, process.name);
        sortEvent(it->second);
    }
    return it->second;
}

TraceEvents::Track TraceEvents::trackOf(const Process& process, std::string_view name) {
    const size_t number = processOf(process);
    const auto [it, isNew] = mThreads.try_emplace({number, std::string(name)}, 0);
    if (isNew) {
        it->second = ++mThreadCounts[number];
        nameEvent("thread_name", {number, it->second}, name);
    }
    return {number, it->second};
}

void TraceEvents::event(const char* phase, std::string_view name, Track track, int64_t at,
                        const std::string& more, const EventArguments& arguments) {
    write(R"({"ph": ")" + std::string(phase) + R"(", "name": )" + toJson(name) + R"(, "pid": )" +
          std::to_string(track.process) + R"(, "tid": )" + std::to_string(track.thread) +
          R"(, "ts": )" + microseconds(at) + more + R"(, "args": )" + object(arguments) + '}');
}

void TraceEvents::nameEvent(const char* what, Track track, std::string_view name) {
    write(R"({"ph": "M", "name": ")" + std::string(what) + R"(", "pid": )" +
          std::to_string(track.process) + R"(, "tid": )" + std::to_string(track.thread) +
          R"(, "args": {"name": )" + toJson(name) + "}}");
}

/** The viewers show processes by this; without it by what goes on in them. */
void TraceEvents::sortEvent(size_t process) {
    const std::string number = std::to_string(process);
    write(R"({"ph": "M", "name": "process_sort_index", "pid": )" + number +
          R"(, "tid": 0, "args": {"sort_index": )" + number + "}}");
}

void TraceEvents::write(const std::string& json) {
    std::fputs(mIsFirst ? "\n" : ",\n", mFile);
    std::fwrite(json.data(), 1, json.size(), mFile);
    mIsFirst = false;
}

}  // namespace report
