#include "replay/Player.h"

#include <array>
#include <cstring>
#include <string_view>

#include <android/log.h>
#include <dlfcn.h>

#include "base/Json.h"
#include "base/Result.h"
#include "clock/VirtualClock.h"
#include "platform/Display.h"
#include "platform/PropertyService.h"
#include "platform/Telemetry.h"
#include "replay/CallRecorder.h"

namespace replay {

using base::Failure;
using trace::BootKind;
using trace::Record;

namespace {

/** For the observers of the platform, which are plain functions or know no context. */
trace::RecordWriter* gRecords = nullptr;

void record(Record::Kind kind, std::array<std::string_view, 3> texts, int64_t number = 0) {
    gRecords->add({kind, virtual_clock::now(), texts, number});
}

/** The platform's own libraries log too; only the library's lines are shown. */
void takeLogLine(const __android_logger_data* data, const char* message) {
    if (std::strcmp(data->tag, SENSOR_PRIV_LOG_TAG) == 0) {
        record(Record::Kind::kLog, {data->tag, message}, data->priority);
    } else {
        __android_log_stderr_logger(data, message);
    }
}

void observePlatform(trace::RecordWriter* records) {
    gRecords = records;
    __android_log_set_logger(takeLogLine);
    __android_log_set_minimum_priority(ANDROID_LOG_VERBOSE);
    platform::observeEvents([](const char* module, const char* id, const char* payload) {
        record(Record::Kind::kEvent, {module, id, payload});
    });
    platform::observePropertySet([](const char* name, const char* value) {
        record(Record::Kind::kProperty, {name, value});
    });
}

/** Loads the library, which runs its static initialisers. Null if that fails. */
const trace::CallModule* loadCallModule() {
    void* module = dlopen(SENSOR_REPLAY_CALLS, RTLD_NOW | RTLD_LOCAL);
    if (module == nullptr) return nullptr;
    const auto entry = reinterpret_cast<const trace::CallModule* (*)()>(
            dlsym(module, trace::kCallModuleEntry));
    return entry == nullptr ? nullptr : entry();
}

/** One process's part of a replay. */
class Player {
public:
    explicit Player(const Channels& channels)
          : mReader(channels.reader),
            mRecords(channels.records),
            mCalls(channels.records),
            mWanted(channels.wanted) {}

    base::Result<NextBoot> play(const Boot& boot, const trace::TraceLine* first) {
        start(boot);
        if (first != nullptr) mLine = *first;
        for (bool isThere = first != nullptr || readNext(); isThere; isThere = readNext()) {
            if (const auto* kind = std::get_if<BootKind>(&mLine.action)) return endByBoot(*kind);
            if (!carryOut() || storeFailed()) break;
        }
        if (mFailure) return tl::unexpected(*mFailure);
        virtual_clock::settle();
        recordCounters();
        if (storeFailed()) return tl::unexpected(*mFailure);
        return NextBoot();
    }

    /** Whether the last line but for one that boots did something: more of it may have followed. */
    bool endedInAction() const { return mEndedInAction; }

private:
    void start(const Boot& boot) {
        observePlatform(mRecords);
        virtual_clock::set(boot.at);
        mLastAt = boot.at;
        if (boot.kind == BootKind::kDevice) platform::dropVolatileProperties();
        mRecords->add({Record::Kind::kBoot, boot.at, {}, 0, static_cast<int32_t>(boot.kind)});
        takeNote(boot.note);
    }

    /** The first note switches the records of calls on: what it tells is told of them. */
    void takeNote(const std::string& note) {
        if (note.empty()) return;
        mWanted.calls = true;
        record(Record::Kind::kNote, {note}, mReader->lineNumber());
    }

    bool readNext() {
        if (!mReader->hasLine()) mRecords->flush();
        const auto isThere = mReader->next(&mLine);
        if (!isThere) mFailure = isThere.error();
        if (mReader->isTorn()) record(Record::Kind::kTorn, {}, mReader->lineNumber());
        if (!isThere || !*isThere) return false;
        const auto* boot = std::get_if<BootKind>(&mLine.action);
        const bool newClock = boot != nullptr && *boot == BootKind::kDevice;
        if (mLine.at < mLastAt && !newClock) {
            return fail(R"("at" goes back, from )" + base::formatMs(mLastAt) + " to " +
                        base::formatMs(mLine.at));
        }
        mLastAt = mLine.at;
        return true;
    }

