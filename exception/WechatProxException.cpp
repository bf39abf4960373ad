#include "exception/WechatProxException.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <vector>

#include <cutils/properties.h>
#include <json/json.h>
#include <utils/Timers.h>

#include "core/Arithmetic.h"
#include "core/Connection.h"
#include "core/ParseInt32.h"
#include "core/SensorHandlerThread.h"
#include "core/StyledJson.h"
#include "core/TallyCommon.h"

namespace android {

namespace {

enum : int { MSG_LOAD = 1, MSG_CHECK = 2, MSG_SAVE = 3, MSG_REPORT = 4 };

constexpr int kLoadDelayMs = 2000;
constexpr int kCheckDelayMs = 100;
constexpr int kLastCheck = 5;
constexpr int64_t kMinSampleSpanNs = 20'000'001;  // more than 20 ms: 20 ms itself is too short

constexpr int kNear = 0;
constexpr int kFar = 5;

constexpr size_t kVoiceNotification = 7;  // its kind, and the element that has the voice mode
constexpr int kCameraNotification = 10;
constexpr size_t kCameraElement = 11;

constexpr char kChatApp[] = "com.tencent.mm";
constexpr char kDisplayController[] = "com.android.server.display.DisplayPowerController";
constexpr char kCountProperty[] = "persist.zuno.wechat.count.info";
constexpr char kEventId[] = "N273|10013";

}  // namespace

class SENSOR_PRIV_HIDDEN WechatProxException::WechatProxExceptionHandler : public MessageHandler {
public:
    void handleMessage(const Message& message) override {
        switch (message.what) {
            case MSG_LOAD:
                getInstance()->initialize();
                break;
            case MSG_CHECK:
                getInstance()->checkProxLock();
                break;
            case MSG_SAVE:
                getInstance()->updatePropertyValue();
                break;
            case MSG_REPORT:
                getInstance()->putWechatTally();
                break;
        }
    }
};

Mutex WechatProxException::sLock;
WechatProxException* WechatProxException::mWechatProxException = nullptr;

WechatProxException* WechatProxException::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mWechatProxException == nullptr) mWechatProxException = new WechatProxException;
    return mWechatProxException;
}

WechatProxException::WechatProxException() : mHandler(new WechatProxExceptionHandler) {
    SensorHandlerThread::getInstance()->sendMessageDelayed(mHandler, MSG_LOAD, kLoadDelayMs);
}

WechatProxException::~WechatProxException() = default;

void WechatProxException::enableSuccess(bool enabled, int type, const std::string& pkg,
                                        const std::string& opPkg) {
    const bool isChatApp = nameHolds(opPkg, kChatApp);
    // Clears the readings, but not their count.
    if (type == SENSOR_TYPE_ACCELEROMETER && enabled && isChatApp) mAccSamples.fill({});
    if (type != SENSOR_TYPE_PROXIMITY) return;
    handleProxWakeLock(pkg, enabled);
    if (!isChatApp) return;

    if (enabled) {
        mNearSeen = false;
        mVarianceReported = false;
        mLastProxValue = -1;
        mWechatProxEnabled = true;
        return;
    }
    // Not tested for an open session: a second disable counts the last session again.
    mAccCount = 0;
    mWechatProxEnabled = false;
    if (mNearSeen) mTotalCount = addWrapped(mTotalCount, 1);
    if (mVarianceReported) mInvalidCount = addWrapped(mInvalidCount, 1);
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    thread->removeMessage(mHandler, MSG_SAVE);
    thread->sendMessage(mHandler, MSG_SAVE);
}

void WechatProxException::handleProxWakeLock(const std::string& pkg, bool enabled) {
    if (!nameHolds(pkg, kDisplayController)) return;
    mDisplayProxEnabled = enabled;
    if (mWechatProxEnabled && enabled && isVoiceCall()) mLockCount = addWrapped(mLockCount, 1);
}

// The host calls this for every event that it dispatches, so the flag is read without a lock.
void WechatProxException::process(const sensors_event_t& event) {
    if (!mWechatProxEnabled) return;
    if (event.type == SENSOR_TYPE_ACCELEROMETER) {
        getAccData(event);
    } else if (event.type == SENSOR_TYPE_PROXIMITY) {
        processProxEvent(event);
    }
}

void WechatProxException::setNotification(const Vector<int>& notification) {
    if (notification.isEmpty()) return;
    const int kind = notification[0];
    if (kind == kCameraNotification && notification.size() > kCameraElement) {
        setCameraState(notification[kCameraElement]);
    } else if (kind == kVoiceNotification && notification.size() > kVoiceNotification) {
        setVoiceMode(notification[kVoiceNotification]);
    }
}

void WechatProxException::setVoiceMode(int mode) {
    mVoiceMode = mode;
}

void WechatProxException::setCameraState(int state) {
    mCameraState = state;
}

bool WechatProxException::isHandSetOrSpeaker() {
    return mVoiceMode == 1 || mVoiceMode == 2;
}

void WechatProxException::notifyDayNight() {
    SensorHandlerThread::getInstance()->sendMessage(mHandler, MSG_REPORT);
}

void WechatProxException::resetWechatCount() {
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    thread->removeMessage(mHandler, MSG_SAVE);
    // These act at once. A report that is still posted finds no session and sends nothing.
    mTotalCount = 0;
    mInvalidCount = 0;
    mLockCount = 0;
    mNearCount = 0;
    thread->sendMessage(mHandler, MSG_SAVE);
}

