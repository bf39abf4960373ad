#pragma once

#include <string>
#include <string_view>

namespace report {

enum class OutputFormat { kJson, kText };

/**
 * Writes what happened on standard output, a line each, stamped with the virtual clock. Lines are
 * gathered until `flush`, or until there are many. One thread at a time may use it.
 */
class Output {
public:
    explicit Output(OutputFormat format) : mFormat(format) {}

    void boot(std::string_view kind);
    void event(std::string_view module, std::string_view id, std::string_view payload);
    void property(std::string_view name, std::string_view value);
    void log(int level, std::string_view tag, std::string_view text);

    /** `json` is the result as JSON. */
    void result(std::string_view call, std::string_view json);

    /** Hands on what was gathered. If that fails, says so and ends the process with status 1. */
    void flush();

private:
    void line(std::string_view json, std::string_view kind, std::string_view text);

    const OutputFormat mFormat;
    std::string mGathered;
};

}  // namespace report
