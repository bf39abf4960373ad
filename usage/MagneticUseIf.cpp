#include "usage/MagneticUseIf.h"

#include <map>
#include <vector>

#include <json/json.h>
#include <utils/Timers.h>

#include "core/Arithmetic.h"
#include "core/Connection.h"
#include "core/CounterProperty.h"
#include "core/Log.h"
#include "core/ParseInt32.h"
#include "core/SensorHandlerThread.h"
#include "core/TallyCommon.h"
#include "usage/RankedList.h"

namespace android {

namespace {

enum : int { MSG_LOAD = 1, MSG_SAVE = 2, MSG_REPORT = 3 };

constexpr int kBooted = 1;

enum : int { FAST_CHARGE = 1, USB_CHARGE = 2, OTHER_CHARGE = 3 };
constexpr int kTotalTimeBucket = 5;

constexpr char kEventId[] = "N273|10012";

}  // namespace

class SENSOR_PRIV_HIDDEN MagneticUseIf::MagneticUseIfHandler : public MessageHandler {
public:
    void handleMessage(const Message& message) override {
        switch (message.what) {
            case MSG_LOAD:
                getInstance()->getPersistStatistics();
                break;
            case MSG_SAVE:
                getInstance()->setPersistStatistics();
                break;
            case MSG_REPORT:
                getInstance()->recordPkgInfoTally();
                break;
        }
    }
};

// In the order of loading and storing. The first five are the buckets 1 to 5.
const MagneticUseIf::Total MagneticUseIf::kTotals[] = {
        {"persist.sys.fc_oriut", "fastChargeTime", &MagneticUseIf::mZunoFastChargeUT},
        {"persist.sys.uc_oriut", "usbChargeTime", &MagneticUseIf::mUsbChargeUT},
        {"persist.sys.oc_oriut", "otherChargeTime", &MagneticUseIf::mOtherChargeUT},
        {"persist.sys.sc_oriut", "shockAndChargeTime", &MagneticUseIf::mShockAndChargeUT},
        {"persist.sys.total_oriut", "totalTime", &MagneticUseIf::mTotalOrientationUT},
        {"persist.sys.ds_oriut", "days", &MagneticUseIf::mTotalD},
};

Mutex MagneticUseIf::sLock;
MagneticUseIf* MagneticUseIf::mMagneticUseIf = nullptr;

MagneticUseIf* MagneticUseIf::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mMagneticUseIf == nullptr) mMagneticUseIf = new MagneticUseIf;
    return mMagneticUseIf;
}

// [sic] "unknow" stands for no package in reports.
MagneticUseIf::MagneticUseIf() : mLastPkg("unknow"), mHandler(new MagneticUseIfHandler) {}

void MagneticUseIf::sendChargeState(int state) {
    if (mLogSwitch != 0) {
        SENSOR_PRIV_LOGD("currentPCState = %d ,mLastPCState = %d ", state, mLastPCState);
    }
    mCurrentPCState = state;
    if (state != mLastPCState) {
        const bool charging = state >= FAST_CHARGE && state <= OTHER_CHARGE;
        // Stays when charging ends: a span that closes then belongs to this kind.
        if (charging) mChargeType = state;
        mLastPCState = state;
        mIsChargeState = charging;
    }
    // A repeated state comes here too, and restarts or books charge spans again.
    dealWithChargeForPkgInfo();
    dealWithChargeAndOrientationEnableState();
}

void MagneticUseIf::sendBootShutdownRebootState(int state) {
    if (mLogSwitch != 0) SENSOR_PRIV_LOGD("boot state = %d", state);
    if (state == kBooted) {
        mBooted = true;
    } else if (!mBooted) {
        return;  // totals that were never loaded must not replace the stored ones
    }
    const int code = state == kBooted ? MSG_LOAD : MSG_SAVE;
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    thread->removeMessage(mHandler, code);
    thread->sendMessage(mHandler, code);
}

void MagneticUseIf::sendUsedTime(int uds) {
    if (mLogSwitch != 0) SENSOR_PRIV_LOGD("uds = %d", uds);
    mUD = uds;
    if (uds > mLastUD) {
        mTotalD = addWrapped(mTotalD, int64_t{uds} - mLastUD);
        mLastUD = uds;
    }
}

void MagneticUseIf::setOrientationEnable(std::string pkg, std::string opPkg) {
    mEnableNumbers = addWrapped(mEnableNumbers, 1);
    if (mLogSwitch != 0) SENSOR_PRIV_LOGD("Enable mEnableNumbers = %d", mEnableNumbers);
    dealWithOrientationEnableDisable(std::move(pkg), std::move(opPkg), true);
    dealWithChargeAndOrientationEnableState();
    dealWithOrientationTotalTime();
}