void WechatProxException::getAccData(const sensors_event_t& event) {
    // Keeps the readings from before the near period.
    if (mLastProxValue == kNear) return;
    if (systemTime(SYSTEM_TIME_MONOTONIC) - mLastAccTime < kMinSampleSpanNs) return;
    std::copy_backward(mAccSamples.begin(), mAccSamples.end() - 1, mAccSamples.end());
    mAccSamples[0] = {event.data[0], event.data[1], event.data[2]};
    mAccCount = addWrapped(mAccCount, 1);  // beyond 20 too; `checkProxLock` limits it
    mLastAccTime = systemTime(SYSTEM_TIME_MONOTONIC);
}

void WechatProxException::processProxEvent(const sensors_event_t& event) {
    const int value = truncateToInt32(event.data[0]);
    if (value == mLastProxValue) return;
    mLastProxValue = value;
    if (value == kFar) {
        mAccCount = 0;
        return;  // the pending check stays: it ends the near period
    }
    if (value == kNear && isVoiceCall()) {
        mNearSeen = true;
        mNearCount = addWrapped(mNearCount, 1);
    }
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    thread->removeMessage(mHandler, MSG_CHECK);
    thread->sendMessageDelayed(mHandler, MSG_CHECK, kCheckDelayMs);
    mCheckCount = 1;
}

void WechatProxException::initialize() {
    char text[PROP_VALUE_MAX] = "0";
    property_get(kCountProperty, text, "0");
    std::vector<std::string> pieces;
    TallyCommon::getInstance()->splitStr(text, "_", pieces);
    int* const counters[] = {&mTotalCount, &mInvalidCount, &mLockCount, &mNearCount};
    if (pieces.size() < std::size(counters)) return;  // further pieces are ignored
    for (size_t i = 0; i < std::size(counters); ++i) {
        int32_t count = 0;
        parseInt32(pieces[i].c_str(), &count);
        *counters[i] = count;
    }
}

void WechatProxException::checkProxLock() {
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    // Before the second check there is no spread to report.
    if (mCheckCount >= 2 && mLastProxValue == kFar) {
        recordAccVariance();
    } else if (mLastProxValue == kNear && mWechatProxEnabled && isVoiceCall() &&
               !mDisplayProxEnabled && !mVarianceReported) {
        float sx = 0;
        float sy = 0;
        float sz = 0;
        const int kept = static_cast<int>(mAccSamples.size());
        mVarianceText = getVariance(0, std::min(mAccCount, kept), sx, sy, sz);
        if (mCheckCount == kLastCheck) {
            recordAccVariance();
            return;
        }
        // Nothing to remove first: the pending check is the one that runs.
        thread->sendMessageDelayed(mHandler, MSG_CHECK, kCheckDelayMs);
        ++mCheckCount;
    }
    if (mLastProxValue == kFar) {
        mCheckCount = 0;
        thread->removeMessage(mHandler, MSG_CHECK);
    }
}

void WechatProxException::updatePropertyValue() {
    const std::string text = std::to_string(mTotalCount) + "_" + std::to_string(mInvalidCount) +
                             "_" + std::to_string(mLockCount) + "_" + std::to_string(mNearCount);
    property_set(kCountProperty, text.c_str());
}

void WechatProxException::putWechatTally() {
    if (mTotalCount == 0) return;
    TallyCommon* tally = TallyCommon::getInstance();
    Json::Value status;
    status["lock"] = tally->intToStr(mLockCount);
    status["near"] = tally->intToStr(mNearCount);
    tally->trackEvent(kEventId, {{"total", tally->intToStr(mTotalCount)},
                                 {"invalid", tally->intToStr(mInvalidCount)},
                                 {"status", styledOnOneLine(status)}});
}

void WechatProxException::recordAccVariance() {
    mCheckCount = 0;
    mVarianceReported = true;
    TallyCommon::getInstance()->trackEvent(kEventId, {{"variance", mVarianceText}});
}

std::string WechatProxException::getVariance(int from, int to, float& sx, float& sy, float& sz) {
    const auto count = static_cast<float>(int64_t{to} - from);
    const int kept = static_cast<int>(mAccSamples.size());
    const int begin = std::clamp(from, 0, kept);
    const int end = std::clamp(to, 0, kept);

    const auto spread = [&](size_t axis) {
        float mean = 0;
        // In the order of the readings and in `float`, as any other way rounds differently.
        for (int i = begin; i < end; ++i) mean += mAccSamples[i][axis];
        if (count != 0) mean /= count;
        float sum = 0;
        for (int i = begin; i < end; ++i) {
            const float deviation = mAccSamples[i][axis] - mean;
            sum += deviation * deviation;
        }
        if (count != 0) sum = std::sqrt(sum / count);
        // Processors differ in the sign of the NaN that they make, and it would be printed.
        return std::isnan(sum) ? std::numeric_limits<float>::quiet_NaN() : sum;
    };
    sx = spread(0);
    sy = spread(1);
    sz = spread(2);
    return std::to_string(sx) + "/" + std::to_string(sy) + "/" + std::to_string(sz);
}

bool WechatProxException::isVoiceCall() {
    return isHandSetOrSpeaker() && mCameraState != 1;
}

}  // namespace android
