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
class Notes {
public:
    /** A note at `at`, ns. Of what is told again the last counts. */
    void take(const trace::Note& note, int64_t at);

    /** The clock is set back: only the sensors and packages are still the device's. */
    void startClock();

    const std::optional<trace::CaptureNote>& capture() const { return mCapture; }

    /** The date of the clock's 0, in days since 1970-01-01. */
    std::optional<int64_t> firstDay() const { return mFirstDay; }

    /** Later nothing is known, ns: by the capture, else when `taken()` stands there. */
    std::optional<int64_t> knownTo() const { return mCapture ? mKnownTo : mTakenAt; }

    /** Whether `at` lies after what is known. */
    bool isBehind(int64_t at) const { return knownTo() && at > *knownTo(); }

    /**
     * Whether what the library does at `at` is surely no more than what the device would do: the
     * end of what is known is the moment of the capture.
     */
    bool isAhead(int64_t at) const;

    bool namesSensors() const { return mNamesSensors; }
    const std::vector<trace::Sensor>& sensors() const { return mSensors; }
    const trace::Sensor* sensorOf(uint32_t handle) const;

    /** The sensor of a row of the battery statistics; null for GPS. */
    const trace::Sensor* sensorOf(const trace::ChargeRow& row) const;

    /** Its name, also of GPS; empty if it is not known. */
    std::string nameOf(const trace::ChargeRow& row) const;

    /** The packages of a uid; null if they are not known. */
    const std::vector<std::string>* packagesOf(int32_t uid) const;

    /** Fills in what the device's lists tell of the holder's uid and handle. */
    void complete(Holder* holder) const;
    Holder holderOf(const trace::Client& client) const;

    const std::optional<trace::KnownStates>& known() const { return mKnown; }

    /** When the display is known; nothing if that is not told. */
    const std::optional<std::vector<Span>>& displayKnown() const { return mDisplayKnown; }

    const std::vector<trace::Interval>& gaps() const { return mGaps; }
    const std::optional<trace::TakenNote>& taken() const { return mTaken; }
    const std::vector<trace::LostNote>& lost() const { return mLost; }

private:
    bool mNamesSensors = false;
    std::vector<trace::Sensor> mSensors;
    std::map<uint32_t, size_t> mByHandle;  // in `mSensors`
    std::map<int32_t, std::vector<std::string>> mPackages;

    std::optional<trace::CaptureNote> mCapture;
    std::optional<int64_t> mFirstDay;
    std::optional<int64_t> mKnownTo;
    std::optional<int64_t> mTakenAt;
    std::optional<trace::KnownStates> mKnown;
    std::optional<std::vector<Span>> mDisplayKnown;
    std::vector<trace::Interval> mGaps;
    std::optional<trace::TakenNote> mTaken;
    std::vector<trace::LostNote> mLost;
};

}  // namespace day