    base::Result<NextBoot> endByBoot(BootKind kind) {
        // The new clock's times say nothing about the old one: only its present moment runs out.
        // A process boot comes in the middle of a moment; what that has posted is lost.
        if (kind == BootKind::kDevice) {
            virtual_clock::settle();
            recordCounters();
        } else {
            passTime();
        }
        if (storeFailed()) return tl::unexpected(*mFailure);
        return Boot{kind, mLine.at, mLine.note};
    }

    /** Fails if the store did: without it, the library is on a device that cannot exist. */
    bool storeFailed() {
        const auto error = platform::propertyFileError();
        return error && !fail(*error);
    }

    /** Makes `what` the failure, at the present line. Returns false. */
    bool fail(const std::string& what, int status = base::kStatusBadInput) {
        mFailure = Failure{base::at(mReader->name(), mReader->lineNumber()) + what, status};
        return false;
    }

    void passTime() {
        if (mLine.at <= virtual_clock::now()) return;
        if (mWanted.counters) {
            virtual_clock::advanceTo(mLine.at, [this] { recordCounters(); });
        } else {
            virtual_clock::advanceTo(mLine.at);
        }
    }

    bool carryOut() {
        mEndedInAction = !std::holds_alternative<std::monostate>(mLine.action);
        if (const auto* expectation = std::get_if<trace::Expectation>(&mLine.action)) {
            // Time does not pass: the line tells of a device whose worker may have been late.
            takeNote(mLine.note);
            mRecords->add(
                    {Record::Kind::kExpect, mLine.at, {expectation->entry}, mReader->lineNumber()});
            return true;
        }
        passTime();
        if (storeFailed()) return false;
        if (const auto* call = std::get_if<trace::Call>(&mLine.action)) return make(*call);
        takeNote(mLine.note);
        if (const auto* variables = std::get_if<trace::VariableWrites>(&mLine.action)) {
            return write(*variables);
        }
        if (const auto* properties = std::get_if<trace::PropertyWrites>(&mLine.action)) {
            for (const auto& [name, value] : properties->writes) {
                platform::setDeviceProperty(name, value);
            }
        } else if (const auto* display = std::get_if<platform::DisplayChange>(&mLine.action)) {
            if (const auto error = platform::changeDisplay(*display)) {
                return fail(*error, base::kStatusFailed);
            }
        }
        return true;
    }

    bool make(const trace::Call& call) {
        if (!load()) return false;
        recordCall(call);
        if (const auto result = mModule->call(call.index, call.arguments)) {
            record(Record::Kind::kResult, {trace::callName(call.index), *result});
        }
        recordCounters();
        return true;
    }

    void recordCall(const trace::Call& call) {
        if (isRegistration(call)) {
            if (!mLine.note.empty()) mWanted.calls = true;
        } else {
            takeNote(mLine.note);
        }
        if (mWanted.calls) mCalls.record(call, virtual_clock::now(), mLine.note);
    }

    bool write(const trace::VariableWrites& variables) {
        if (!load()) return false;
        for (const auto& [index, value] : variables.writes) mModule->set(index, value);
        return true;
    }

    /** Makes a record of the library's counters, if they have changed and are wanted. */
    void recordCounters() {
        if (mModule == nullptr || !mWanted.counters) return;
        const trace::Counters counters = mModule->counters();
        if (counters == mCounters) return;
        mCounters = counters;
        const std::string_view bytes(reinterpret_cast<const char*>(counters.data()),
                                     sizeof(counters));
        record(Record::Kind::kCounters, {bytes});
    }

    /** Properties that were set before the first call are in force when the library starts. */
    bool load() {
        if (mModule == nullptr) mModule = loadCallModule();
        if (mModule == nullptr) {
            mFailure = Failure{std::string("cannot load the library: ") + dlerror(),
                               base::kStatusFailed};
        }
        return mModule != nullptr;
    }

    trace::TraceReader* const mReader;
    trace::RecordWriter* const mRecords;
    CallRecorder mCalls;
    trace::WantedRecords mWanted;

    std::optional<Failure> mFailure;
    trace::TraceLine mLine;
    bool mEndedInAction = false;
    int64_t mLastAt = 0;  // of the line before; expectations do not move the clock
    const trace::CallModule* mModule = nullptr;
    trace::Counters mCounters{};  // as last recorded
};

}  // namespace

void preload() {
    loadCallModule();
}

base::Result<NextBoot> play(const Boot& boot, const trace::TraceLine* first,
                            const Channels& channels) {
    Player player(channels);
    auto next = player.play(boot, first);
    record(Record::Kind::kOver, {}, player.endedInAction() ? 1 : 0);
    return next;
}

}  // namespace replay