void MagneticUseIf::setOrientationDisable(std::string pkg, std::string opPkg) {
    if (mEnableNumbers == 1 && !pkg.empty()) mLastPkg.set(pkg);
    // Not limited to 0; see `dealWithOrientationTotalTime`.
    mEnableNumbers = addWrapped(mEnableNumbers, -1);
    if (mLogSwitch != 0) SENSOR_PRIV_LOGD("Disable mEnableNumbers = %d", mEnableNumbers);
    dealWithOrientationEnableDisable(std::move(pkg), std::move(opPkg), false);
    dealWithChargeAndOrientationEnableState();
    dealWithOrientationTotalTime();
}

void MagneticUseIf::notifyDayNight() {
    SensorHandlerThread::getInstance()->sendMessage(mHandler, MSG_REPORT);
}

void MagneticUseIf::notifyMagReset() {
    Mutex::Autolock lock(mPkgLock);
    mPkgInfoMap.clear();
}

void MagneticUseIf::calCurretUseTotalTime(std::string pkg, long seconds, int bucket) {
    if (bucket < FAST_CHARGE || bucket > kTotalTimeBucket) return;
    int32_t& total = this->*kTotals[bucket - 1].value;
    total = addWrapped(total, seconds);
    if (bucket == kTotalTimeBucket) calCurretTime(std::move(pkg));
}

void MagneticUseIf::dealWithChargeForPkgInfo() {
    const nsecs_t now = systemTime(SYSTEM_TIME_MONOTONIC);
    Mutex::Autolock lock(mPkgLock);
    for (auto it = mPkgInfoMap.begin(); it != mPkgInfoMap.end(); ++it) {
        if (it->second.beginTime == 0) continue;
        if (mIsChargeState) {
            it->second.chargeBeginTime = now;
        } else {
            // The begin stays, even if it is old or 0, so the same state books again.
            updateChargeTime(it, now);
        }
    }
}

void MagneticUseIf::dealWithChargeAndOrientationEnableState() {
    if (mLogSwitch != 0) {
        SENSOR_PRIV_LOGD("mIsChargeState=%d, mEnableNumbers=%d, mBeginCountTime=%d", mIsChargeState,
                         mEnableNumbers, mBeginCountTime);
    }
    const bool counts = mIsChargeState && mEnableNumbers > 0;
    // An open span stays open when the kind of charging changes.
    if (counts && !mBeginCountTime) {
        mBeginTime = systemTime(SYSTEM_TIME_MONOTONIC);
        mBeginCountTime = true;
    } else if (!counts && mBeginCountTime) {
        recordTime();
        mBeginTime = 0;
        mBeginCountTime = false;
    }
}

void MagneticUseIf::dealWithOrientationEnableDisable(std::string pkg, std::string opPkg,
                                                     bool enable) {
    const nsecs_t now = systemTime(SYSTEM_TIME_MONOTONIC);
    const std::string key = connectionKey(pkg, opPkg);
    Mutex::Autolock lock(mPkgLock);
    if (enable) {
        const auto it = mPkgInfoMap.try_emplace(key).first;
        PkgInfo& info = it->second;
        if (info.beginTime != 0) {
            if (mIsChargeState) updateChargeTime(it, now);
            addSeconds(&info.totalTime, info.beginTime, now);
        }
        info.beginTime = now;
        // Otherwise the begin stays as it was, old or 0.
        if (mIsChargeState) info.chargeBeginTime = now;
        nestEnable(&info.enableCount);
    } else {
        const auto it = mPkgInfoMap.find(key);
        if (it == mPkgInfoMap.end() || it->second.beginTime == 0) return;
        PkgInfo& info = it->second;
        if (!unnestEnable(&info.enableCount)) return;
        if (mIsChargeState) {
            updateChargeTime(it, now);
            info.chargeBeginTime = now;
        }
        addSeconds(&info.totalTime, info.beginTime, now);
        info.beginTime = 0;
    }
}

void MagneticUseIf::dealWithOrientationTotalTime() {
    if (mLogSwitch != 0) {
        SENSOR_PRIV_LOGD(
                "dealWithOrientationTotalTime mEnableNumbers = %d, "
                "mTotalBeginCountTime = %d",
                mEnableNumbers, mTotalBeginCountTime);
    }
    if (mEnableNumbers >= 1) {
        if (!mTotalBeginCountTime) {
            mTotalBeginTime = systemTime(SYSTEM_TIME_MONOTONIC);
            mTotalBeginCountTime = true;
        }
    } else if (mTotalBeginCountTime) {
        mTotalEndTime = systemTime(SYSTEM_TIME_MONOTONIC);
        // A span below 1 s adds 0, but may bring the day's report.
        const int64_t seconds = secondsBetween(mTotalBeginTime, mTotalEndTime);
        mTotalOrientationUT = addWrapped(mTotalOrientationUT, seconds);
        calCurretTime(mLastPkg.get());
        if (mLogSwitch != 0) SENSOR_PRIV_LOGD("oritt == %d", static_cast<int32_t>(seconds));
        // The only place that lifts a count below 0. Without an open span it stays below.
        if (mEnableNumbers < 0) mEnableNumbers = 0;
        mTotalBeginTime = 0;
        mTotalEndTime = 0;
        mTotalBeginCountTime = false;
    }
}

