#pragma once

#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <utils/Vector.h>

/** What the library did, a line each: see `DeviceTest::taken`. */
using Lines = std::vector<std::string>;

/**
 * A fresh device with the library on it, in virtual time that starts at 0. Whatever sends an
 * event or sets a property must hold no lock meanwhile: both are foreign code. Each test needs a
 * process of its own, which CTest gives it. What the test calls holds the worker thread; it runs in
 * `advanceTo`.
 */
class DeviceTest : public ::testing::Test {
protected:
    DeviceTest();

    /** Lets time pass up to `ms` milliseconds, and all run that is due until then. */
    void advanceTo(double ms);

    /**
     * What the library did since the last call of this, in order, each line with its time in
     * milliseconds: "2000 N273|10009 count:3" for an event, "2000 NAME=VALUE" for a property that
     * was set, "2000 log 4 TEXT" for a line of its log.
     */
    Lines taken();

    /** A property as the device has it. */
    static void setProperty(const std::string& name, const std::string& value);
    static std::string property(const std::string& name);

    /** A list as a host gives it, whose memory ends with it: a sanitizer sees a read behind it. */
    static android::Vector<int> listOf(const std::vector<int>& values);
};
