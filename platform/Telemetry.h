#pragma once

#include <functional>

/** The telemetry library's one function. Takes three NUL-terminated texts. */
extern "C" void track_event(const char* moduleId, const char* eventId, const char* payload);

namespace platform {

/**
 * Hands every event to `observer`, on the thread that sent it. Without an observer, events are
 * logged. To be called before events are sent.
 */
void observeEvents(
        std::function<void(const char* moduleId, const char* eventId, const char* payload)>
                observer);

}  // namespace platform
