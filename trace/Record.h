#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <utility>

#include "trace/Words.h"

namespace trace {

/** One thing that happened in a replay. Whoever takes a record copies the texts that it keeps. */
struct Record {
    enum class Kind : uint8_t {
        kBoot,      // a process starts; `value`: BootKind
        kEvent,     // telemetry was sent: module, id, payload
        kProperty,  // the library set a property: name, value
        kLog,       // the library wrote a log line: tag, text; `number`: the level
        kResult,    // a call returned: its name, its result as JSON
        kOver,      // the process ends here; `number`: 1 if its last line did something
        kExpect,    // what the recorded device did: an entry; `at` is the line's, `number` too
        kTorn,      // the trace ends before a torn line, whose number is `number`
        kNote,      // the note of a line, as JSON; `number`: the line's. Enables and disables have
                    // theirs in their own records

        // Calls that are about to be made. Only if they are wanted, or have notes.
        kEnable,   // pkg, opPkg, note; `value`: the sensor's type, `number`: the period, ns
        kDisable,  // the same without a period, also for a clean-up
        kState,    // a state has changed; `value`: DeviceState, `number`: its value
        kTick,     // the host's clock; `number`: the hour
        kReset,    // the call's name; `number`: the hour

        kCounters,  // the library's counters have changed: trace::Counters, as bytes; if wanted

        // Around the records of an input.
        kInput,    // it is about to be played: its name
        kWarning,  // what is doubtful about it: a line for standard error
        kPlayed,   // it is over; `number`: the real time that it took, ns

        // What a process leaves to the tool; no report gets these.
        kNextBoot,  // it ended by a boot line: its note, the properties in memory; `value`:
                    // BootKind
        kEnd,       // it ended with the trace: nothing, the properties in memory
        kFailure,   // the tool has to stop: why; `number`: the exit status
    };

    Kind kind;
    int64_t at = 0;  // nanoseconds of the virtual clock

    // See the kinds.
    std::array<std::string_view, 3> texts = {};
    int64_t number = 0;
    int32_t value = 0;
};

/** Records that are made only if somebody reads them. */
struct WantedRecords {
    bool calls = false;
    bool counters = false;
};

/** Gathers records as bytes. One thread at a time may use it. */
class RecordWriter {
public:
    /** `handOn` gets the bytes, in blocks. */
    explicit RecordWriter(std::function<void(std::string_view)> handOn)
          : mHandOn(std::move(handOn)) {}

    /** Takes a record; hands on what is gathered when there is much of it. */
    void add(const Record& record);

    /** Hands on what is gathered. */
    void flush();

private:
    const std::function<void(std::string_view)> mHandOn;
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

}  // namespace trace
