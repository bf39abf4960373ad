#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace base {
class JsonWriter;
}

/**
 * What a trace says beside its calls, in "note": docs/trace.md lists the keys. The library never
 * sees it. Names are data from outside. Times are milliseconds of the trace's clock.
 */
namespace trace {

/** How a sensor reports. */
enum class SensorMode { kUnknown, kContinuous, kOnChange, kOneShot, kSpecialTrigger };

/** An entry of the device's list of sensors. Names may repeat. */
struct Sensor {
    uint32_t handle = 0;
    int32_t type = 0;
    std::string name;
    SensorMode mode = SensorMode::kUnknown;
    std::optional<bool> wakeUp;
    std::optional<float> minRate;  // Hz
    std::optional<float> maxRate;  // Hz
};

/** From `from` up to, but without, `to`. */
struct Interval {
    int64_t from = 0;
    int64_t to = 0;
};

/** What bounds a capture's knowledge. */
enum class Bound { kStamp, kCapturedAt, kHeader, kRegistration, kEvent };

/** A capture, or several merged ones, of which the trace was made. */
struct CaptureNote {
    std::vector<std::string> files;       // as they were given; in the order of their contents
    std::optional<std::string> taken;     // the newest stamp: "2018-04-25 11:45:34"
    std::optional<std::string> midnight;  // the date of time 0: "2018-04-25"
    int64_t registrations = 0;            // lines that are in the trace
    int64_t from = 0;                     // of the oldest registration line
    int64_t to = 0;                       // of the newest
    int64_t knownTo = 0;                  // later nothing is known
    Bound bound = Bound::kRegistration;   // of `knownTo`
    std::vector<std::string> warnings;    // of the import, a line each
};

/** When the states of the device are known; in order, apart from each other. Empty: never. */
struct KnownStates {
    std::vector<Interval> display;
    std::vector<Interval> charge;
    std::vector<Interval> camera;
    std::vector<Interval> call;
};

/** The packages that share a uid. */
struct UidPackages {
    int32_t uid = 0;
    std::vector<std::string> names;
};

/** A client of a sensor. */
struct Client {
    std::string pkg;             // its tag
    std::optional<int32_t> uid;  // as far as it is known
    uint32_t handle = 0;
};

inline bool operator==(const Client& a, const Client& b) {
    return a.handle == b.handle && a.uid == b.uid && a.pkg == b.pkg;
}

/** What the line of an enable or a disable says besides. */
struct RegistrationNote {
    uint32_t handle = 0;
    std::optional<int32_t> uid;
    std::optional<int64_t> batchUs;  // -1: as long as possible
    bool before = false;             // on before anything is seen; this line stands for it
    bool rateKnown = true;           // false: the rate of the call is a guess

    // How many enables of the client are on behind this line. Left out where an enable adds one and
    // a disable takes one away. It differs behind a firing or a gap: those end a use, but disables
    // of the enables before them are still to come.
    std::optional<int64_t> level;
};

/** A use of a sensor ended without a call. */
struct EndNote {
    enum class How {
        kFired,   // a one-shot sensor switched itself off
        kUnseen,  // it ended at this moment at the latest
    };

    Client client;
    How how = How::kUnseen;
    std::optional<int64_t> at;  // when, if that is later than the trace's last line
};

/** A connection of a client to a sensor when the capture was taken. */
struct Connection {
    Client client;
    int64_t count = 1;                 // connections of this client to this sensor
    std::optional<bool> hasAccess;     // false: it gets no data
    std::optional<int64_t> wakeLocks;  // held by its connections
};

/** A direct channel when the capture was taken. */
struct DirectChannel {
    std::string package;
    std::optional<int32_t> uid;
    int64_t sensors = 0;         // how many are switched on
    std::vector<int64_t> rates;  // of the sensors: rate levels
};

/** Enables of a client that were refused. */
struct RefusedNote {
    Client client;
    int64_t count = 0;
    std::string result;  // as the device has it
};

inline constexpr int32_t kGpsHandle = -10000;  // in the battery statistics

/** A row of the battery statistics: what a uid held since the last charge. */
struct ChargeRow {
    int32_t uid = 0;
    int32_t handle = 0;  // or `kGpsHandle`
    int64_t ms = 0;
    int64_t count = 0;                  // 0: on since before the last charge
    std::optional<int64_t> background;  // ms of `ms`
    bool shared = false;                // `ms` is shared out among the uids that held it at once
};

struct SinceCharge {
    std::optional<int64_t> onBatteryMs;
    std::optional<int64_t> startMs;  // wall clock when the statistics began, UTC, since 1970
    std::vector<ChargeRow> rows;     // in the file's order
};

/** What is on when the capture is taken. It stands at the end of what is known. */
struct TakenNote {
    std::optional<std::vector<Connection>> connections;  // nothing: the capture has no table
    std::vector<DirectChannel> direct;
    std::optional<std::string> operatingMode;  // of the first connection that is not NORMAL
    std::vector<RefusedNote> refused;
    std::optional<SinceCharge> sinceCharge;
};

/** Lines of a record that are missing. */
struct LostNote {
    int64_t from = 0;
    int64_t to = 0;
    std::string why;
};

/** Work that began at `from` hangs. A record tells what it does later than a replay would. */
struct HangNote {
    int64_t from = 0;
};

struct Note {
    std::optional<CaptureNote> capture;
    std::optional<std::vector<Sensor>> sensors;
    std::vector<UidPackages> packages;
    std::optional<KnownStates> known;
    std::vector<Interval> gaps;  // lines are missing here (merged captures)
    std::optional<RegistrationNote> registration;
    std::optional<EndNote> end;
    std::optional<TakenNote> taken;
    std::optional<LostNote> lost;
    std::optional<HangNote> hang;
};

/** The words of a note. */
std::string_view nameOf(SensorMode mode);
SensorMode parseMode(std::string_view word);  // `kUnknown` for an unknown word

/** Appends `note` as a JSON object, as a value of `json`. */
void writeNote(const Note& note, base::JsonWriter* json);

/** The same as a text. */
std::string toJson(const Note& note);

/**
 * Reads what it knows of `json`, a valid JSON object. Keys that it does not know, and values of
 * another form than it knows, are passed over: they are somebody else's.
 */
Note parseNote(std::string_view json);

}  // namespace trace
