#include "exception/FlowingDataException.h"

#include <algorithm>
#include <cstring>
#include <iterator>
#include <utility>

#include <cutils/properties.h>
#include <hardware/sensors.h>
#include <strings.h>
#include <utils/Timers.h>

#include "core/Arithmetic.h"
#include "core/Connection.h"
#include "core/Log.h"
#include "core/ParseInt32.h"
#include "core/SensorHandlerThread.h"
#include "core/TallyCommon.h"

namespace android {

namespace {

// The codes 8 and 9 mean nothing.
enum : int {
    MSG_LOAD = 1,
    MSG_COUNT = 2,    // plus the slot
    MSG_REPORT = 10,  // plus the slot
    MSG_RESET = 16,
};

/**
 * By slot. The first type stands for the family in reports. 0 is no type. The slots are in the
 * order of the stored record, which is not that of the types.
 */
constexpr struct {
    int sensorTypes[4];
    const char* eventId;
} kFamilyTable[] = {
        {{SENSOR_TYPE_ACCELEROMETER, SENSOR_TYPE_GRAVITY, SENSOR_TYPE_LINEAR_ACCELERATION,
          SENSOR_TYPE_ACCELEROMETER_UNCALIBRATED},
         "N273|10003"},
        {{SENSOR_TYPE_GYROSCOPE, SENSOR_TYPE_GYROSCOPE_UNCALIBRATED}, "N273|10004"},
        {{SENSOR_TYPE_MAGNETIC_FIELD, SENSOR_TYPE_MAGNETIC_FIELD_UNCALIBRATED}, "N273|10005"},
        {{SENSOR_TYPE_LIGHT}, "N273|10006"},
        {{SENSOR_TYPE_ORIENTATION}, "N273|10007"},
        {{SENSOR_TYPE_ROTATION_VECTOR}, "N273|10008"},
};
constexpr char kSessionEventId[] = "N273|10010";
constexpr int kNoSlot = -1;

constexpr int kCountDelayMs = 11'000;
constexpr int kResetDelayMs = 2000;

constexpr char kRecordProperty[] = "persist.zuno.flow.detect.count";
constexpr char kNoRecord[] = "unknown";
constexpr size_t kRecordLimit = 90;  // what fits a property; six numbers never reach it

constexpr int32_t kReportedSeconds = 1800;
constexpr const char* kSystemPackages[] = {"com.android.incallui", "com.android.mms",
                                           "com.android.systemui", "com.android.server",
                                           "com.zuno"};

int slotOfType(int sensorType) {
    // Type 0 would match the unused places of the table.
    if (sensorType <= 0) return kNoSlot;
    for (size_t slot = 0; slot < std::size(kFamilyTable); ++slot) {
        const auto& types = kFamilyTable[slot].sensorTypes;
        if (std::find(std::begin(types), std::end(types), sensorType) != std::end(types)) {
            return static_cast<int>(slot);
        }
    }
    return kNoSlot;
}

/** The slot that `code` means where slot 0 has the code `first`. */
int slotOfCode(int code, int first) {
    const int end = first + static_cast<int>(std::size(kFamilyTable));
    return code >= first && code < end ? code - first : kNoSlot;
}

}  // namespace

class SENSOR_PRIV_HIDDEN FlowingDataException::SensorDetectHandler : public MessageHandler {
public:
    void handleMessage(const Message& message) override {
        if (message.what == MSG_LOAD) {
            getInstance()->initDetectCount();
        } else if (message.what == MSG_RESET) {
            getInstance()->resetDetectCount();
        } else if (const int slot = slotOfCode(message.what, MSG_REPORT); slot != kNoSlot) {
            getInstance()->putFamilyTally(slot);
        } else {
            getInstance()->updateDetectCountByType(message.what);
        }
    }
};

Mutex FlowingDataException::sLock;
FlowingDataException* FlowingDataException::mFlowingDataException = nullptr;

FlowingDataException* FlowingDataException::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mFlowingDataException == nullptr) mFlowingDataException = new FlowingDataException;
    return mFlowingDataException;
}

FlowingDataException::FlowingDataException() : mHandler(new SensorDetectHandler), mDetectCount{} {
    static_assert(std::size(kFamilyTable) == kFamilies);
}

void FlowingDataException::notifyBootCompleted() {
    SensorHandlerThread::getInstance()->sendMessage(mHandler, MSG_LOAD);
}

void FlowingDataException::notifyUpdateDetectCount(int sensorType) {
    const int slot = slotOfType(sensorType);
    if (slot == kNoSlot) return;
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    thread->removeMessage(mHandler, MSG_COUNT + slot);
    thread->sendMessageDelayed(mHandler, MSG_COUNT + slot, kCountDelayMs);
}

void FlowingDataException::putDetectTally() {
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    for (int slot = 0; slot < kFamilies; ++slot) thread->sendMessage(mHandler, MSG_REPORT + slot);
    thread->sendMessage(mHandler, MSG_RESET);
    // The second reset clears what is counted after the first one.
    thread->sendMessageDelayed(mHandler, MSG_RESET, kResetDelayMs);
}

