#pragma once

namespace android::binder {

/** What a call between processes returns; here no call fails. */
class Status final {
public:
    static Status ok() { return Status(); }

    bool isOk() const { return true; }
};

}  // namespace android::binder
