#pragma once

#include <cstdint>

namespace android {

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
