#pragma once

#include <string>

#include "platform/Display.h"
#include "trace/JsonReader.h"

namespace trace {

/**
 * Reads the object behind "display" into `*change`; its picture is read from a file beside the file
 * `trace`. Returns what is wrong with it; `*change` is then not to be used.
 */
Error readDisplay(simdjson::dom::element json, const std::string& trace,
                  platform::DisplayChange* change);

}  // namespace trace
