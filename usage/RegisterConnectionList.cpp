#include "usage/RegisterConnectionList.h"

#include <vector>

#include <json/json.h>
#include <utils/Timers.h>

#include "core/Arithmetic.h"
#include "core/Connection.h"
#include "usage/RankedList.h"

namespace android {

namespace {

constexpr int64_t kNoRate = -1;
constexpr int kDisplayOn = 2;

}  // namespace

RegisterConnectionList::RegisterConnectionList() : mCurrentRate(kNoRate), mDisplayState(-1) {}

RegisterConnectionList::~RegisterConnectionList() = default;

void RegisterConnectionList::update(const std::string& pkg, const std::string& opPkg, bool enable,
                                    long long rate) {
    if (enable) {
        handleEnable(pkg, opPkg, rate);
    } else {
        handleDisable(pkg, opPkg);
    }
}

void RegisterConnectionList::handleEnable(const std::string& pkg, const std::string& opPkg,
                                          long long rate) {
    const nsecs_t now = systemTime(SYSTEM_TIME_MONOTONIC);
    Mutex::Autolock lock(mLock);

    // Of those at the current rate, the first in the table earns the time. The others restart
    // without credit: the report tells who keeps the sensor fast, not who holds it.
    bool credited = false;
    for (auto& [key, info] : mConnections) {
        if (info.beginTime == 0) continue;
        if (!credited && info.rate == mCurrentRate) {
            addSeconds(&info.time, info.beginTime, now);
            if (isDisplayOn() && info.onBeginTime != 0) {
                addSeconds(&info.ontime, info.onBeginTime, now);
            }
            credited = true;
        }
        info.beginTime = now;
        if (isDisplayOn()) info.onBeginTime = now;
    }

    if (mCurrentRate == kNoRate || rate < mCurrentRate) mCurrentRate = rate;

    // A known connection keeps its first rate.
    const auto [it, inserted] = mConnections.try_emplace(connectionKey(pkg, opPkg));
    PkgRegInfo& info = it->second;
    if (inserted) info.rate = rate;
    info.beginTime = now;
    if (isDisplayOn()) info.onBeginTime = now;
    nestEnable(&info.enableCount);
}

void RegisterConnectionList::handleDisable(const std::string& pkg, const std::string& opPkg) {
    const nsecs_t now = systemTime(SYSTEM_TIME_MONOTONIC);
    Mutex::Autolock lock(mLock);

    const auto it = mConnections.find(connectionKey(pkg, opPkg));
    if (it == mConnections.end()) return;
    PkgRegInfo& ended = it->second;
    if (!unnestEnable(&ended.enableCount)) return;

    // A connection that did not set the rate earns nothing.
    if (ended.rate != mCurrentRate) {
        ended.beginTime = 0;
        ended.onBeginTime = 0;
        return;
    }
    addSeconds(&ended.time, ended.beginTime, now);
    ended.beginTime = 0;
    // [sic] Not tested for 0, unlike in `handleEnable`.
    if (isDisplayOn()) addSeconds(&ended.ontime, ended.onBeginTime, now);
    ended.onBeginTime = 0;

    mCurrentRate = kNoRate;
    for (auto& [key, info] : mConnections) {
        if (info.beginTime == 0) continue;
        if (mCurrentRate == kNoRate || info.rate < mCurrentRate) mCurrentRate = info.rate;
        info.beginTime = now;
        if (isDisplayOn()) info.onBeginTime = now;
    }
}

void RegisterConnectionList::setDisplayState(int state) {
    // Compared and stored before the lock, so that the same state again costs nothing.
    if (state == mDisplayState) return;
    mDisplayState = state;
    handleDisplayStateChanged();
}

void RegisterConnectionList::handleDisplayStateChanged() {
    const nsecs_t now = systemTime(SYSTEM_TIME_MONOTONIC);
    Mutex::Autolock lock(mLock);

    if (isDisplayOn()) {
        for (auto& [key, info] : mConnections) {
            if (info.beginTime != 0) info.onBeginTime = now;
        }
        return;
    }
    bool credited = false;
    for (auto& [key, info] : mConnections) {
        if (!credited && info.rate == mCurrentRate && info.beginTime != 0 &&
            info.onBeginTime != 0) {
            addSeconds(&info.ontime, info.onBeginTime, now);
            credited = true;
        }
        info.onBeginTime = 0;
    }
}

std::string RegisterConnectionList::getRegisterConnectionInfo() {
    std::vector<std::pair<std::string, PkgRegInfo>> ended;
    {
        Mutex::Autolock lock(mLock);
        ended = takeOut(&mConnections, [](const PkgRegInfo& info) {
            // Without credited time they stay until `clear`.
            return info.beginTime == 0 && info.time != 0;
        });
    }
    return rankedList(std::move(ended), comp, [](const PkgRegInfo& info, Json::Value* entry) {
        (*entry)["rate"] = std::to_string(static_cast<int32_t>(info.rate));  // the low 32 bits
        (*entry)["time"] = std::to_string(info.time);
        (*entry)["ontime"] = std::to_string(info.ontime);
    });
}

bool RegisterConnectionList::comp(const std::pair<std::string, PkgRegInfo>& a,
                                  const std::pair<std::string, PkgRegInfo>& b) {
    return a.second.time > b.second.time;
}

void RegisterConnectionList::clear() {
    Mutex::Autolock lock(mLock);
    // The current rate stays. If nobody has it any more, nobody is credited until an enable brings
    // a smaller one.
    mConnections.clear();
}

bool RegisterConnectionList::isDisplayOn() const {
    return mDisplayState == kDisplayOn;
}

}  // namespace android
