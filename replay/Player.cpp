#include "replay/Player.h"

#include <array>
#include <cstring>
#include <string_view>

#include <android/log.h>
#include <dlfcn.h>

#include "platform/Display.h"
#include "platform/PropertyService.h"
#include "platform/Telemetry.h"
#include "replay/VirtualClock.h"
#include "trace/TraceTime.h"

namespace replay {

using report::Record;
using trace::BootKind;
using trace::Failure;

namespace {

/** For the observers of the platform, which are plain functions or know no context. */
report::RecordWriter* gRecords = nullptr;

void record(Record::Kind kind, std::array<std::string_view, 3> texts, int64_t number = 0) {
    gRecords->add({kind, virtual_clock::now(), number, texts});
}

/** The platform's own libraries log too; only the library's lines are shown. */
void takeLogLine(const __android_logger_data* data, const char* message) {
    if (std::strcmp(data->tag, SENSOR_PRIV_LOG_TAG) == 0) {
        record(Record::Kind::kLog, {data->tag, message}, data->priority);
    } else {
        __android_log_stderr_logger(data, message);
    }
}

void observePlatform(report::RecordWriter* records) {
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
    Player(const Channels& channels, std::optional<Failure>* failure)
          : mChannels(channels),
            mReader(channels.reader),
            mFailure(failure) {}

    NextBoot play(const Boot& boot, const trace::TraceLine* first) {
        observePlatform(mChannels.records);
        virtual_clock::set(boot.at);
        mLastAt = boot.at;
        if (boot.kind == BootKind::kDevice) platform::dropVolatileProperties();
        record(Record::Kind::kBoot, {bootName(boot.kind)});
        if (first != nullptr) mLine = *first;
        if (first != nullptr || readNext()) {
            do {
                if (const auto* kind = std::get_if<BootKind>(&mLine.action)) {
                    return endByBoot(*kind);
                }
                if (!carryOut() || storeFailed()) return {};
            } while (readNext());
        }
        if (*mFailure) return {};
        virtual_clock::settle();
        recordCounters();
        storeFailed();
        return {};
    }

private:
    bool readNext() {
        if (!mReader->hasLine()) mChannels.records->flush();
        if (!mReader->next(&mLine, mFailure)) return false;
        const auto* boot = std::get_if<BootKind>(&mLine.action);
        const bool newClock = boot != nullptr && *boot == BootKind::kDevice;
        if (mLine.at < mLastAt && !newClock) {
            return fail(R"("at" goes back, from )" + trace::formatMs(mLastAt) + " to " +
                        trace::formatMs(mLine.at));
        }
        mLastAt = mLine.at;
        return true;
    }

    NextBoot endByBoot(BootKind kind) {
        // The new clock's times say nothing about the old one: only its present moment runs out.
        // A process boot comes in the middle of a moment; what that has posted is lost.
        if (kind == BootKind::kDevice) {
            virtual_clock::settle();
            recordCounters();
        } else {
            passTime();
        }
        if (storeFailed()) return {};
        return Boot{kind, mLine.at};
    }

    /** Fails if the store did: without it, the library is on a device that cannot exist. */
    bool storeFailed() {
        const auto error = platform::propertyFileError();
        return error && !fail(*error);
    }

    /** Makes `what` the failure, at the present line. Returns false. */
    bool fail(const std::string& what, int status = trace::kStatusBadInput) {
        *mFailure = Failure{trace::at(mReader->name(), mReader->lineNumber()) + what, status};
        return false;
    }

    void passTime() {
        if (mLine.at <= virtual_clock::now()) return;
        if (mChannels.recordsCalls) {
            virtual_clock::advanceTo(mLine.at, [this] { recordCounters(); });
        } else {
            virtual_clock::advanceTo(mLine.at);
        }
    }

    bool carryOut() {
        if (const auto* expectation = std::get_if<trace::Expectation>(&mLine.action)) {
            // Time does not pass: the line tells of a device whose worker may have been late.
            mChannels.records->add(
                    {Record::Kind::kExpect, mLine.at, mReader->lineNumber(), {expectation->entry}});
            return true;
        }
        passTime();
        if (storeFailed()) return false;
        if (const auto* call = std::get_if<trace::Call>(&mLine.action)) return make(*call);
        if (const auto* variables = std::get_if<trace::VariableWrites>(&mLine.action)) {
            return write(*variables);
        }
        if (const auto* properties = std::get_if<trace::PropertyWrites>(&mLine.action)) {
            for (const auto& [name, value] : properties->writes) {
                platform::setDeviceProperty(name, value);
            }
        } else if (const auto* display = std::get_if<platform::DisplayChange>(&mLine.action)) {
            if (const auto error = platform::changeDisplay(*display)) {
                return fail(*error, trace::kStatusFailed);
            }
        }
        return true;
    }

    bool make(const trace::Call& call) {
        if (!load()) return false;
        const std::string_view name = trace::callName(call.index);
        if (mChannels.recordsCalls)
            record(Record::Kind::kCall, {mReader->text()}, mReader->lineNumber());
        if (const auto result = mModule->call(call.index, call.arguments)) {
            record(Record::Kind::kResult, {name, *result});
        }
        recordCounters();
        return true;
    }

    bool write(const trace::VariableWrites& variables) {
        if (!load()) return false;
        for (const auto& [index, value] : variables.writes) mModule->set(index, value);
        return true;
    }

    /** Makes a record of the library's counters, if they have changed and calls are recorded. */
    void recordCounters() {
        if (mModule == nullptr || !mChannels.recordsCalls) return;
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
            *mFailure = Failure{std::string("cannot load the library: ") + dlerror(),
                                trace::kStatusFailed};
        }
        return mModule != nullptr;
    }

    const Channels& mChannels;
    trace::TraceReader* const mReader;
    std::optional<Failure>* const mFailure;

    trace::TraceLine mLine;
    int64_t mLastAt = 0;  // of the line before; expectations do not move the clock
    const trace::CallModule* mModule = nullptr;
    trace::Counters mCounters{};  // as last recorded
};

}  // namespace

const char* bootName(BootKind kind) {
    return kind == BootKind::kDevice ? "device" : "process";
}

NextBoot play(const Boot& boot, const trace::TraceLine* first, const Channels& channels,
              std::optional<Failure>* failure) {
    const NextBoot next = Player(channels, failure).play(boot, first);
    record(Record::Kind::kOver, {});
    return next;
}

}  // namespace replay
