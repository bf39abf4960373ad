#include "bench/EmptyCall.h"

EmptyCall* EmptyCall::create() {
    return new EmptyCall;
}

EmptyCall::~EmptyCall() = default;

void EmptyCall::process(const sensors_event_t&) {}
