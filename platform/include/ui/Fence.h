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

/** Signals once, when the contents that it stands for are complete. */
class Fence : public LightRefBase<Fence> {
public:
    /** An invalid fence, for which nobody has to wait. */
    static const sp<Fence> NO_FENCE;

    /** Makes an invalid fence. */
    Fence() = default;

    Fence(const Fence&) = delete;
    Fence& operator=(const Fence&) = delete;

    bool isValid() const { return mSignal != nullptr; }

    /**
     * Waits for the signal; with 0, only looks, and answers -ETIME if it has not come. The clock
     * stands still while a capture runs: no other time-out ever passes.
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
    };

    explicit Fence(std::shared_ptr<Signal> signal) : mSignal(std::move(signal)) {}
    ~Fence() = default;

    // Whoever gives the signal does so without a reference to the fence.
    const std::shared_ptr<Signal> mSignal;
};

}  // namespace android
