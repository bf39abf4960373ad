#pragma once

#include <utils/Errors.h>

namespace android {

class Parcel;

/** A record that can travel between processes. */
class Parcelable {
public:
    Parcelable() = default;
    Parcelable(const Parcelable&) = default;
    Parcelable& operator=(const Parcelable&) = default;
    virtual ~Parcelable() = default;

    virtual status_t writeToParcel(Parcel* parcel) const = 0;
    virtual status_t readFromParcel(const Parcel* parcel) = 0;
};

}  // namespace android
