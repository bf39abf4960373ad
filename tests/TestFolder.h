#pragma once

#include <cstdlib>
#include <filesystem>
#include <string>

#include <gtest/gtest.h>

/** A folder that lives as long as the object. */
class TestFolder {
public:
    TestFolder() {
        std::string name = ::testing::TempDir() + "sensor-priv-XXXXXX";
        mPath = mkdtemp(name.data());
    }

    ~TestFolder() { std::filesystem::remove_all(mPath); }

    TestFolder(const TestFolder&) = delete;
    TestFolder& operator=(const TestFolder&) = delete;

    /** The path of `name` in it. */
    std::string operator/(const std::string& name) const { return mPath / name; }

private:
    std::filesystem::path mPath;
};
