#include "record/LineTimes.h"

#include <algorithm>
#include <deque>
#include <limits>
#include <list>
#include <memory>
#include <random>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

#include "record/StintOrder.h"

namespace {

using record::LineTimes;
using record::PlainStint;
using record::Stint;
using record::StintOrder;

constexpr int64_t kMs = 1'000'000;

/** What a call, or a message, does to the queue: posts `what`, or takes every `what` back. */
struct Action {
    bool posts;
    int what;
    int delayMs;
};

struct Message {
    int what;
    int64_t due;
    int poster;  // what names it together with its number among what the poster posts
    int number;
};

/** The names of what ran, in order: a call's number, or a message's name. */
using Order = std::vector<std::string>;

std::string nameOf(const Message& message) {
    return "M" + std::to_string(message.poster) + '.' + std::to_string(message.number);
}

/** A call of the trace, as the recorder dates it. */
struct Line {
    int64_t at;
    int call;
    std::vector<Action> actions;
};

/** The rules by which a replay runs a trace. */
class Replay {
public:
    Order play(const std::deque<Line>& lines, int64_t end) {
        for (const Line& line : lines) {
            if (line.at > mNow) advanceTo(line.at);
            mOrder.push_back("C" + std::to_string(line.call));
            int number = 0;
            for (const Action& action : line.actions) {
                if (action.posts) {
                    mQueue.push_back(
                            {action.what, mNow + action.delayMs * kMs, line.call, number++});
                } else {
                    mQueue.remove_if([&](const Message& m) { return m.what == action.what; });
                }
                mIsAwake = true;
            }
        }
        advanceTo(end);
        return mOrder;
    }

private:
    void advanceTo(int64_t time) {
        if (mIsAwake) runDue();
        while (deadline() <= time) {
            mNow = deadline();
            runDue();
        }
        mNow = time;
    }

    void runDue() {
        mIsAwake = false;
        mQueue.sort([](const Message& a, const Message& b) { return a.due < b.due; });
        while (!mQueue.empty() && mQueue.front().due <= mNow) {
            mOrder.push_back(nameOf(mQueue.front()));
            mQueue.pop_front();
        }
        mWait = mNow;
    }

    int64_t deadline() const {
        if (mQueue.empty()) return std::numeric_limits<int64_t>::max();
        return mWait + (mQueue.front().due - mWait + kMs - 1) / kMs * kMs;
    }

    int64_t mNow = 0;
    int64_t mWait = 0;
    bool mIsAwake = false;
    std::list<Message> mQueue;
    Order mOrder;
};

/** A device at random: calls of several threads overlap, and the worker is late. */
class Device {
public:
    explicit Device(unsigned seed) : mRandom(seed) {}

    void live(int steps) {
        for (int step = 0; step < steps; ++step) {
            mNow += pick(9) == 0 ? pick(3 * kMs) : pick(2000);  // never too late
            switch (pick(6)) {
                case 0:
                case 1:
                    beginCall();
                    break;
                case 2:
                    takeMessage();
                    break;
                case 3:
                    if (mOpen.empty()) runMessages();
                    break;
                default:
                    if (!mOpen.empty()) endCall();
                    break;
            }
        }
    }

    const std::deque<Line>& lines() const { return mLines; }
    const Order& order() const { return mOrder; }
    int64_t end() const { return mNow + 1000 * kMs; }

    void finish() {
        while (!mOpen.empty()) endCall();
        for (; mInHand || !mQueue.empty(); runMessages()) {
            mNow += 5 * kMs;  // late, but not too late
            takeMessage();
        }
    }

private:
    struct Call {
        PlainStint run;
        Line* line;
    };
    struct Posted {
        Message message;
        PlainStint run;
        int64_t due;
    };

    int64_t pick(int64_t count) {
        return static_cast<int64_t>(mRandom() % static_cast<uint64_t>(count));
    }

    void beginCall() {
        if (mOpen.size() == 3) return;
        const int64_t at = mTimes.next(mNow);
        mLines.push_back({at, static_cast<int>(mLines.size()), {}});
        mOrder.push_back("C" + std::to_string(mLines.back().call));
        auto call = std::make_unique<Call>();
        call->line = &mLines.back();
        mTimes.beginCall(&call->run, mNow);
        mOpen.push_back(std::move(call));
    }

    /** Any of the calls that last does what it has to do, and ends. */
    void endCall() {
        const auto it = mOpen.begin() + pick(static_cast<int64_t>(mOpen.size()));
        Call& call = **it;
        int number = 0;
        for (int64_t i = pick(4); i > 0; --i) {
            constexpr int kDelays[] = {0, 0, 1, 5, 20};
            const Action action{pick(3) != 0, static_cast<int>(pick(4)), kDelays[pick(5)]};
            call.line->actions.push_back(action);
            if (action.posts) {
                post(call, action, number++);
            } else {
                remove(call, action.what);
            }
        }
        mTimes.endCall(call.run, mNow);
        mOpen.erase(it);
    }

    void post(const Call& call, const Action& action, int number) {
        auto posted = std::make_shared<Posted>();
        posted->message = {action.what, 0, call.line->call, number};
        posted->due = call.run.now + call.run.order + action.delayMs * kMs;
        mTimes.post(&posted->run, nullptr, action.what, action.delayMs, call.run);
        mQueue.push_back(posted);
    }

