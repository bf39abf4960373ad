/** Judges any text as a trace, line by line: no line may do more than be refused. */

#include <cstddef>
#include <cstdint>

#include "base/LineReader.h"
#include "fuzz/FuzzInput.h"
#include "trace/TraceLine.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static trace::TraceParser parser;
    base::LineReader reader(fuzz::readable(data, size));
    trace::TraceLine line;
    while (const auto text = reader.next()) {
        if (!trace::isSkipped(*text)) parser.parse(*text, "trace", &line);
    }
    return 0;
}
