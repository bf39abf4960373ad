#pragma once

#include <cstdint>

namespace android {

/**
 * Reads the decimal number at the start of `text`, after blanks and a sign, into `*value`.
 * A number that does not fit 32 bits reads as the nearest one that does. Text that does not start
 * with a number leaves `*value` unchanged. This is the one place where stored numbers are parsed,
 * so that they read the same on 32-bit and 64-bit machines.
 */
void parseInt32(const char* text, int32_t* value);

/** A counter's place in the system properties. May be used from any thread; takes no lock. */
class CounterProperty {
public:
    /** `name` must outlive the object; a string literal is meant. */
    constexpr explicit CounterProperty(const char* name) : mName(name) {}

    /** The stored number, read by `parseInt32`; 0 if the property is unset or holds no number. */
    int32_t load() const;

    /** Writes `value` as decimal text. Whether the write succeeds is not looked at. */
    void store(int32_t value) const;

private:
    const char* mName;
};

}  // namespace android
