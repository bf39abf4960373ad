#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <map>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace report {

/** Arguments of an event: a name and a JSON value each. */
using EventArguments = std::vector<std::pair<std::string_view, std::string>>;

/** A row of tracks: an app's, or one of the tool's own, whatever an app is called. */
struct Process {
    std::string name;
    bool isApp = false;

    bool operator<(const Process& other) const {
        return isApp != other.isApp ? other.isApp : name < other.name;
    }
};

/**
 * Writes a file of trace events, the JSON that timeline viewers open, as it goes. Processes and
 * tracks get their numbers in the order in which they first occur. Times are nanoseconds.
 */
class TraceEvents {
public:
    /** Takes the file over, which is open for writing. */
    explicit TraceEvents(std::FILE* file);

    /** Closes the file, if `close` has not. */
    ~TraceEvents();

    TraceEvents(const TraceEvents&) = delete;
    TraceEvents& operator=(const TraceEvents&) = delete;

    /** Gives a process its number now. */
    void add(const Process& process) { processOf(process); }

    void slice(const Process& process, std::string_view track, std::string_view name, int64_t from,
               int64_t to, const EventArguments& arguments);
    void instant(const Process& process, std::string_view track, std::string_view name, int64_t at,
                 const EventArguments& arguments);

    /** The values, which are numbers, from `at` on. */
    void counter(const Process& process, std::string_view name, int64_t at,
                 const EventArguments& values);

    /** Ends the file; false, with `errno`, if not all could be written. Nothing may follow. */
    bool close();

private:
    struct Track {
        size_t process;
        size_t thread;
    };

    size_t processOf(const Process& process);
    Track trackOf(const Process& process, std::string_view name);
    void event(const char* phase, std::string_view name, Track track, int64_t at,
               const std::string& more, const EventArguments& arguments);
    void nameEvent(const char* what, Track track, std::string_view name);
    void sortEvent(size_t process);
    void write(const std::string& json);

    std::FILE* mFile;
    bool mIsFirst = true;
    std::map<Process, size_t> mProcesses;
    std::map<std::pair<size_t, std::string>, size_t> mThreads;
    std::map<size_t, size_t> mThreadCounts;  // by process
};

}  // namespace report
