#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "day/Spans.h"
#include "day/Use.h"
#include "trace/Note.h"

namespace day {

/** What the notes of a trace tell of a device, up to a boot of it that sets the clock back. */
struct Notes {
    /**
     * Takes a note at `at`, ns. It replaces what earlier notes have told of the same, but its gaps
     * and losses come on top of theirs.
     */
    void take(const trace::Note& note, int64_t at);

    /** The clock is set back: only the sensors and packages are still the device's. */
    void startClock();

    /** Later nothing is known, ns: by the capture, else when `taken` stands there. */
    std::optional<int64_t> knownTo() const;

    /** Whether `at` lies after what is known. */
    bool isBehind(int64_t at) const { return knownTo() && at > *knownTo(); }

    /**
     * Whether what the library does at `at` is surely no more than what the device would do: the
     * end of what is known is the moment of the capture.
     */
    bool isAhead(int64_t at) const;

    const trace::Sensor* sensorOf(uint32_t handle) const;

    /** The sensor of a row of the battery statistics; null for GPS. */
    const trace::Sensor* sensorOf(const trace::ChargeRow& row) const;

    /** Its name, also of GPS; empty if it is not known. */
    std::string nameOf(const trace::ChargeRow& row) const;

    /** The packages of a uid; empty if they are not known. */
    const std::vector<std::string>& packagesOf(int32_t uid) const;

    /** Fills in what the device's lists tell of the holder's uid and handle. */
    void complete(Holder* holder) const;
    Holder holderOf(const trace::Client& client) const;

    bool namesSensors = false;
    std::vector<trace::Sensor> sensors;
    std::map<int32_t, std::vector<std::string>> packages;  // by uid

    std::optional<trace::CaptureNote> capture;
    std::optional<int64_t> firstDay;  // the date of the clock's 0, in days since 1970-01-01
    std::optional<trace::KnownStates> known;
    std::optional<std::vector<Span>> displayKnown;  // nothing: it is not told
    std::vector<trace::Interval> gaps;
    std::optional<trace::TakenNote> taken;
    int64_t takenAt = 0;  // ns
    std::vector<trace::LostNote> lost;

private:
    std::map<uint32_t, size_t> mByHandle;  // in `sensors`
};

}  // namespace day