void MagneticUseIf::recordTime() {
    mEndTime = systemTime(SYSTEM_TIME_MONOTONIC);
    const int64_t seconds = secondsBetween(mBeginTime, mEndTime);
    // Shorter spans are dropped here, unlike in the table of connections.
    if (seconds >= 1) {
        calCurretUseTotalTime(mLastPkg.get(), static_cast<long>(seconds), mChargeType);
        if (mLogSwitch != 0) {
            SENSOR_PRIV_LOGD("tt = %d, type = %d", static_cast<int32_t>(seconds), mChargeType);
        }
    }
    mEndTime = 0;
}

void MagneticUseIf::calCurretTime(std::string pkg) {
    if (mLogSwitch != 0) {
        SENSOR_PRIV_LOGD("mUD=%d, mLastUD=%d, mLastRUD=%d", mUD, mLastUD, mLastRUD);
    }
    // After a restart `mLastRUD` is 0, so the first span that closes reports again.
    if (mUD <= mLastRUD) return;
    mLastRUD = mUD;
    // Takes days off again if the counter went back.
    mTotalD = addWrapped(mTotalD, int64_t{mUD} - mLastUD);
    mLastUD = mUD;
    setOrientationTally(std::move(pkg));
}

void MagneticUseIf::setOrientationTally(std::string pkg) {
    TallyCommon* tally = TallyCommon::getInstance();
    std::map<std::string, std::string> params{{"pkg", std::move(pkg)}};
    for (const Total& total : kTotals) params[total.key] = tally->longToStr(this->*total.value);
    tally->trackEvent(kEventId, std::move(params));
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    thread->removeMessage(mHandler, MSG_SAVE);
    thread->sendMessage(mHandler, MSG_SAVE);
}

void MagneticUseIf::getPersistStatistics() {
    for (const Total& total : kTotals) {
        // An unset total becomes 0. Text that is no number leaves it as it was.
        property_get(total.property, mPropValue, "0");
        parseInt32(mPropValue, &(this->*total.value));
    }
    if (mLogSwitch != 0) logTotals("get");
}

void MagneticUseIf::setPersistStatistics() {
    if (mLogSwitch != 0) logTotals("set");
    for (const Total& total : kTotals) CounterProperty(total.property).store(this->*total.value);
}

void MagneticUseIf::recordPkgInfoTally() {
    std::vector<std::pair<std::string, PkgInfo>> ended;
    {
        Mutex::Autolock lock(mPkgLock);
        // Enabled connections stay for a later day's report.
        ended = takeOut(&mPkgInfoMap, [](const PkgInfo& info) { return info.beginTime == 0; });
    }
    TallyCommon* tally = TallyCommon::getInstance();
    const std::string text =
            rankedList(std::move(ended), comp, [tally](const PkgInfo& info, Json::Value* entry) {
                (*entry)["fastChargeTime"] = tally->longToStr(info.fastChargeTime);
                (*entry)["usbChargeTime"] = tally->longToStr(info.usbChargeTime);
                (*entry)["otherChargeTime"] = tally->longToStr(info.otherChargeTime);
                (*entry)["totalTime"] = tally->longToStr(info.totalTime);
            });
    if (!text.empty()) tally->trackEvent(kEventId, {{"info", text}});
}

void MagneticUseIf::updateChargeTime(std::unordered_map<std::string, PkgInfo>::iterator it,
                                     long long now) {
    PkgInfo& info = it->second;
    switch (mChargeType) {
        case FAST_CHARGE:
            addSeconds(&info.fastChargeTime, info.chargeBeginTime, now);
            break;
        case USB_CHARGE:
            addSeconds(&info.usbChargeTime, info.chargeBeginTime, now);
            break;
        case OTHER_CHARGE:
            addSeconds(&info.otherChargeTime, info.chargeBeginTime, now);
            break;
    }
}

bool MagneticUseIf::comp(const std::pair<std::string, PkgInfo>& a,
                         const std::pair<std::string, PkgInfo>& b) {
    return a.second.totalTime > b.second.totalTime;
}

std::string MagneticUseIf::convertLongToString(long value) {
    return TallyCommon::getInstance()->longToStr(value);
}

std::string MagneticUseIf::convertIntToString(int value) {
    return TallyCommon::getInstance()->longToStr(value);  // [sic] gives the same text
}

void MagneticUseIf::logTotals(const char* verb) const {
    SENSOR_PRIV_LOGD(
            "%s mZunoFastChargeUT=%d, mUsbChargeUT=%d, mOtherChargeUT=%d, "
            "mShockAndChargeUT=%d, mTotalOrientationUT=%d, mTotalD=%d",
            verb, mZunoFastChargeUT, mUsbChargeUT, mOtherChargeUT, mShockAndChargeUT,
            mTotalOrientationUT, mTotalD);
}

}  // namespace android
