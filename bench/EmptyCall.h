#pragma once

#include <hardware/sensors.h>

/** In a library of its own: a virtual operation that does nothing, called across the boundary. */
class EmptyCall {
public:
    static EmptyCall* create();
    virtual ~EmptyCall();
    virtual void process(const sensors_event_t& event);
};
