#pragma once

#include <cstdint>

namespace android {

/** A counter that lives in a system property. Any thread may use it. It takes no lock. */
class CounterProperty {
public:
    /** `name` must outlive the object: pass a string literal. */
    constexpr explicit CounterProperty(const char* name) : mName(name) {}

    /** The stored number as `parseInt32` reads it, or 0 if there is none. */
    int32_t load() const;

    /** Stores `value` as decimal text. A failed write goes unnoticed. */
    void store(int32_t value) const;

private:
    const char* mName;
};

}  // namespace android
