#pragma once

#include <functional>

/** The telemetry library's one function: three NUL-terminated texts. */
extern "C" void track_event(const char* moduleId, const char* eventId, const char* payload);

namespace platform {

/**
 * Hands every event to `observer`, on the thread that sent it, instead of logging it. To be set
 * before events are sent.
 */
void observeEvents(
        std::function<void(const char* moduleId, const char* eventId, const char* payload)>
                observer);

}  // namespace platform
