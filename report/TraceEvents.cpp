#include "report/TraceEvents.h"

#include <utility>

namespace report {

using base::JsonWriter;

namespace {

/** Microseconds, as the format has it, with the nanoseconds behind the point. */
std::string microseconds(int64_t ns) {
    std::string text = std::to_string(ns / 1000);
    if (const int64_t rest = ns % 1000; rest != 0)
        text += '.' + std::to_string(1000 + rest).substr(1);
    return text;
}

EventArguments atTime(int64_t at) {
    return [at](JsonWriter* json) { json->key("ts").raw(microseconds(at)); };
}

}  // namespace

TraceEvents::TraceEvents(std::FILE* file) : mFile(file) {
    std::fputs(R"({"displayTimeUnit": "ms", "traceEvents": [)", mFile);
}

void TraceEvents::close() {
    std::fputs("\n]}\n", mFile);
}

void TraceEvents::slice(const Process& process, std::string_view track, std::string_view name,
                        int64_t from, int64_t to, const EventArguments& arguments) {
    const auto times = [&](JsonWriter* json) {
        json->key("ts").raw(microseconds(from)).key("dur").raw(microseconds(to - from));
    };
    event("X", name, trackOf(process, track), times, arguments);
}

void TraceEvents::instant(const Process& process, std::string_view track, std::string_view name,
                          int64_t at, const EventArguments& arguments) {
    const auto timeAndScope = [&](JsonWriter* json) {
        atTime(at)(json);
        json->member("s", "t");
    };
    event("i", name, trackOf(process, track), timeAndScope, arguments);
}

void TraceEvents::counter(const Process& process, std::string_view name, int64_t at,
                          const EventArguments& values) {
    event("C", name, {processOf(process), 0}, atTime(at), values);
}

size_t TraceEvents::processOf(const Process& process) {
    const auto [it, isNew] = mProcesses.try_emplace(process, mProcesses.size() + 1);
    const size_t number = it->second;
    if (isNew) {
        tell("process_name", {number, 0},
             [&](JsonWriter* json) { json->member("name", process.name); });
        // The viewers show processes by this; without it by what goes on in them.
        tell("process_sort_index", {number, 0},
             [&](JsonWriter* json) { json->member("sort_index", static_cast<int64_t>(number)); });
    }
    return number;
}

TraceEvents::Track TraceEvents::trackOf(const Process& process, std::string_view name) {
    const size_t number = processOf(process);
    const auto [it, isNew] = mThreads.try_emplace({number, std::string(name)}, 0);
    if (isNew) {
        it->second = ++mThreadCounts[number];
        tell("thread_name", {number, it->second},
             [&](JsonWriter* json) { json->member("name", name); });
    }
    return {number, it->second};
}

void TraceEvents::tell(std::string_view what, Track track, const EventArguments& arguments) {
    event("M", what, track, {}, arguments);
}

void TraceEvents::event(std::string_view phase, std::string_view name, Track track,
                        const EventArguments& more, const EventArguments& arguments) {
    std::string line;
    JsonWriter json(&line);
    json.beginObject().member("ph", phase).member("name", name);
    json.member("pid", static_cast<int64_t>(track.process));
    json.member("tid", static_cast<int64_t>(track.thread));
    if (more) more(&json);
    json.key("args").beginObject();
    if (arguments) arguments(&json);
    json.endObject().endObject();
    std::fputs(mIsFirst ? "\n" : ",\n", mFile);
    std::fwrite(line.data(), 1, line.size(), mFile);
    mIsFirst = false;
}

}  // namespace report
