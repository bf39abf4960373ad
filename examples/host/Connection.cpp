#include "examples/host/Connection.h"

#include <utility>

#include "core/SDCImpl.h"

namespace host {

using android::SDCImpl;
using android::String8;

Connection::Connection(std::string pkg, std::string opPkg)
      : mPkg(std::move(pkg)),
        mOpPkg(std::move(opPkg)) {}

Connection::~Connection() {
    for (const int type : mEnabled) {
        SDCImpl::getInstance()->cleanupConnection(String8(mPkg.c_str()), String8(mOpPkg.c_str()),
                                                  type);
    }
}

void Connection::enable(int type, long long rate) {
    if (!mEnabled.insert(type).second) return;
    SDCImpl::getInstance()->enableSuccess(true, type, mPkg, mOpPkg, rate);
}

void Connection::disable(int type) {
    if (mEnabled.erase(type) == 0) return;
    SDCImpl::getInstance()->enableSuccess(false, type, mPkg, mOpPkg, 0);
}

}  // namespace host
