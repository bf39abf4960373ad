/** Imports any text as a capture: a trace that comes of it must be in order. */

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>

#include "capture/CaptureImport.h"
#include "fuzz/FuzzInput.h"
#include "trace/LineReader.h"
#include "trace/TraceLine.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    trace::LineReader reader(fuzz::readable(data, size));
    const auto first = reader.next();
    if (!first) return 0;
    const capture::ImportedCapture imported = capture::importCapture("capture", *first, &reader);
    const auto* trace = reinterpret_cast<const uint8_t*>(imported.trace.data());
    trace::LineReader lines(fuzz::readable(trace, imported.trace.size()));
    static trace::TraceParser parser;
    trace::TraceLine line;
    int64_t last = 0;
    while (const auto text = lines.next()) {
        const auto error = parser.parse(*text, "capture", &line);
        if (error || line.at < last) {
            std::fprintf(stderr, "%s: %.*s\n", error.value_or("goes back").c_str(),
                         static_cast<int>(text->size()), text->data());
            std::abort();
        }
        last = line.at;
    }
    return 0;
}
