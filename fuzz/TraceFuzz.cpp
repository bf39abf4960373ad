/** Judges any text as a trace, line by line: no line may do more than be refused. */

#include <cstddef>
#include <cstdint>

#include "fuzz/FuzzInput.h"
#include "replay/LineReader.h"
#include "replay/TraceLine.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static replay::TraceParser parser;
    replay::LineReader reader(fuzz::readable(data, size));
    replay::TraceLine line;
    while (const auto text = reader.next()) {
        if (!replay::isSkipped(*text)) parser.parse(*text, "trace", &line);
    }
    return 0;
}
