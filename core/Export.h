#pragma once

/**
 * Exports a class or a variable to the host. Everything else is hidden. `core/sensor-priv.map` must
 * name it too: the map keeps instances of other libraries' templates from being exported.
 */
#define SENSOR_PRIV_EXPORT __attribute__((visibility("default")))

/** Hides a member of an exported class that does not concern the host. */
#define SENSOR_PRIV_HIDDEN __attribute__((visibility("hidden")))
