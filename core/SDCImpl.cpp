#include "core/SDCImpl.h"

#include "exception/FlowingDataException.h"
#include "exception/UltraException.h"
#include "exception/WechatProxException.h"
#include "rgb/RgbShot.h"
#include "usage/MagneticUseIf.h"
#include "usage/RegisterInfo.h"

namespace android {

Mutex SDCImpl::sLock;
SDCImpl* SDCImpl::mSDC = nullptr;

SDCImpl* SDCImpl::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mSDC == nullptr) mSDC = new SDCImpl;
    return mSDC;
}

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
    switch (type) {
        case 1:
        case 4:
        case 16:
        case 35:
            mRegisterInfo->handleEnable(type, pkg, opPkg, rate);
            break;
        case 3:
        case 11:
            mMagneticUseIf->setOrientationEnable(pkg, opPkg);
            break;
        case 8:
            mFlowingDataException->setProxEnable(pkg, opPkg);
            break;
    }
}

void SDCImpl::handleDisable(int type, std::string pkg, std::string opPkg) {
    switch (type) {
        case 1:
        case 4:
        case 16:
        case 35:
            mRegisterInfo->handleDisable(type, pkg, opPkg);
            break;
        case 3:
        case 11:
            mMagneticUseIf->setOrientationDisable(pkg, opPkg);
            break;
        case 8:
            mFlowingDataException->setProxDisable(pkg, opPkg);
            break;
    }
}

void SDCImpl::cleanupConnection(const String8& pkg, const String8& opPkg, int type) {
    if (pkg.string() != nullptr) handleCleanupConnection(type, pkg.string(), opPkg.string());
    mWechatProxException->enableSuccess(false, type, pkg.string(), opPkg.string());
}

void SDCImpl::handleCleanupConnection(int type, std::string pkg, std::string opPkg) {
    handleDisable(type, pkg, opPkg);
}

void SDCImpl::process(const sensors_event_t& event) {
    mWechatProxException->process(event);
}

void SDCImpl::setNotification(const Vector<int>& notification) {
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
    if (hour == 8) {
        mFlowingDataException->putDetectTally();
    } else if (hour == 23) {
        mMagneticUseIf->notifyDayNight();
        mWechatProxException->notifyDayNight();
        mRegisterInfo->notifyDayNight();
    }
}

void SDCImpl::notifySdcReset(int hour) {
    if (hour == 8) {
        mFlowingDataException->notifyFlowReset();
    } else if (hour == 23) {
        mMagneticUseIf->notifyMagReset();
        mWechatProxException->resetWechatCount();
        mRegisterInfo->notifyRegisterInfoReset();
    }
}

void SDCImpl::putRgbShotTally(int hour) {
    if (hour == 7) mRgbShot->putRgbShotTally();
}

void SDCImpl::notifyRgbShotReset(int hour) {
    if (hour == 7) mRgbShot->notifyRgbShotReset();
}

void SDCImpl::putPhoneOpenUltraTally(int hour) {
    if (hour == 7) UltraException::getInstance()->putPhoneOpenUltraTally();
}

void SDCImpl::notifyUltraReset(int hour) {
    if (hour == 7) UltraException::getInstance()->notifyUltraReset();
}

}  // namespace android
