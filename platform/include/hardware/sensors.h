#pragma once

#include <stdint.h>

/** A sensor event as the platform's sensor interface lays it out, on 32 and 64 bits alike. */
typedef struct sensors_event_t {
    int32_t version;  // sizeof(sensors_event_t)
    int32_t sensor;   // handle
    int32_t type;
    int32_t reserved0;
    int64_t timestamp;  // nanoseconds
    union {
        union {
            float data[16];
            float distance;  // centimetres
            float light;     // lux
        };
        union {
            uint64_t data[8];
            uint64_t step_counter;
        } u64;
    };
    uint32_t flags;
    uint32_t reserved1[3];
} sensors_event_t;
