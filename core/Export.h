#pragma once

/**
 * Marks the classes and variables that the host links against. Everything else in the library is
 * hidden; `sensor-priv.map` keeps instances of other libraries' templates out of the exported list.
 */
#define SENSOR_PRIV_EXPORT __attribute__((visibility("default")))

/** Marks what is nested in an exported class but is no business of the host's. */
#define SENSOR_PRIV_HIDDEN __attribute__((visibility("hidden")))
