#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string_view>

#include "trace/Record.h"
#include "trace/TraceLine.h"

namespace replay {

/** Makes records of the calls of one boot that tell what happens to the device. */
class CallRecorder {
public:
    explicit CallRecorder(trace::RecordWriter* records) : mRecords(records) {}

    /** `call` is made at `at`, ns; `note`, as JSON, goes into the record of a registration. */
    void record(const trace::Call& call, int64_t at, std::string_view note);

private:
    void recordNotification(const trace::IntList& list, int64_t at);
    void recordState(trace::DeviceState state, int64_t value, int64_t at);

    trace::RecordWriter* const mRecords;
    std::array<std::optional<int64_t>, trace::kDeviceStates> mStates;  // as last recorded
};

/** Whether `call` is an enable or a disable of a sensor. */
bool isRegistration(const trace::Call& call);

}  // namespace replay