    void remove(const Call& call, int what) {
        const auto removed = mTimes.remove(nullptr, what, &call.run);
        const std::set<Stint*> gone(removed.begin(), removed.end());
        mQueue.remove_if([&](const auto& posted) { return gone.count(&posted->run) != 0; });
    }

    /** The worker takes the next message out of the queue, and comes to nothing more for now. */
    void takeMessage() {
        if (mInHand) return;
        const auto next = std::min_element(mQueue.begin(), mQueue.end(),
                                           [](auto& a, auto& b) { return a->due < b->due; });
        if (next == mQueue.end() || (*next)->due > mNow) return;
        mInHand = *next;
        mQueue.erase(next);
    }

    /** It runs what it has in its hands, and with it all of that moment. */
    void runMessages() {
        for (bool moreOfIt = true; mInHand && moreOfIt;) {
            const LineTimes::Turn turn = mTimes.turnOf(mInHand->run);
            if (turn == LineTimes::Turn::kLater) {
                mInHand->due = mNow;
                mQueue.push_back(mInHand);
            } else if (turn == LineTimes::Turn::kNow) {
                mTimes.start(&mInHand->run, mNow);
                mOrder.push_back(nameOf(mInHand->message));
                mTimes.endMessage();
            }
            mInHand.reset();
            moreOfIt = false;
            for (const auto& posted : mQueue) {
                if (!mTimes.hasBegun(posted->run)) continue;
                mNow = std::max(mNow, posted->due);
                moreOfIt = true;
            }
            if (moreOfIt) takeMessage();
        }
    }

    std::mt19937_64 mRandom;
    int64_t mNow = 1000 * kMs;
    LineTimes mTimes;
    std::deque<Line> mLines;
    std::vector<std::unique_ptr<Call>> mOpen;
    std::list<std::shared_ptr<Posted>> mQueue;
    std::shared_ptr<Posted> mInHand;
    Order mOrder;
};

TEST(LineTimesTest, AReplayRunsCallsAndMessagesInTheOrderOfTheDevice) {
    for (unsigned seed = 1; seed <= 300; ++seed) {
        Device device(seed);
        device.live(400);
        device.finish();
        int64_t last = 0;
        for (const Line& line : device.lines()) EXPECT_LE(std::exchange(last, line.at), line.at);
        ASSERT_EQ(Replay().play(device.lines(), device.end()), device.order()) << "seed " << seed;
    }
}

TEST(LineTimesTest, ACallIsDatedBackNoFurtherThanTheMessageThatIsLate) {
    LineTimes times;
    PlainStint call;
    PlainStint message;
    times.next(10 * kMs);
    times.beginCall(&call, 10 * kMs);
    times.post(&message, nullptr, 1, 5, call);
    times.endCall(call, 10 * kMs);
    EXPECT_EQ(times.next(14 * kMs), 14 * kMs);
    EXPECT_EQ(times.next(17 * kMs), 15 * kMs - 1);
    EXPECT_EQ(times.next(60'000 * kMs), 60'000 * kMs) << "it will never come";
}

TEST(LineTimesTest, WhatHangsInForeignCodeHoldsNobodyBack) {
    LineTimes times;
    PlainStint call;
    PlainStint message;
    times.next(10 * kMs);
    times.beginCall(&call, 10 * kMs);
    EXPECT_EQ(times.next(12 * kMs), 10 * kMs);
    EXPECT_TRUE(times.hasOpenCalls(12 * kMs));
    call.outsideSince = 12 * kMs;
    EXPECT_FALSE(times.hasOpenCalls(13 * kMs)) << "no message waits";
    EXPECT_EQ(times.next(18 * kMs), 18 * kMs);
    times.endCall(call, 19 * kMs);
    PlainStint late;
    times.post(&message, nullptr, 1, 5, call);
    times.post(&late, nullptr, 2, 11, call);
    times.start(&message, 20 * kMs);
    EXPECT_EQ(times.next(22 * kMs), 21 * kMs - 1) << "the worker may still be in time";
    message.outsideSince = 20 * kMs;
    EXPECT_EQ(times.next(30 * kMs), 30 * kMs) << "though the worker is late";
    times.endMessage();
    times.start(&late, 31 * kMs);
    EXPECT_EQ(late.now, 31 * kMs) << "the library's clock does not go back";
}

TEST(StintOrderTest, WhatRunsDoAtTheSameTimeIsToldOneAfterTheOther) {
    StintOrder order;
    PlainStint first;
    PlainStint second;
    PlainStint third;
    order.begin(&first);
    order.begin(&second);
    order.begin(&third);
    EXPECT_TRUE(order.mayWrite(&first, "a\n"));
    EXPECT_FALSE(order.mayWrite(&third, "d\n"));
    EXPECT_FALSE(order.mayWrite(&second, "b\n"));
    EXPECT_EQ(order.end(&third), "");
    EXPECT_FALSE(order.mayWrite(&second, "c\n"));
    EXPECT_EQ(order.end(&first), "b\nc\n");
    EXPECT_TRUE(order.mayWrite(&second, "now\n"));
    EXPECT_EQ(order.end(&second), "d\n");
}

}  // namespace
