#include "usage/RegisterInfo.h"

#include "core/SensorHandlerThread.h"
#include "core/TallyCommon.h"
#include "usage/RegisterConnectionList.h"

namespace android {

namespace {

enum : int { MSG_REPORT = 1 };

constexpr int kDisplayNotification = 2;

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
    if (values.size() > 2 && values[0] == kDisplayNotification) setDisplayState(values[2]);
}

void RegisterInfo::setDisplayState(int state) {
    mAccConnections->setDisplayState(state);
    mGyroConnections->setDisplayState(state);
}

void RegisterInfo::notifyDayNight() {
    SensorHandlerThread::getInstance()->sendMessage(mHandler, MSG_REPORT);
}

void RegisterInfo::putPkgInfoTally() {
    report("N273|10003", mAccConnections);
    report("N273|10004", mGyroConnections);
}

void RegisterInfo::notifyRegisterInfoReset() {
    mAccConnections->clear();
    mGyroConnections->clear();
}

RegisterConnectionList* RegisterInfo::listFor(int type) const {
    switch (type) {
        case 1:   // accelerometer
        case 35:  // accelerometer, uncalibrated
            return mAccConnections;
        case 4:   // gyroscope
        case 16:  // gyroscope, uncalibrated
            return mGyroConnections;
        default:
            return nullptr;
    }
}

}  // namespace android
