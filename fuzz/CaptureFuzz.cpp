/**
 * Imports any bytes as a capture, packed or not: a trace that comes of it must be in order, and
 * must come of the same capture twice, merged, as well.
 */

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "base/LineReader.h"
#include "capture/CaptureImport.h"
#include "capture/text/TextSource.h"
#include "fuzz/FuzzInput.h"
#include "trace/TraceLine.h"

namespace {

[[noreturn]] void fail(const char* what, std::string_view line) {
    std::fprintf(stderr, "%s: %.*s\n", what, static_cast<int>(line.size()), line.data());
    std::abort();
}

/** Adds the text in the bytes. False if there is none. */
bool add(const uint8_t* data, size_t size, capture::CaptureImport* import) {
    base::Result<capture::OpenedText> opened = capture::openText(fuzz::readable(data, size));
    if (!opened) return false;
    base::LineReader reader(std::move(opened->text));
    const auto first = reader.next();
    if (first) import->add("capture", *first, &reader);
    return first.has_value();
}

std::string traceOf(capture::CaptureImport* import) {
    const auto imported = import->finish();
    return imported ? imported->trace : "";
}

std::string_view behindFirstLine(std::string_view trace) {
    return trace.substr(std::min(trace.size(), trace.find('\n')));
}

void checkOrder(const std::string& trace) {
    base::LineReader lines(
            fuzz::readable(reinterpret_cast<const uint8_t*>(trace.data()), trace.size()));
    static trace::TraceParser parser;
    trace::TraceLine line;
    int64_t last = 0;
    while (const auto text = lines.next()) {
        const auto error = parser.parse(*text, "capture", &line);
        if (error || line.at < last) fail(error.value_or("goes back").c_str(), *text);
        last = line.at;
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    capture::CaptureImport once;
    if (!add(data, size, &once)) return 0;
    const std::string trace = traceOf(&once);
    checkOrder(trace);
    capture::CaptureImport twice;
    add(data, size, &twice);
    add(data, size, &twice);
    // The first line names the files and has their warnings.
    if (behindFirstLine(traceOf(&twice)) != behindFirstLine(trace)) {
        fail("merged with itself it differs", trace);
    }
    return 0;
}
