#pragma once

#include <stdint.h>

/** Usages of a graphic buffer. */
enum {
    GRALLOC_USAGE_SW_READ_OFTEN = 0x00000003U,
};
