#pragma once

#include <string>
#include <string_view>

namespace report {

/** Standard output, gathered into large writes. One thread at a time may use it. */
class Stdout {
public:
    /** Takes text; hands it on when there is much of it. */
    void write(std::string_view text);

    /** Hands on what was gathered. If that fails, says so and ends the process with status 1. */
    void flush();

private:
    std::string mGathered;
};

}  // namespace report
