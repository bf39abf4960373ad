#include "report/Usage.h"

#include <algorithm>

namespace report {

void Usage::call(int64_t at, const trace::Call& call) {
    static const auto kEnable = trace::findCall("SDCImpl.enableSuccess");
    static const auto kCleanup = trace::findCall("SDCImpl.cleanupConnection");
    const auto& arguments = call.arguments;
    const auto text = [&](size_t i) { return std::get<std::string>(arguments[i]); };
    if (call.index == kEnable) {
        const std::string app = nameApp(text(2), text(3));
        const auto type = std::get<int32_t>(arguments[1]);
        if (std::get<bool>(arguments[0])) {
            enable(at, app, type, std::get<int64_t>(arguments[4]));
        } else {
            disable(at, app, type);
        }
    } else if (call.index == kCleanup) {
        disable(at, nameApp(text(0), text(1)), std::get<int32_t>(arguments[2]));
    } else if (mState.take(call) && mState.display) {
        if (mDisplay.empty() || mDisplay.back().isOn != *mState.display) {
            mDisplay.push_back({at, *mState.display});
        }
    }
}

void Usage::enable(int64_t at, const std::string& app, int32_t type, int64_t periodNs) {
    Held& held = mHeld[{app, type}];
    if (held.count == 0) held.slice = {app, type, at, at, {}, false};
    ++held.count;
    held.slice.enables.push_back({at, periodNs});
}

void Usage::disable(int64_t at, const std::string& app, int32_t type) {
    const auto found = mHeld.find({app, type});
    if (found == mHeld.end()) return;
    Held& held = found->second;
    if (--held.count > 0) return;
    held.slice.to = at;
    const Slice slice = std::move(held.slice);
    mHeld.erase(found);
    mTake(slice);
}

void Usage::end(int64_t at) {
    for (auto& [key, held] : mHeld) {
        held.slice.to = at;
        held.slice.isOpen = true;
        mTake(held.slice);
    }
    mHeld.clear();
    mDisplay.clear();
    mState = {};
}

DisplayTime Usage::displayIn(Span span) const {
    DisplayTime time;
    if (mDisplay.empty() || mDisplay.front().at >= span.to) return time;
    time.known = span.to - std::max(mDisplay.front().at, span.from);
    auto change =
            std::upper_bound(mDisplay.begin(), mDisplay.end(), span.from,
                             [](int64_t at, const DisplayChange& each) { return at < each.at; });
    if (change != mDisplay.begin()) --change;
    for (; change != mDisplay.end() && change->at < span.to; ++change) {
        const auto next = change + 1;
        const int64_t end = next == mDisplay.end() ? span.to : std::min(next->at, span.to);
        if (change->isOn) time.on += end - std::max(change->at, span.from);
    }
    return time;
}

std::string formatShare(const DisplayTime& time) {
    return time.known == 0 ? "-" : std::to_string(time.on * 100 / time.known) + " %";
}

std::string nameApp(const std::string& pkg, const std::string& opPkg) {
    return pkg == opPkg ? pkg : pkg + '/' + opPkg;
}

}  // namespace report
