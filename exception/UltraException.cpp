#include "exception/UltraException.h"

#include <utility>

#include <cutils/properties.h>
#include <strings.h>
#include <utils/SystemClock.h>

#include "core/Arithmetic.h"
#include "core/Connection.h"
#include "core/CounterProperty.h"
#include "core/Log.h"
#include "core/SensorHandlerThread.h"
#include "core/TallyCommon.h"

namespace android {

namespace {

enum : int {
    MSG_LOAD = 1,
    MSG_RX_CLOSED = 2,
    MSG_ENABLED = 3,
    MSG_DEVICE_INVALID = 4,
    MSG_ROUTE_INVALID = 5,
    MSG_PHONE_STATE = 6,
    MSG_RESET = 7,
};

/** Codes of "ultraExpired". */
enum : int { ROUTE_INVALID = 100, DEVICE_INVALID = 101, RX_CLOSED = 102, DAILY = 103 };

/** Where a sensor event that tells an energy has what. */
enum : int { DATA_MARKER = 3, DATA_ENERGY = 4, BACKGROUND_MARKER = 301, FLUCTUANT_MARKER = 302 };

constexpr int kLoadDelayMs = 2000;
constexpr char kEventId[] = "N273|10011";
constexpr char kUnknownPackage[] = "unknown";
constexpr char kInCallPackage[] = "com.android.incallui";

constexpr CounterProperty kEnableProperty("persist.zuno.ultra.enable.count");
constexpr CounterProperty kInvalidProperty("persist.zuno.ultra.invalid.count");
constexpr CounterProperty kPhoneEnableProperty("persist.zuno.ultra.phone.enable.count");
constexpr CounterProperty kDeviceInvalidProperty("persist.zuno.device.invalid.count");
constexpr CounterProperty kRouteInvalidProperty("persist.zuno.route.invalid.count");
constexpr CounterProperty kRxCloseProperty("persist.zuno.rx.close.count");

std::string joined(int32_t first, int32_t second) {
    return std::to_string(first) + "/" + std::to_string(second);
}

}  // namespace

class SENSOR_PRIV_HIDDEN UltraException::UltraExceptionHandler : public MessageHandler {
public:
    void handleMessage(const Message& message) override {
        switch (message.what) {
            case MSG_LOAD:
                getInstance()->initUltraSoundCount();
                break;
            case MSG_RX_CLOSED:
                getInstance()->recordRxClose();
                break;
            case MSG_ENABLED:
                getInstance()->increaseEnableUltrasoundCount();
                break;
            case MSG_DEVICE_INVALID:
                getInstance()->setUltraDeviceInvalid();
                break;
            case MSG_ROUTE_INVALID:
                getInstance()->setUltraRouteInvalid();
                break;
            case MSG_PHONE_STATE:
                getInstance()->updatePhoneOpenUltraCount();
                break;
            case MSG_RESET:
                getInstance()->resetPhoneOpenUltraCount();
                break;
        }
    }
};

Mutex UltraException::sLock;
UltraException* UltraException::mUltraException = nullptr;
// Decided while the library is loaded. A property that is set later changes nothing.
const bool UltraException::isOverseas = getOverseas();

UltraException* UltraException::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mUltraException == nullptr) mUltraException = new UltraException;
    return mUltraException;
}

UltraException::UltraException()
      : mHandler(new UltraExceptionHandler),
        mPackageName(kUnknownPackage) {
    if (isOverseas) return;
    SensorHandlerThread::getInstance()->sendMessageDelayed(mHandler, MSG_LOAD, kLoadDelayMs);
}

UltraException::~UltraException() = default;

bool UltraException::getOverseas() {
    char value[PROP_VALUE_MAX] = {};
    property_get("ro.zuno.product.overseas", value, "no");
    // Two letters decide, so "none" means no as well.
    return strncasecmp(value, "no", 2) != 0;
}

void UltraException::doAction(int code, const UltraExceptionInfo& info) {
    if (isOverseas) return;
    // These act at once. Actions that still wait for the worker see their effect.
    if (code == MSG_PHONE_STATE) {
        mPhoneState = info.phoneState;
    } else if (code == MSG_ENABLED) {
        mPackageName.set(info.packageName);
    }
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    thread->removeMessage(mHandler, code);
    thread->sendMessage(mHandler, code);
}