void FlowingDataException::notifyFlowReset() {
    SensorHandlerThread* thread = SensorHandlerThread::getInstance();
    thread->removeMessage(mHandler, MSG_RESET);
    thread->sendMessageDelayed(mHandler, MSG_RESET, kResetDelayMs);
}

void FlowingDataException::notifyPutTally(int code) {
    const int slot = slotOfCode(code, MSG_REPORT);
    if (slot != kNoSlot) putFamilyTally(slot);
}

void FlowingDataException::putFamilyTally(int slot) {
    // `notifyPutTally` reads the count here while the worker may write it, on purpose.
    setSensorException(kFamilyTable[slot].sensorTypes[0], mDetectCount[slot]);
}

void FlowingDataException::initDetectCount() {
    char text[PROP_VALUE_MAX] = {};
    property_get(kRecordProperty, text, kNoRecord);
    if (strncasecmp(text, kNoRecord, std::strlen(kNoRecord)) == 0) {
        resetDetectCount();
        return;
    }
    // The counts take the fields at once. A wrong number of fields resets them in the end.
    int fields = 0;
    char* rest = nullptr;
    for (char* field = strtok_r(text, ",", &rest); field != nullptr;
         field = strtok_r(nullptr, ",", &rest)) {
        if (fields < kFamilies) {
            mDetectCount[fields] = 0;
            parseInt32(field, &mDetectCount[fields]);
        }
        ++fields;
    }
    if (fields != kFamilies) resetDetectCount();
}

void FlowingDataException::updateDetectCountByType(int code) {
    const int slot = slotOfCode(code, MSG_COUNT);
    if (slot == kNoSlot || mDetectCount[slot] > kLastCounted) return;
    ++mDetectCount[slot];
    storeDetectCount();
}

void FlowingDataException::resetDetectCount() {
    // Written while `mLogSwitch` is 0 too.
    SENSOR_PRIV_LOGD("sd resetDetectCount");
    std::fill(std::begin(mDetectCount), std::end(mDetectCount), 0);
    storeDetectCount();
}

void FlowingDataException::storeDetectCount() {
    std::string record;
    for (const int32_t count : mDetectCount) {
        if (!record.empty()) record += ',';
        record += std::to_string(count);
    }
    if (record.size() < kRecordLimit) property_set(kRecordProperty, record.c_str());
}

void FlowingDataException::setSensorException(int sensorType, int count) {
    const int slot = slotOfType(sensorType);
    if (slot == kNoSlot || count == 0) return;
    // [sic] The key is "reason", although the value is a count.
    TallyCommon::getInstance()->trackEvent(kFamilyTable[slot].eventId,
                                           {{"reason", convertIntToString(count)}});
}

std::string FlowingDataException::getEventID(int sensorType) {
    const int slot = slotOfType(sensorType);
    return slot == kNoSlot ? "-1" : kFamilyTable[slot].eventId;
}

std::string FlowingDataException::convertIntToString(int value) {
    return TallyCommon::getInstance()->intToStr(value);
}

void FlowingDataException::setProxEnable(std::string pkg, std::string opPkg) {
    // Read before the lock, so that the wait for it does not count.
    const nsecs_t now = systemTime(SYSTEM_TIME_MONOTONIC);
    Mutex::Autolock lock(mProxLock);
    ProxInfo& info = mProxInfoMap[connectionKey(pkg, opPkg)];
    // [sic] Each nesting loses the fraction of a second: reported durations are made of such sums.
    if (info.startTime != 0) {
        info.duration = addWrapped(info.duration, secondsBetween(info.startTime, now));
    }
    info.startTime = now;
    nestEnable(&info.count);
}

void FlowingDataException::setProxDisable(std::string pkg, std::string opPkg) {
    const nsecs_t now = systemTime(SYSTEM_TIME_MONOTONIC);
    int32_t seconds = 0;
    {
        Mutex::Autolock lock(mProxLock);
        const auto it = mProxInfoMap.find(connectionKey(pkg, opPkg));
        if (it == mProxInfoMap.end()) return;
        ProxInfo& info = it->second;
        if (!unnestEnable(&info.count)) return;
        seconds = addWrapped(info.duration, secondsBetween(info.startTime, now));
        mProxInfoMap.erase(it);
    }
    if (seconds > kReportedSeconds) setProxTally(std::move(pkg), std::move(opPkg), seconds);
}

void FlowingDataException::setProxTally(std::string pkg, std::string opPkg, int seconds) {
    for (const char* name : kSystemPackages) {
        if (nameHolds(pkg, name) || nameHolds(opPkg, name)) return;
    }
    TallyCommon* tally = TallyCommon::getInstance();
    tally->trackEvent(kSessionEventId,
                      {{"pkg", connectionKey(pkg, opPkg)}, {"time", tally->intToStr(seconds)}});
}

}  // namespace android
