#include "replay/Player.h"

#include <cstring>

#include <android/log.h>
#include <dlfcn.h>

#include "platform/Display.h"
#include "platform/PropertyService.h"
#include "platform/Telemetry.h"
#include "replay/VirtualClock.h"
#include "trace/TraceTime.h"

namespace replay {

namespace {

/** For the observers of the platform, which are plain functions or know no context. */
report::Output* gOutput = nullptr;

/** The platform's own libraries log too; only the library's lines are shown. */
void takeLogLine(const __android_logger_data* data, const char* message) {
    if (std::strcmp(data->tag, SENSOR_PRIV_LOG_TAG) == 0) {
        gOutput->log(data->priority, data->tag, message);
    } else {
        __android_log_stderr_logger(data, message);
    }
}

void observePlatform(report::Output* output) {
    gOutput = output;
    __android_log_set_logger(takeLogLine);
    __android_log_set_minimum_priority(ANDROID_LOG_VERBOSE);
    platform::observeEvents([](const char* module, const char* id, const char* payload) {
        gOutput->event(module, id, payload);
    });
    platform::observePropertySet(
            [](const char* name, const char* value) { gOutput->property(name, value); });
}

/** Loads the library, which runs its static initialisers. Null if that fails. */
const trace::Calls* loadCalls() {
    void* module = dlopen(SENSOR_REPLAY_CALLS, RTLD_NOW | RTLD_LOCAL);
    if (module == nullptr) return nullptr;
    const auto entry =
            reinterpret_cast<const trace::Calls* (*)()>(dlsym(module, trace::kCallsEntry));
    return entry == nullptr ? nullptr : entry();
}

/** One process's part of a replay. */
class Player {
public:
    Player(const std::string& name, trace::LineReader* reader, report::Output* output,
           std::optional<Failure>* failure)
          : mName(name),
            mReader(reader),
            mOutput(output),
            mFailure(failure) {}

    NextBoot play(const Boot& boot, const trace::TraceLine* first) {
        observePlatform(mOutput);
        virtual_clock::set(boot.at);
        if (boot.kind == trace::BootKind::kDevice) platform::dropVolatileProperties();
        mOutput->boot(boot.kind == trace::BootKind::kDevice ? "device" : "process");
        if (first != nullptr) mLine = *first;
        if (first != nullptr || readNext()) {
            do {
                if (mLine.action == trace::TraceLine::Action::kBoot) return endByBoot();
                if (mLine.at > virtual_clock::now()) virtual_clock::advanceTo(mLine.at);
                if (!carryOut()) return {};
            } while (readNext());
        }
        if (!*mFailure) virtual_clock::settle();
        return {};
    }

private:
    bool readNext() {
        if (!mReader->hasLine()) mOutput->flush();
        if (!readLine(mName, mReader, &mParser, &mLine, mFailure)) return false;
        const bool newClock = mLine.action == trace::TraceLine::Action::kBoot &&
                              mLine.boot == trace::BootKind::kDevice;
        if (mLine.at < virtual_clock::now() && !newClock) {
            *mFailure = Failure{mName + ':' + std::to_string(mReader->lineNumber()) +
                                        R"(: "at" goes back, from )" +
                                        trace::formatMs(virtual_clock::now()) + " to " +
                                        trace::formatMs(mLine.at),
                                kStatusBadInput};
            return false;
        }
        return true;
    }

    NextBoot endByBoot() {
        // The new clock's times say nothing about the old one: only its present moment runs out.
        // A process boot comes in the middle of a moment; what that has posted is lost.
        if (mLine.boot == trace::BootKind::kDevice) {
            virtual_clock::settle();
        } else if (mLine.at > virtual_clock::now()) {
            virtual_clock::advanceTo(mLine.at);
        }
        return Boot{mLine.boot, mLine.at};
    }

    bool carryOut() {
        switch (mLine.action) {
            case trace::TraceLine::Action::kCall:
                if (!load()) return false;
                if (const auto result = mCalls->call(mLine.call, mLine.arguments)) {
                    mOutput->result(trace::callName(mLine.call), *result);
                }
                break;
            case trace::TraceLine::Action::kSet:
                if (!load()) return false;
                for (const auto& [index, value] : mLine.variables) mCalls->set(index, value);
                break;
            case trace::TraceLine::Action::kProperty:
                for (const auto& [name, value] : mLine.properties) {
                    platform::setDeviceProperty(name, value);
                }
                break;
            case trace::TraceLine::Action::kDisplay:
                platform::changeDisplay(mLine.display);
                break;
            case trace::TraceLine::Action::kNone:
            case trace::TraceLine::Action::kBoot:
                break;
        }
        return true;
    }

    /** Properties that were set before the first call are in force when the library starts. */
    bool load() {
        if (mCalls == nullptr) mCalls = loadCalls();
        if (mCalls == nullptr) {
            *mFailure =
                    Failure{std::string("cannot load the library: ") + dlerror(), kStatusFailed};
        }
        return mCalls != nullptr;
    }

    const std::string& mName;
    trace::LineReader* const mReader;
    report::Output* const mOutput;
    std::optional<Failure>* const mFailure;

    trace::TraceParser mParser;
    trace::TraceLine mLine;
    const trace::Calls* mCalls = nullptr;
};

}  // namespace

bool readLine(const std::string& name, trace::LineReader* reader, trace::TraceParser* parser,
              trace::TraceLine* line, std::optional<Failure>* failure) {
    const auto fail = [&](const std::string& what) {
        *failure = Failure{name + ':' + std::to_string(reader->lineNumber()) + ": " + what,
                           kStatusBadInput};
        return false;
    };
    while (const auto text = reader->next()) {
        if (trace::isSkipped(*text)) continue;
        if (const auto error = parser->parse(*text, name, line)) return fail(*error);
        return true;
    }
    return reader->error() ? fail(*reader->error()) : false;
}

NextBoot play(const Boot& boot, const trace::TraceLine* first, const std::string& name,
              trace::LineReader* reader, report::Output* output, std::optional<Failure>* failure) {
    return Player(name, reader, output, failure).play(boot, first);
}

}  // namespace replay
