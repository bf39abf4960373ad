#include "report/Check.h"

#include "trace/TraceLine.h"
#include "trace/TraceTime.h"

namespace report {

void Check::begin(const Input& input) {
    mName = input.name;
    mExpected.clear();
    mGiven.clear();
    mMet = 0;
}

void Check::take(const Record& record) {
    const auto& [first, second, third] = record.texts;
    if (mFailure) return;
    if (record.kind == Record::Kind::kExpect) {
        mExpected.push_back({std::string(first), record.at, record.number});
    } else if (record.kind == Record::Kind::kEvent) {
        mGiven.push_back({trace::eventEntry(first, second, third), record.at, 0});
    } else if (record.kind == Record::Kind::kProperty) {
        mGiven.push_back({trace::propertyEntry(first, second), record.at, 0});
    }
    compare();
}

void Check::end(bool isWhole) {
    if (mFailure || !isWhole) return;
    if (!mExpected.empty() || !mGiven.empty()) {
        differ(mExpected.empty() ? nullptr : &mExpected.front(),
               mGiven.empty() ? nullptr : &mGiven.front());
    } else if (mMet == 0) {
        mFailure = {mName + R"(: nothing to check: no "expect" lines)", trace::kStatusBadInput};
    } else {
        mOut->write(mName + ": " + std::to_string(mMet) + " expectations met\n");
    }
}

void Check::compare() {
    while (!mExpected.empty() && !mGiven.empty()) {
        if (mExpected.front().text != mGiven.front().text) {
            return differ(&mExpected.front(), &mGiven.front());
        }
        mExpected.pop_front();
        mGiven.pop_front();
        ++mMet;
    }
}

void Check::differ(const Entry* expected, const Entry* given) {
    const auto show = [](const Entry* entry) {
        if (entry == nullptr) return std::string("nothing more");
        return R"({"at": )" + trace::formatMs(entry->at) + ", " + entry->text + '}';
    };
    const std::string place = expected == nullptr ? mName + ": " : trace::at(mName, expected->line);
    mFailure = {place + "the replay differs\n  expected: " + show(expected) +
                        "\n  replayed: " + show(given),
                trace::kStatusDiffers};
}

}  // namespace report
