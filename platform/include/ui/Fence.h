#pragma once

#include <condition_variable>
#include <memory>
#include <mutex>
#include <utility>

#include <utils/Errors.h>
#include <utils/LightRefBase.h>
#include <utils/StrongPointer.h>

namespace platform {
class CaptureThread;
}

namespace android {

/** Signals once, when the contents of a buffer are complete. */
class Fence : public LightRefBase<Fence> {
public:
    /** An invalid fence. Waiting for it returns at once. */
    static const sp<Fence> NO_FENCE;

    /** Makes an invalid fence. */
    Fence() = default;

    Fence(const Fence&) = delete;
    Fence& operator=(const Fence&) = delete;

    bool isValid() const { return mSignal != nullptr; }

    /**
     * Waits for the signal. A time-out of 0 does not wait: returns -ETIME if there was no signal.
     * Any other time-out never passes, as the clock stands still during a capture. Returns an error
     * if the signal is one.
     */
    status_t wait(int timeoutMs);
    status_t waitForever(const char* logname);

private:
    friend class LightRefBase<Fence>;
    friend class platform::CaptureThread;

    struct Signal {
        std::mutex mutex;
        std::condition_variable given;
        bool isGiven = false;  // guarded by mutex
        status_t status = OK;  // what a wait for it returns; constant once it is shared
    };

    explicit Fence(std::shared_ptr<Signal> signal) : mSignal(std::move(signal)) {}
    ~Fence() = default;

    // Shared with the thread that gives the signal, which holds no reference to the fence.
    const std::shared_ptr<Signal> mSignal;
};

}  // namespace android
