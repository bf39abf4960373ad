#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include <gtest/gtest.h>

/** What a run of sensor-replay left. */
struct Played {
    int status;       // of its exit
    std::string out;  // standard output
    std::string err;  // standard error
};

/** Runs the built sensor-replay on files of a folder of its own, which is the current one. */
class ReplayToolTest : public ::testing::Test {
protected:
    ReplayToolTest();
    ~ReplayToolTest() override;

    /** Writes a file into the folder. */
    void write(const std::string& name, const std::string& text) const;

    /**
     * Writes the example of a capture as a device prints it: what begins with a comment may be a
     * trace, and is never played beside another input.
     */
    void writeCapture(const std::string& name) const;

    /**
     * `arguments` and `environment`, such as "NAME=value", as a shell takes them; `input` is its
     * standard input.
     */
    Played run(const std::string& arguments, const std::string& input = "",
               const std::string& environment = "") const;

    /** What stands in a file of the folder. */
    std::string read(const std::string& name) const;

    /** The lines of a JSON output but for boots. */
    static std::vector<std::string> happened(const Played& played);

private:
    std::filesystem::path mFolder;
};
