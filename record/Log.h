#pragma once

namespace record {

/** The tag of the recorder's own log lines: where it records to, and why it has stopped. */
inline constexpr char kLogTag[] = "sensor-priv-record";

}  // namespace record
