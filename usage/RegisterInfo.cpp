#include "usage/RegisterInfo.h"

#include <hardware/sensors.h>

#include "core/SensorHandlerThread.h"
#include "core/TallyCommon.h"
#include "usage/RegisterConnectionList.h"

namespace android {

namespace {

enum : int { MSG_REPORT = 1 };

constexpr char kAccEventId[] = "N273|10003";
constexpr char kGyroEventId[] = "N273|10004";

// Notifications of the display state: their kind, and the element that has the state.
constexpr int kDisplayNotification = 2;
constexpr size_t kDisplayElement = 2;

void report(const char* eventId, RegisterConnectionList* list) {
    const std::string text = list->getRegisterConnectionInfo();
    if (!text.empty()) TallyCommon::getInstance()->trackEvent(eventId, {{"app_list", text}});
}

}  // namespace

class SENSOR_PRIV_HIDDEN RegisterInfo::RegisterHandler : public MessageHandler {
public:
    void handleMessage(const Message& message) override {
        if (message.what == MSG_REPORT) getInstance()->putPkgInfoTally();
    }
};

Mutex RegisterInfo::sLock;
RegisterInfo* RegisterInfo::mInstance = nullptr;

RegisterInfo* RegisterInfo::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mInstance == nullptr) mInstance = new RegisterInfo;
    return mInstance;
}

RegisterInfo::RegisterInfo()
      : mAccConnections(new RegisterConnectionList),
        mGyroConnections(new RegisterConnectionList),
        mHandler(new RegisterHandler) {}

void RegisterInfo::handleEnable(int type, std::string pkg, std::string opPkg, long long rate) {
    if (RegisterConnectionList* list = listFor(type)) list->update(pkg, opPkg, true, rate);
}

void RegisterInfo::handleDisable(int type, std::string pkg, std::string opPkg) {
    if (RegisterConnectionList* list = listFor(type)) list->update(pkg, opPkg, false, 0);
}

void RegisterInfo::setNotification(const Vector<int>& values) {
    // Element 1 is not read.
    if (values.size() > kDisplayElement && values[0] == kDisplayNotification) {
        setDisplayState(values[kDisplayElement]);
    }
}

void RegisterInfo::setDisplayState(int state) {
    mAccConnections->setDisplayState(state);
    mGyroConnections->setDisplayState(state);
}

void RegisterInfo::notifyDayNight() {
    SensorHandlerThread::getInstance()->sendMessage(mHandler, MSG_REPORT);
}

void RegisterInfo::putPkgInfoTally() {
    report(kAccEventId, mAccConnections);
    report(kGyroEventId, mGyroConnections);
}

void RegisterInfo::notifyRegisterInfoReset() {
    // Acts at once. A report that is still posted finds empty lists.
    mAccConnections->clear();
    mGyroConnections->clear();
}

RegisterConnectionList* RegisterInfo::listFor(int type) const {
    switch (type) {
        case SENSOR_TYPE_ACCELEROMETER:
        case SENSOR_TYPE_ACCELEROMETER_UNCALIBRATED:
            return mAccConnections;
        case SENSOR_TYPE_GYROSCOPE:
        case SENSOR_TYPE_GYROSCOPE_UNCALIBRATED:
            return mGyroConnections;
        default:
            return nullptr;
    }
}

}  // namespace android
