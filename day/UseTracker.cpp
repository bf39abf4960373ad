#include "day/UseTracker.h"

#include <algorithm>
#include <utility>

namespace day {

using trace::Record;

namespace {

/** The level of a client behind a line, which counts to `counted` where its note says no other. */
int64_t levelBehind(const std::optional<trace::RegistrationNote>& note, int64_t counted) {
    return note ? note->level.value_or(counted) : counted;
}

std::string nameApp(std::string_view pkg, std::string_view opPkg) {
    std::string name(pkg);
    return pkg == opPkg ? name : name.append("/").append(opPkg);
}

}  // namespace

std::string appOf(const Holder& holder) {
    return nameApp(holder.pkg, holder.opPkg);
}

std::optional<int64_t> shorterBatch(std::optional<int64_t> a, std::optional<int64_t> b) {
    if (!a || !b) return a ? a : b;
    if (*a == kAsLongAsPossible || *b == kAsLongAsPossible) return std::max(*a, *b);
    return std::min(*a, *b);
}

void Total::add(const Total& more) {
    held += more.held;
    display.add(more.display);
    enables += more.enables;
    if (more.periodNs) periodNs = std::min(periodNs.value_or(*more.periodNs), *more.periodNs);
    batchUs = shorterBatch(batchUs, more.batchUs);
}

HolderKey keyOf(const Holder& holder) {
    if (holder.handle) return {holder.handle, 0, holder.uid, holder.pkg, ""};
    return {std::nullopt, holder.type, std::nullopt, holder.pkg, holder.opPkg};
}

std::vector<Use> EndedUses::take(int64_t before) {
    std::sort(mUses.begin(), mUses.end(), [](const Use& a, const Use& b) {
        return std::tie(a.to, a.from, a.handle, a.pkg) < std::tie(b.to, b.from, b.handle, b.pkg);
    });
    const auto end = std::find_if(mUses.begin(), mUses.end(),
                                  [before](const Use& use) { return use.to >= before; });
    std::vector<Use> ended(mUses.begin(), end);
    mUses.erase(mUses.begin(), end);
    return ended;
}

void UseTracker::begin() {
    mNotes = {};
    mHeld.clear();
    mBoot = -1;
    mIsRunning = false;
}

void UseTracker::take(const Record& record) {
    if (record.kind == Record::Kind::kExpect) return;  // its time is the recorded device's
    if (record.kind == Record::Kind::kBoot) startBoot(record);
    passTime(record.at);
    switch (record.kind) {
        case Record::Kind::kEnable:
            return enable(record);
        case Record::Kind::kDisable:
            return disable(record);
        case Record::Kind::kState:
            if (record.value == static_cast<int32_t>(trace::DeviceState::kDisplay)) {
                mDisplay.change(record.at, record.number != 0);
            }
            return;
        case Record::Kind::kNote:
            takeNote(record.texts[0]);
            return;
        case Record::Kind::kOver:
            return endBoot();
        default:
            return;
    }
}

void UseTracker::startBoot(const Record& record) {
    endBoot();
    mDisplay.clear();
    if (record.value == static_cast<int32_t>(trace::BootKind::kDevice)) {
        mNotes.startClock();
        mIsClosed = false;
    }
    ++mBoot;
    mIsRunning = true;
}

void UseTracker::endBoot() {
    if (!mIsRunning) return;
    mIsRunning = false;
    const auto knownTo = mNotes.knownTo();
    // What is on when the capture is taken may be known for longer than the trace lasts.
    if (mNotes.taken && !mIsClosed) {
        passTime(std::max(mAt, *knownTo + 1));
    } else {
        endAll(knownTo ? std::min(mAt, *knownTo) : mAt);
    }
}

void UseTracker::passTime(int64_t at) {
    mAt = at;
    const auto knownTo = mNotes.knownTo();
    if (!knownTo || mIsClosed || at <= *knownTo) return;
    endAll(*knownTo);
    mIsClosed = true;
}

void UseTracker::endAll(int64_t at) {
    while (!mHeld.empty()) finish(mHeld.begin(), at, End::kOn);
}

/** Returns what it says of its line. */
std::optional<trace::RegistrationNote> UseTracker::takeNote(std::string_view json) {
    if (json.empty()) return std::nullopt;
    const trace::Note note = trace::parseNote(json);
    mNotes.take(note, mAt);
    if (note.end) {
        const trace::Client& client = note.end->client;
        const auto held = mHeld.find({client.pkg, client.uid, client.handle, 0});
        const bool isFired = note.end->how == trace::EndNote::How::kFired;
        const int64_t at = note.end->at ? std::max(toClock(*note.end->at), mAt) : mAt;
        if (held != mHeld.end()) finish(held, at, isFired ? End::kFired : End::kUnseen);
    }
    return note.registration;
}

UseTracker::Client UseTracker::clientOf(const Record& record,
                                        const std::optional<trace::RegistrationNote>& note) {
    const auto& [pkg, opPkg, json] = record.texts;
    if (note) return {std::string(pkg), note->uid, note->handle, 0};
    return {nameApp(pkg, opPkg), std::nullopt, std::nullopt, record.value};
}

void UseTracker::enable(const Record& record) {
    const auto note = takeNote(record.texts[2]);
    if (mIsClosed) return;
    const auto [place, isNew] = mHeld.try_emplace(clientOf(record, note));
    auto& [use, level] = place->second;
    level = levelBehind(note, level + 1);
    if (isNew) {
        use.pkg = record.texts[0];
        use.opPkg = record.texts[1];
        use.type = record.value;
        use.boot = mBoot;
        use.from = record.at;
    }
    const bool isKnown = !note || note->rateKnown;
    use.enables.push_back({record.at, record.number, isKnown});
    if (isKnown) use.periodNs = std::min(use.periodNs.value_or(record.number), record.number);
    if (!note) return;
    use.uid = note->uid;
    use.handle = note->handle;
    use.before = use.before || note->before;
    use.batchUs = shorterBatch(use.batchUs, note->batchUs);
}

void UseTracker::disable(const Record& record) {
    const auto note = takeNote(record.texts[2]);
    const auto held = mHeld.find(clientOf(record, note));
    if (held == mHeld.end()) return;
    int64_t& level = held->second.level;
    level = levelBehind(note, level - 1);
    if (level <= 0) finish(held, record.at, End::kOff);
}

void UseTracker::finish(Holdings::iterator held, int64_t at, End end) {
    Use use = std::move(held->second.use);
    mHeld.erase(held);
    use.to = std::max(at, use.from);
    use.end = end;
    use.display = displayIn({use.from, use.to});
    const int32_t type = use.type;  // as the library was told
    mNotes.complete(&use);
    use.type = type;
    mTake(use);
}

}  // namespace day
