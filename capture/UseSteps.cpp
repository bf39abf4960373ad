#include "capture/UseSteps.h"

#include <algorithm>
#include <limits>
#include <map>

#include "capture/dump/WallTime.h"

namespace capture {

namespace {

using How = trace::EndNote::How;
using Kind = UseStep::Kind;

/** Follows the lines and writes down what a reader of the trace would not see by itself. */
class UseWalk {
public:
    UseWalk(const UseSources& sources, int64_t start, int64_t knownTo)
          : mSources(sources),
            mUses(sources.clients.size()),
            mStart(start),
            mKnownTo(knownTo) {
        for (size_t client = 0; client < mUses.size(); ++client) {
            mOnSensor[sources.clients[client].handle].push_back(client);
        }
    }

    std::vector<UseStep> walk() {
        for (size_t part = 0; part < mSources.parts.size(); ++part) {
            const Part& lines = mSources.parts[part];
            if (part > 0) fireBefore(timeOf(lines.first));
            begin(part);
            for (size_t line = lines.first; line < lines.end;) {
                line = takeSecond(line, lines.end, part);
            }
        }
        fireBefore(std::numeric_limits<int64_t>::max());
        for (size_t client = 0; client < mUses.size(); ++client) {
            if (mUses[client].wasLost) end(client, mKnownTo, How::kUnseen);
        }
        return std::move(mSteps);
    }

private:
    /** A client's use, as a reader of the trace sees it. */
    struct Use {
        int64_t level = 0;     // 0: there is none
        int64_t from = 0;      // only what was on earlier began before any second
        bool wasLost = false;  // it ends unseen
        int64_t firings = 0;   // of this second that end what begins in it
    };

    int64_t timeOf(size_t line) const { return mSources.dating.times[line]; }

    int64_t levelAtStart(size_t client, size_t part) const {
        const auto& levels = mSources.levels.atStart[part];
        const auto found = levels.find(client);
        return found == levels.end() ? 0 : found->second;
    }

    /** Ends what a gap hides, and tells what was on before the part's lines. */
    void begin(size_t part) {
        const int64_t at = part == 0 ? mStart : timeOf(mSources.parts[part].first);
        for (size_t client = 0; client < mUses.size(); ++client) {
            const Use& use = mUses[client];
            if (use.wasLost || (use.level > 0 && levelAtStart(client, part) == 0)) {
                end(client, at, How::kUnseen);
            }
        }
        const auto& earlier = mSources.levels.earlier[part];
        for (size_t i = 0; i < earlier.size(); ++i) {
            Use& use = mUses[earlier[i].client];
            if (use.level++ == 0) use.from = std::numeric_limits<int64_t>::min();
            mSteps.push_back({at, Kind::kEarlier, earlier[i].client, part, i});
        }
    }

    /** Takes the lines of one second from `line` on. Returns the line behind them. */
    size_t takeSecond(size_t line, size_t end, size_t part) {
        const int64_t at = timeOf(line);
        fireBefore(at);
        for (; hasFiring() && secondOf(*mFiring) == at; ++mFiring) fire(*mFiring, at, true);
        for (; line < end && timeOf(line) == at; ++line) takeLine(line, at, part);
        for (size_t client = 0; client < mUses.size(); ++client) endByFiring(client, at);
        for (Use& use : mUses) use.firings = 0;
        return line;
    }

    void takeLine(size_t line, int64_t at, size_t part) {
        const auto& client = mSources.clients.ofLine(line);
        if (!client) return;
        const bool on = mSources.joined.lines[line].registration.on;
        Use& use = mUses[*client];
        const bool wasUsed = use.level > 0;
        if (on ? use.wasLost : wasUsed) endByFiring(*client, at);
        if (use.wasLost) this->end(*client, at, How::kUnseen);
        UseStep step{at, Kind::kLine, *client, part, line};
        const int64_t behind = mSources.levels.behind[line];
        const int64_t counted = on ? use.level + 1 : std::max<int64_t>(use.level - 1, 0);
        if (on) {
            if (use.level == 0) use.from = at;
            use.wasLost = behind == 0;
            use.level = std::max<int64_t>(behind, 1);
        } else if (use.level > 0) {
            use.level = behind;
        }
        if (use.level != counted) step.level = use.level;
        mSteps.push_back(step);
    }

    static int64_t secondOf(const Firing& firing) { return cutToSecond(firing.at); }

    bool hasFiring() const { return mFiring != mSources.firings.end(); }

    void fireBefore(int64_t time) {
        for (; hasFiring() && secondOf(*mFiring) < time; ++mFiring) {
            if (secondOf(*mFiring) >= mStart) fire(*mFiring, secondOf(*mFiring), false);
        }
    }

    /** A firing ends what began before its second, or else what begins in it. */
    void fire(const Firing& firing, int64_t second, bool hasLines) {
        for (const size_t client : mOnSensor[firing.handle]) {
            Use& use = mUses[client];
            if (use.level > 0 && use.from < second) {
                this->end(client, second, How::kFired);
            } else if (hasLines) {
                ++use.firings;
            }
        }
    }

    void endByFiring(size_t client, int64_t at) {
        Use& use = mUses[client];
        if (use.firings == 0 || use.level == 0) return;
        --use.firings;
        end(client, at, How::kFired);
    }

    void end(size_t client, int64_t at, How how) {
        mUses[client].level = 0;
        mUses[client].wasLost = false;
        mSteps.push_back({at, Kind::kEnd, client, 0, 0, {}, how});
    }

    const UseSources& mSources;
    std::vector<Use> mUses;                             // by client
    std::map<uint32_t, std::vector<size_t>> mOnSensor;  // clients by handle
    const int64_t mStart;
    const int64_t mKnownTo;
    std::vector<Firing>::const_iterator mFiring = mSources.firings.begin();
    std::vector<UseStep> mSteps;
};

}  // namespace

std::vector<UseStep> useSteps(const UseSources& sources, int64_t start, int64_t knownTo) {
    return UseWalk(sources, start, knownTo).walk();
}

}  // namespace capture