void UltraException::setUltraEnergy(const sensors_event_t& event) {
    if (isOverseas) return;
    const int32_t marker = truncateToInt32(event.data[DATA_MARKER]);
    const int32_t energy = truncateToInt32(event.data[DATA_ENERGY]);
    if (marker == BACKGROUND_MARKER) {
        mBackgroundEnergy = energy;
        if (mLogSwitch != 0) SENSOR_PRIV_LOGD("mBackgroundEnergy: %d", energy);
    } else if (marker == FLUCTUANT_MARKER) {
        mFluctuantEnergy = energy;
        if (mLogSwitch != 0) SENSOR_PRIV_LOGD("mFluctuantEnergy: %d", energy);
    }
}

void UltraException::resetUltraStatus() {
    mFluctuantEnergy = 0;
    mBackgroundEnergy = 0;
    mPackageName.set(kUnknownPackage);
}

void UltraException::putPhoneOpenUltraTally() {
    if (mPhoneEnableCount == 0) return;
    sendEvent(kEventId, DAILY, mInvalidCount, mPhoneEnableCount);
    // Posted, so that it follows the actions that still wait for the worker.
    notifyUltraReset();
}

void UltraException::notifyUltraReset() {
    SensorHandlerThread::getInstance()->sendMessage(mHandler, MSG_RESET);
}

void UltraException::initUltraSoundCount() {
    mLoadTime = elapsedRealtimeNano();
    mEnableCount = kEnableProperty.load();
    mInvalidCount = kInvalidProperty.load();
    mPhoneEnableCount = kPhoneEnableProperty.load();
    mDeviceInvalidCount = kDeviceInvalidProperty.load();
    mRouteInvalidCount = kRouteInvalidProperty.load();
    mRxCloseCount = kRxCloseProperty.load();
    // Written while `mLogSwitch` is 0 too.
    SENSOR_PRIV_LOGD("PF, enable:%d device:%d route:%d close:%d.", mEnableCount,
                     mDeviceInvalidCount, mRouteInvalidCount, mRxCloseCount);
}

void UltraException::increaseEnableUltrasoundCount() {
    if (mPhoneState != 0) mUltraOpenedInCall = true;
    if (mEnableCount <= kLastCounted) ++mEnableCount;
    // A full count has not risen, but is stored again.
    kEnableProperty.store(mEnableCount);
}

void UltraException::updateUltraInvalid() {
    if (mInvalidCount > kLastCounted) return;
    if (!nameHolds(mPackageName.get(), kInCallPackage)) return;
    if (mInvalidCountedInCall) return;
    mInvalidCountedInCall = true;
    ++mInvalidCount;
    kInvalidProperty.store(mInvalidCount);
}

void UltraException::recordRxClose() {
    countFailure(&mRxCloseCount, RX_CLOSED, kRxCloseProperty);
}

void UltraException::setUltraDeviceInvalid() {
    countFailure(&mDeviceInvalidCount, DEVICE_INVALID, kDeviceInvalidProperty);
}

void UltraException::setUltraRouteInvalid() {
    countFailure(&mRouteInvalidCount, ROUTE_INVALID, kRouteInvalidProperty);
}

void UltraException::countFailure(int32_t* count, int code, const CounterProperty& property) {
    updateUltraInvalid();
    if (*count > kLastCounted) return;
    ++*count;
    // The order is fixed: first the event, then the property.
    trackEvent(kEventId, code, *count);
    property.store(*count);
}

void UltraException::trackEvent(std::string eventId, int code, int count) {
    sendEvent(std::move(eventId), code, count, mEnableCount);
}

void UltraException::sendEvent(std::string eventId, int code, int32_t failures, int32_t uses) {
    // [sic] The key "TempInvalidRate" begins with a capital letter.
    TallyCommon::getInstance()->trackEvent(
            std::move(eventId), {{"pkg", mPackageName.get()},
                                 {"ultraExpired", std::to_string(code)},
                                 {"TempInvalidRate", joined(failures, uses)},
                                 {"ultraEnergy", joined(mBackgroundEnergy, mFluctuantEnergy)}});
}

void UltraException::updatePhoneOpenUltraCount() {
    if (mPhoneState != 0) {
        // Only the whole text "unknown" means that no app is known.
        if (mPackageName.get() != kUnknownPackage) mUltraOpenedInCall = true;
        return;
    }
    mInvalidCountedInCall = false;
    if (!mUltraOpenedInCall) return;
    mUltraOpenedInCall = false;
    // This count wraps, unlike the others, which stop.
    mPhoneEnableCount = addWrapped(mPhoneEnableCount, 1);
    kPhoneEnableProperty.store(mPhoneEnableCount);
}

void UltraException::resetPhoneOpenUltraCount() {
    mPhoneEnableCount = 0;
    kPhoneEnableProperty.store(0);
    mInvalidCount = 0;
    kInvalidProperty.store(0);
}

}  // namespace android
