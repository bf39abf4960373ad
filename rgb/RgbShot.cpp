#include "rgb/RgbShot.h"

#include <map>
#include <string>
#include <utility>

#include "core/Arithmetic.h"
#include "core/CounterProperty.h"
#include "core/SensorHandlerThread.h"
#include "core/TallyCommon.h"

namespace android {

namespace {

enum : int { MSG_LOAD_COUNT = 1, MSG_SAVE_COUNT = 2 };

constexpr int kLoadDelayMs = 2000;
constexpr int kSaveDelayMs = 500;

constexpr char kEventId[] = "N273|10009";
constexpr CounterProperty kCountProperty("persist.zuno.rgb.shot.count");

}  // namespace

class SENSOR_PRIV_HIDDEN RgbShot::RgbShotHandler : public MessageHandler {
public:
    void handleMessage(const Message& message) override {
        switch (message.what) {
            case MSG_LOAD_COUNT:
                getInstance()->initRgbShotCount();
                break;
            case MSG_SAVE_COUNT:
                getInstance()->updateRgbShotCount();
                break;
        }
    }
};

Mutex RgbShot::sLock;
RgbShot* RgbShot::mRgbShot = nullptr;

RgbShot* RgbShot::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mRgbShot == nullptr) mRgbShot = new RgbShot;
    return mRgbShot;
}

RgbShot::RgbShot() : mRgbShotCount(0), mHandler(new RgbShotHandler) {
    SensorHandlerThread::getInstance()->sendMessageDelayed(mHandler, MSG_LOAD_COUNT, kLoadDelayMs);
}

void RgbShot::setRgbShotCount() {
    {
        Mutex::Autolock lock(mLock);
        mRgbShotCount = addWrapped(mRgbShotCount, 1);
    }
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    thread->removeMessage(mHandler, MSG_SAVE_COUNT);
    thread->sendMessageDelayed(mHandler, MSG_SAVE_COUNT, kSaveDelayMs);
}

void RgbShot::initRgbShotCount() {
    // Not locked, on purpose: the load overwrites earlier samples in any case.
    mRgbShotCount = kCountProperty.load();
}

void RgbShot::updateRgbShotCount() {
    mLock.lock();
    const int32_t count = mRgbShotCount;
    mLock.unlock();
    kCountProperty.store(count);
}

void RgbShot::putRgbShotTally() {
    TallyCommon* tally = TallyCommon::getInstance();
    mLock.lock();
    std::map<std::string, std::string> params{{"count", tally->intToStr(mRgbShotCount)}};
    mLock.unlock();
    tally->trackEvent(kEventId, std::move(params));
    // This drops samples that were counted while the report was sent. The stored count stays.
    Mutex::Autolock lock(mLock);
    mRgbShotCount = 0;
}

void RgbShot::notifyRgbShotReset() {
    Mutex::Autolock lock(mLock);
    mRgbShotCount = 0;
}

}  // namespace android
