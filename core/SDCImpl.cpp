#include "core/SDCImpl.h"

#include "exception/FlowingDataException.h"
#include "exception/UltraException.h"
#include "exception/WechatProxException.h"
#include "rgb/RgbShot.h"
#include "usage/MagneticUseIf.h"
#include "usage/RegisterInfo.h"

namespace android {

namespace {

/** Which statistics follow a sensor's connections. */
enum class Route { NONE, REGISTRATION, ORIENTATION, PROXIMITY };

constexpr struct {
    int sensorType;
    Route route;
} kRouteTable[] = {
        {SENSOR_TYPE_ACCELEROMETER, Route::REGISTRATION},
        {SENSOR_TYPE_ACCELEROMETER_UNCALIBRATED, Route::REGISTRATION},
        {SENSOR_TYPE_GYROSCOPE, Route::REGISTRATION},
        {SENSOR_TYPE_GYROSCOPE_UNCALIBRATED, Route::REGISTRATION},
        {SENSOR_TYPE_ORIENTATION, Route::ORIENTATION},
        {SENSOR_TYPE_ROTATION_VECTOR, Route::ORIENTATION},
        {SENSOR_TYPE_PROXIMITY, Route::PROXIMITY},
};

Route routeOf(int sensorType) {
    for (const auto& entry : kRouteTable) {
        if (entry.sensorType == sensorType) return entry.route;
    }
    return Route::NONE;
}

// Hours of the day at which the host's hourly calls act.
constexpr int kMorningHour = 7;    // screen samples, ultrasonic proximity
constexpr int kExceptionHour = 8;  // sensor exceptions
constexpr int kNightHour = 23;     // usage, registrations, chat calls

}  // namespace

Mutex SDCImpl::sLock;
SDCImpl* SDCImpl::mSDC = nullptr;

SDCImpl* SDCImpl::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mSDC == nullptr) mSDC = new SDCImpl;
    return mSDC;
}

// The order of creation is fixed. Modules post their first messages in it, and messages that are
// due together run in it.
SDCImpl::SDCImpl()
      : mRgbShot(RgbShot::getInstance()),
        mFlowingDataException(FlowingDataException::getInstance()),
        mWechatProxException(WechatProxException::getInstance()),
        mMagneticUseIf(MagneticUseIf::getInstance()),
        mRegisterInfo(RegisterInfo::getInstance()) {}

void SDCImpl::enableSuccess(bool enabled, int type, const std::string& pkg,
                            const std::string& opPkg, long long rate) {
    if (enabled) {
        handleEnable(type, pkg, opPkg, rate);
    } else {
        handleDisable(type, pkg, opPkg);
    }
    mWechatProxException->enableSuccess(enabled, type, pkg, opPkg);
}

void SDCImpl::handleEnable(int type, std::string pkg, std::string opPkg, long long rate) {
    switch (routeOf(type)) {
        case Route::REGISTRATION:
            mRegisterInfo->handleEnable(type, pkg, opPkg, rate);
            break;
        case Route::ORIENTATION:
            mMagneticUseIf->setOrientationEnable(pkg, opPkg);
            break;
        case Route::PROXIMITY:
            mFlowingDataException->setProxEnable(pkg, opPkg);
            break;
        case Route::NONE:
            break;
    }
}

void SDCImpl::handleDisable(int type, std::string pkg, std::string opPkg) {
    switch (routeOf(type)) {
        case Route::REGISTRATION:
            mRegisterInfo->handleDisable(type, pkg, opPkg);
            break;
        case Route::ORIENTATION:
            mMagneticUseIf->setOrientationDisable(pkg, opPkg);
            break;
        case Route::PROXIMITY:
            mFlowingDataException->setProxDisable(pkg, opPkg);
            break;
        case Route::NONE:
            break;
    }
}

void SDCImpl::cleanupConnection(const String8& pkg, const String8& opPkg, int type) {
    // [sic] The test guards the first use only. A `String8` is never null, so both uses are safe.
    if (pkg.c_str() != nullptr) handleCleanupConnection(type, pkg.c_str(), opPkg.c_str());
    mWechatProxException->enableSuccess(false, type, pkg.c_str(), opPkg.c_str());
}

void SDCImpl::handleCleanupConnection(int type, std::string pkg, std::string opPkg) {
    handleDisable(type, pkg, opPkg);
}

// The host dispatches every event through here, so nothing else belongs here.
void SDCImpl::process(const sensors_event_t& event) {
    mWechatProxException->process(event);
}

void SDCImpl::setNotification(const Vector<int>& notification) {
    // Both see every notification. Each takes the kinds that it knows.
    mWechatProxException->setNotification(notification);
    mRegisterInfo->setNotification(notification);
}

void SDCImpl::sendChargeState(int state) {
    mMagneticUseIf->sendChargeState(state);
}

void SDCImpl::sendBootShutdownRebootState(int state) {
    mMagneticUseIf->sendBootShutdownRebootState(state);
}

void SDCImpl::sendUsedTime(int uds) {
    mMagneticUseIf->sendUsedTime(uds);
}

void SDCImpl::setRgbShotCount() {
    mRgbShot->setRgbShotCount();
}

void SDCImpl::notifySdcClock(int hour) {
    if (hour == kExceptionHour) {
        mFlowingDataException->putDetectTally();
    } else if (hour == kNightHour) {
        mMagneticUseIf->notifyDayNight();
        mWechatProxException->notifyDayNight();
        mRegisterInfo->notifyDayNight();
    }
}

void SDCImpl::notifySdcReset(int hour) {
    if (hour == kExceptionHour) {
        mFlowingDataException->notifyFlowReset();
    } else if (hour == kNightHour) {
        // These resets act at once. A report of this hour that is still posted sees their effect.
        mMagneticUseIf->notifyMagReset();
        mWechatProxException->resetWechatCount();
        mRegisterInfo->notifyRegisterInfoReset();
    }
}

void SDCImpl::putRgbShotTally(int hour) {
    if (hour == kMorningHour) mRgbShot->putRgbShotTally();
}

void SDCImpl::notifyRgbShotReset(int hour) {
    if (hour == kMorningHour) mRgbShot->notifyRgbShotReset();
}

// `UltraException` is no member, so that its first use creates it.
void SDCImpl::putPhoneOpenUltraTally(int hour) {
    if (hour == kMorningHour) UltraException::getInstance()->putPhoneOpenUltraTally();
}

void SDCImpl::notifyUltraReset(int hour) {
    if (hour == kMorningHour) UltraException::getInstance()->notifyUltraReset();
}

}  // namespace android
