#include "platform/Telemetry.h"

#include <utility>

#include <android/log.h>

namespace {

using Observer = std::function<void(const char*, const char*, const char*)>;

/** Never destroyed: the library's worker may send events until the process ends. */
Observer& observer() {
    static auto* const instance = new Observer;
    return *instance;
}

}  // namespace

void track_event(const char* moduleId, const char* eventId, const char* payload) {
    if (observer()) {
        observer()(moduleId, eventId, payload);
    } else {
        __android_log_print(ANDROID_LOG_INFO, moduleId, "%s %s", eventId, payload);
    }
}

namespace platform {

void observeEvents(Observer events) {
    observer() = std::move(events);
}

}  // namespace platform
