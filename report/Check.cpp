#include "report/Check.h"

#include <utility>

#include "base/Calendar.h"
#include "base/Json.h"
#include "base/Result.h"
#include "report/Text.h"
#include "trace/TraceWriter.h"

namespace report {

using trace::Record;

void Check::begin(const std::string& name) {
    mName = name;
    mExpected.clear();
    mGiven.clear();
    mLost.reset();
    mTold.clear();
    mDoubts.clear();
    mMet = 0;
    mHasMetAny = false;
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
    } else if (record.kind == Record::Kind::kNote) {
        takeNote(trace::parseNote(first), record.number);
        // A boot line that tells of a loss begins what comes after it.
        if (mBoots && mLost) endStretch();
    } else if (record.kind == Record::Kind::kTorn) {
        mTold += base::at(mName, record.number) + "the last line is torn; those before it count\n";
    } else if (record.kind == Record::Kind::kOver && record.number != 0) {
        endProcess(record.at);
    } else if (record.kind == Record::Kind::kBoot && mLost) {
        endStretch();
    }
    mBoots = record.kind == Record::Kind::kBoot;
    compare();
}

void Check::takeNote(const trace::Note& note, int64_t line) {
    const auto tell = [&](const std::string& text) {
        const std::string told = base::at(mName, line) + text;
        mTold += told + '\n';
        mDoubts += "\n  " + told;
    };
    if (note.lost) {
        mLost = note.lost;
        tell("lines are lost from " + std::to_string(note.lost->from) + " to " +
             std::to_string(note.lost->to) + " ms: " + safe(note.lost->why));
    }
    if (note.hang) {
        tell("what began at " + std::to_string(note.hang->from) +
             " ms hung, and did the rest later");
    }
}

void Check::end(bool isWhole) {
    if (mFailure || !isWhole) return;
    endStretch();
    if (!mFailure && !mHasMetAny) {
        mFailure = {mName + R"(: nothing to check: no "expect" lines)", base::kStatusBadInput};
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

/** A process that was killed after its last line has not told what that line did. */
void Check::endProcess(int64_t at) {
    if (!mExpected.empty() || mGiven.empty() || mGiven.front().at != at) return;
    mTold += mName + ": the process ends at " + base::formatMs(at) + " ms; the replay does " +
             std::to_string(mGiven.size()) + " more of that moment\n";
    mGiven.clear();
}

void Check::endStretch() {
    if (mFailure) return;
    while (mLost && !mGiven.empty() && mGiven.front().at >= mLost->from * base::kNsPerMs) {
        mGiven.pop_front();
    }
    mLost.reset();
    if (!mExpected.empty() || !mGiven.empty()) {
        return differ(mExpected.empty() ? nullptr : &mExpected.front(),
                      mGiven.empty() ? nullptr : &mGiven.front());
    }
    if (mMet > 0) mOut->write(mName + ": " + std::to_string(mMet) + " expectations met\n");
    mOut->write(std::exchange(mTold, {}));
    mHasMetAny |= mMet > 0;
    mMet = 0;
}

void Check::differ(const Entry* expected, const Entry* given) {
    const auto show = [](const Entry* entry) {
        if (entry == nullptr) return std::string("nothing more");
        std::string line;
        base::JsonWriter(&line)
                .beginObject()
                .member("at", base::Ms{entry->at})
                .raw(entry->text)
                .endObject();
        return line;
    };
    const std::string place = expected == nullptr ? mName + ": " : base::at(mName, expected->line);
    mFailure = {place + "the replay differs\n  expected: " + show(expected) +
                        "\n  replayed: " + show(given) + mDoubts,
                base::kStatusDiffers};
}

}  // namespace report
