#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>

namespace report {

/** One thing that happened in a replay. Whoever takes a record copies the texts that it keeps. */
struct Record {
    enum class Kind : uint8_t {
        kBoot,      // a process starts: "device" or "process"
        kEvent,     // telemetry was sent: module, id, payload
        kProperty,  // the library set a property: name, value
        kLog,       // the library wrote a log line: tag, text; `number` is the level
        kResult,    // a call returned: its name, its result as JSON
        kCall,      // a call of the trace is about to be made: its line; `number` is the line's
        kCounters,  // the library's counters have changed: trace::Counters, as bytes
        kOver,      // the process ends here
        kExpect,    // what the recorded device did: an entry; `number` is the line's

        // What a process leaves to the tool; no report gets these.
        kNextBoot,  // it ended by a boot line: "device" or "process", the properties in memory
        kEnd,       // it ended with the trace: nothing, the properties in memory
        kFailure,   // the tool has to stop: why; `number` is the exit status
    };

    Kind kind;
    int64_t at = 0;      // nanoseconds of the virtual clock
    int64_t number = 0;  // see the kinds
    std::array<std::string_view, 3> texts = {};
};

/** Gathers records and writes them, as bytes, to a descriptor. One thread at a time may use it. */
class RecordWriter {
public:
    explicit RecordWriter(int fd) : mFd(fd) {}

    /** Takes a record; writes what is gathered when there is much of it. */
    void add(const Record& record);

    /** Writes what is gathered. Ends the process with status 1 if nobody reads it any more. */
    void flush();

private:
    const int mFd;
    std::string mGathered;
};

/** Makes records of the bytes that a `RecordWriter` has written, however they are cut. */
class RecordReader {
public:
    /** Takes more bytes and hands on all records that are whole. */
    void take(const char* bytes, size_t size, const std::function<void(const Record&)>& handOn);

private:
    std::string mPending;  // the beginning of a record
};

}  // namespace report
