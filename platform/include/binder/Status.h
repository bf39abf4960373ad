#pragma once

namespace android::binder {

/** The outcome of a call between processes. On the host no call fails. */
class Status final {
public:
    static Status ok() { return Status(); }

    bool isOk() const { return true; }
};

}  // namespace android::binder
