#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <functional>
#include <map>
#include <string>
#include <string_view>
#include <tuple>
#include <utility>

#include "base/Json.h"

namespace report {

/** Writes the arguments of an event as members of a JSON object; empty: there are none. */
using EventArguments = std::function<void(base::JsonWriter*)>;

/** A row of tracks: an app's, or one of the tool's own, whatever an app is called. */
struct Process {
    std::string name;
    bool isApp = false;
    int64_t input = 0;  // processes of different inputs are different

    bool operator<(const Process& other) const {
        return std::tie(input, isApp, name) < std::tie(other.input, other.isApp, other.name);
    }
};

/**
 * Writes a file of trace events, the JSON that timeline viewers open, as it goes. Processes and
 * tracks get their numbers in the order in which they first occur. Times are nanoseconds.
 */
class TraceEvents {
public:
    /** Writes to `file`, which must outlive this; errors show in its state. */
    explicit TraceEvents(std::FILE* file);

    TraceEvents(const TraceEvents&) = delete;
    TraceEvents& operator=(const TraceEvents&) = delete;

    /** Gives a process its number now. */
    void add(const Process& process) { processOf(process); }

    void slice(const Process& process, std::string_view track, std::string_view name, int64_t from,
               int64_t to, const EventArguments& arguments = {});
    void instant(const Process& process, std::string_view track, std::string_view name, int64_t at,
                 const EventArguments& arguments);

    /** The values, which are numbers, from `at` on. */
    void counter(const Process& process, std::string_view name, int64_t at,
                 const EventArguments& values);

    /** Ends the text. Nothing may follow. */
    void close();

private:
    struct Track {
        size_t process;
        size_t thread;
    };

    size_t processOf(const Process& process);
    Track trackOf(const Process& process, std::string_view name);
    /** Writes an event; `more` writes what its phase adds to the members that all have. */
    void event(std::string_view phase, std::string_view name, Track track,
               const EventArguments& more, const EventArguments& arguments);

    /** Tells a viewer something of a track. */
    void tell(std::string_view what, Track track, const EventArguments& arguments);

    std::FILE* const mFile;
    bool mIsFirst = true;
    std::map<Process, size_t> mProcesses;
    std::map<std::pair<size_t, std::string>, size_t> mThreads;
    std::map<size_t, size_t> mThreadCounts;  // by process
};

}  // namespace report
