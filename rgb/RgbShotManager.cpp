#include "rgb/RgbShotManager.h"

#include <algorithm>

#include <cutils/properties.h>
#include <time.h>

#include "core/Log.h"
#include "core/ParseInt32.h"
#include "rgb/LightSensorState.h"

namespace android {

Mutex RgbShotManager::sLock;
RgbShotManager* RgbShotManager::mRgbShot = nullptr;

RgbShotManager* RgbShotManager::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mRgbShot == nullptr) mRgbShot = new RgbShotManager;
    return mRgbShot;
}

RgbShotManager::RgbShotManager()
      : mShotBudget(0),
        mTestMode(0),
        mHasPending(false),
        mSkipLux(false),
        mPendingTime(-1),
        mPendingShots(0),
        mNameList(new Vector<String8>) {
    isTestMode();
    // Nothing in the library reads the list.
    mNameList->push_back(String8("__qk_displaysamplelayer@1999__"));
}

void RgbShotManager::isTestMode() {
    char text[PROP_VALUE_MAX];
    property_get("persist.sys.skip_restrict", text, "0");
    // Text that is no number leaves the mode as it was.
    parseInt32(text, &mTestMode);
    SENSOR_PRIV_LOGI("UL: isTestMode = %d", mTestMode);
}

void RgbShotManager::setRgbShot(int shots) {
    mShotBudget = std::max(mShotBudget, shots);
}

void RgbShotManager::onTouchChange() {
    setRgbShot(1);
}

void RgbShotManager::luxChange() {
    setRgbShot(2);
}

void RgbShotManager::colorChange() {
    setRgbShot(3);
}

void RgbShotManager::onUserPresent() {
    setRgbShot(3);
}

void RgbShotManager::autoModeChange() {
    setRgbShot(3);
    setRgbShotDelay(3, 8000);
}

void RgbShotManager::eyeChange() {
    setRgbShotDelay(1, 2000);
}

void RgbShotManager::policyChange() {
    setRgbShotDelay(5, 200);
}

// The sum has 64 bits, the clock 32: the clock wraps, due times do not.
void RgbShotManager::setRgbShotDelay(int shots, int delayMs) {
    queuePush({getCurrentMs() + delayMs, shots});
}

void RgbShotManager::onTransitionStatusChange(int status) {
    mSkipLux = status == 0;
    if (mSkipLux) return;
    setRgbShot(2);
    setRgbShotDelay(2, 8000);
}

bool RgbShotManager::skipLux() {
    return mSkipLux;
}

long long RgbShotManager::getCurrentMs() {
    timespec now;
    clock_gettime(CLOCK_MONOTONIC, &now);
    // The clock wraps at 32 bits, on purpose. Unsigned numbers do so without undefined behaviour.
    const uint32_t seconds = static_cast<uint32_t>(now.tv_sec);
    return static_cast<int32_t>(seconds * 1000 + static_cast<uint32_t>(now.tv_nsec / 1'000'000));
}

void RgbShotManager::queuePush(Entry entry) {
    Mutex::Autolock lock(mLock);
    mShotQueue.push(entry);
}

void RgbShotManager::queuePop() {
    Mutex::Autolock lock(mLock);
    // Callers ask `isEmpty` first, but another thread may have emptied the queue since.
    if (!mShotQueue.empty()) mShotQueue.pop();
}

bool RgbShotManager::isEmpty() {
    Mutex::Autolock lock(mLock);
    return mShotQueue.empty();
}

void RgbShotManager::clearQueue() {
    Mutex::Autolock lock(mLock);
    while (!mShotQueue.empty()) mShotQueue.pop();
    // The one call to the outside under the lock.
    if (mLogSwitch != 0) SENSOR_PRIV_LOGI("UL: clearQueue");
}

int RgbShotManager::getWaitCount() {
    noteFirst();
    return 0;  // the status of an unlock, which cannot fail
}

bool RgbShotManager::noteFirst() {
    Mutex::Autolock lock(mLock);
    if (mShotQueue.empty()) return false;
    mPendingTime = mShotQueue.top().first;
    mPendingShots = mShotQueue.top().second;
    return true;
}

void RgbShotManager::isTimeToShot() {
    const long long now = getCurrentMs();
    // Each access locks for itself, so another thread may come in between. If it empties the queue,
    // nothing becomes pending. If it pushes an earlier entry, `queuePop` drops that one.
    if (!mHasPending && !isEmpty() && noteFirst()) {
        mHasPending = true;
        queuePop();
    }
    // Not `<=`: an entry that is due in this millisecond is not over yet.
    if (mHasPending && mPendingTime < now) {
        setRgbShot(mPendingShots);
        mHasPending = false;
    }
}

bool RgbShotManager::allowRgbShot() {
    if (mTestMode != 0) return true;
    if (policy == 0 || mSkipLux) return false;
    isTimeToShot();
    if (mShotBudget < 1) return false;
    --mShotBudget;
    return true;
}

bool RgbShotManager::stopRgbThread() {
    return mShotBudget <= 0 && isEmpty() && !mHasPending;
}

}  // namespace android
