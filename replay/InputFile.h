#pragma once

#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "trace/Failure.h"
#include "trace/LineReader.h"

namespace replay {

/** An input, opened, of which the first line that says something has been read. */
struct InputFile {
    std::string name;  // as it was given; "-" is standard input
    std::unique_ptr<trace::LineReader> lines;
    std::optional<std::string_view> first;  // valid until the next line is read; nothing if empty

    /** Whether it holds a device capture; a trace's first line is a JSON object. */
    bool isCapture() const;
};

/** Opens `name` into `*file`. Returns nothing, or why it cannot be read. */
std::optional<trace::Failure> open(const std::string& name, InputFile* file);

/**
 * Whether the file `name` is a capture for sure, as its first bytes tell. Only a regular file is
 * looked at; one that begins with a comment may be either.
 */
bool isSurelyCapture(const std::string& name);

}  // namespace replay
