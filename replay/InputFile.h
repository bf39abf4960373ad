#pragma once

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "base/LineReader.h"
#include "base/Result.h"
#include "capture/ImportedCapture.h"

namespace replay {

/** An opened input, positioned behind its first line that is neither blank nor a comment. */
struct InputFile {
    std::string name;  // as it was given; "-" is standard input
    std::unique_ptr<base::LineReader> lines;
    std::optional<std::string_view> first;  // valid until the next line is read; nothing if empty

    /** Whether it holds a device capture; a trace's first line is a JSON object. */
    bool isCapture() const;
};

/**
 * Opens `name`, one of so many `inputs`.
 *
 * An input without anything but blank lines is refused: nobody means to play one, but a command
 * that failed leaves one. `/dev/null` beside others is meant: it has the others' lines name their
 * file. A trace may consist of comments.
 */
base::Result<InputFile> open(const std::string& name, size_t inputs);

/** Makes a trace of the captures `names`, of one device, which stand for one of `inputs`. */
base::Result<capture::ImportedCapture> importCaptures(const std::vector<std::string>& names,
                                                      size_t inputs);

/**
 * Whether the file `name` is a capture for sure, as its first bytes tell. Only a regular file is
 * looked at; one that begins with many comments may be either.
 */
bool isSurelyCapture(const std::string& name);

}  // namespace replay
