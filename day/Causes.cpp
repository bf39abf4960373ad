#include "day/Causes.h"

#include <algorithm>
#include <limits>
#include <optional>
#include <string>
#include <string_view>
#include <tuple>

#include "base/Calendar.h"
#include "trace/Words.h"

namespace day {

using trace::Watch;
using trace::watchOf;

namespace {

constexpr int64_t kLongestUnreportedProximity = 1800;  // s
constexpr int64_t kEndOfTime = std::numeric_limits<int64_t>::max();
constexpr size_t kListed = 50;  // apps in a daily report

/** Apps whose proximity is not reported: those whose names hold one of these. */
constexpr std::string_view kSystemApps[] = {"com.android.incallui", "com.android.mms",
                                            "com.android.systemui", "com.android.server",
                                            "com.zuno"};

bool isSystemApp(const Use& use) {
    return std::any_of(std::begin(kSystemApps), std::end(kSystemApps), [&](std::string_view name) {
        return use.pkg.find(name) != std::string::npos || use.opPkg.find(name) != std::string::npos;
    });
}

/** What the library keeps of an app: it tells its clients apart by their names only. */
struct Account {
    std::vector<const Use*> uses;   // that it counts
    std::set<const Use*> open;      // of `uses`: no disable has ended them
    int64_t periodNs = 0;           // of the first enable: the app's rate
    int64_t since = 0;              // when the time that runs has begun, ns
    int64_t seconds = 0;            // credited
    std::optional<Cause> atReport;  // why the last daily report did not take it
};

using Accounts = std::map<std::string, Account>;

/** Follows what one part of the library makes of the uses of its sensors, within one boot. */
class Watcher {
public:
    Watcher(Watch watch, Causes* causes) : mWatch(watch), mCauses(causes) {}

    void enable(const Use& use, const Enable& enable);
    void disable(const Use& use);

    /** The host's daily report, or the reset behind it; proximity knows neither. */
    void report(int64_t at);
    void reset();

    /** The process ends. */
    void end();

private:
    bool hasRates() const { return mWatch == Watch::kAccelerometer || mWatch == Watch::kGyroscope; }
    template <typename Uses>
    void blame(Cause cause, const Uses& uses) {
        if (!uses.empty()) (*mCauses)[cause].insert(uses.begin(), uses.end());
    }
    Cause causeOfMissed(const Accounts::value_type& account) const;
    void pass(Accounts::value_type* account, int64_t at);
    void settle(int64_t at, const Accounts::value_type* ended);
    void findRunningRate();
    void leave(const Account& account, Cause cause);

    const Watch mWatch;
    Causes* const mCauses;
    Accounts mAccounts;
    std::map<std::string_view, Accounts::value_type*> mOpen;  // of `mAccounts`
    std::optional<int64_t> mRunning;  // the period at which the sensor runs, ns
    std::string mRequester;           // who has asked for it
};

/** Whether the app holds the sensor at `at`, and not only by what the library was told. */
bool isOn(const Account& account, int64_t at) {
    return std::any_of(account.open.begin(), account.open.end(),
                       [at](const Use* use) { return use->end == End::kOn || use->to > at; });
}

void credit(Account* account, int64_t at) {
    account->seconds += (at - account->since) / base::kNsPerSecond;
}

/** Why the time of an account that has another rate than the running one counts for nothing. */
Cause Watcher::causeOfMissed(const Accounts::value_type& account) const {
    if (mRequester == account.first) return Cause::kFirstRate;
    const bool isHeld = mOpen.count(mRequester) != 0 ||
                        std::any_of(mOpen.begin(), mOpen.end(), [&](const auto& each) {
                            return each.second->second.periodNs == mRunning;
                        });
    return isHeld ? Cause::kSlower : Cause::kStaleRate;
}

/** Time goes on to `at` while `account` is open. */
void Watcher::pass(Accounts::value_type* account, int64_t at) {
    const Account& passed = account->second;
    if (at <= passed.since) return;
    std::vector<const Use*> on;  // and not only by what the library was told
    for (const Use* use : passed.open) {
        if (use->to > passed.since) on.push_back(use);
    }
    if (on.size() > 1) blame(Cause::kTogether, on);
    if (hasRates() && passed.periodNs != mRunning) blame(causeOfMissed(*account), passed.open);
}

/** The time of all accounts starts again, and one that is at the running rate gets it. */
void Watcher::settle(int64_t at, const Accounts::value_type* ended) {
    std::vector<Account*> atRate;
    for (const auto& [app, account] : mOpen) {
        pass(account, at);
        if (account->second.periodNs == mRunning) atRate.push_back(&account->second);
    }
    for (Account* account : atRate) {
        if (atRate.size() > 1 && at > account->since) blame(Cause::kSameRate, account->open);
        if (ended == nullptr ? account == atRate[0] : account == &ended->second)
            credit(account, at);
    }
    for (const auto& [app, account] : mOpen) account->second.since = at;
}

void Watcher::enable(const Use& use, const Enable& enable) {
    const auto [found, isNew] = mAccounts.try_emplace(use.pkg + '/' + use.opPkg);
    Account& account = found->second;
    if (isNew) account.periodNs = enable.periodNs;
    if (hasRates()) {
        settle(enable.at, nullptr);
        if (!mRunning || enable.periodNs < *mRunning) {
            mRunning = enable.periodNs;
            mRequester = found->first;
        }
    } else if (!account.open.empty()) {
        pass(&*found, enable.at);
        credit(&account, enable.at);
    }
    account.since = enable.at;
    if (account.open.insert(&use).second) account.uses.push_back(&use);
    mOpen.emplace(found->first, &*found);
}

void Watcher::disable(const Use& use) {
    const auto found = mAccounts.find(use.pkg + '/' + use.opPkg);
    if (found == mAccounts.end() || found->second.open.count(&use) == 0) return;
    Account& account = found->second;
    pass(&*found, use.to);
    if (account.open.size() > 1) {
        account.open.erase(&use);
        return;
    }
    const bool isRunning = hasRates() && account.periodNs == mRunning;
    if (isRunning) settle(use.to, &*found);
    if (!hasRates()) credit(&account, use.to);
    account.open.clear();
    mOpen.erase(found->first);
    if (isRunning) findRunningRate();
    if (mWatch != Watch::kProximity) return;
    if (isSystemApp(use)) {
        blame(Cause::kSystemApp, account.uses);
    } else if (account.seconds <= kLongestUnreportedProximity) {
        blame(Cause::kShortProximity, account.uses);
    }
    mAccounts.erase(found);
}

void Watcher::findRunningRate() {
    mRunning.reset();
    for (const auto& [app, account] : mOpen) {
        const int64_t periodNs = account->second.periodNs;
        if (mRunning && *mRunning <= periodNs) continue;
        mRunning = periodNs;
        mRequester = app;
    }
}

void Watcher::report(int64_t at) {
    if (mWatch == Watch::kProximity) return;
    std::vector<Accounts::iterator> reported;
    for (auto each = mAccounts.begin(); each != mAccounts.end(); ++each) {
        Account& account = each->second;
        if (!account.open.empty()) {
            account.atReport = isOn(account, at) ? Cause::kStillOn : Cause::kUnseenEnd;
        } else if (hasRates() && account.seconds == 0) {
            account.atReport = Cause::kTooShort;
        } else {
            reported.push_back(each);
        }
    }
    std::stable_sort(reported.begin(), reported.end(), [](const auto& a, const auto& b) {
        return a->second.seconds > b->second.seconds;
    });
    for (size_t i = 0; i < reported.size(); ++i) {
        if (i >= kListed) blame(Cause::kBeyondList, reported[i]->second.uses);
        mAccounts.erase(reported[i]);
    }
}

void Watcher::reset() {
    if (mWatch == Watch::kProximity) return;
    for (const auto& [app, account] : mAccounts) leave(account, Cause::kWiped);
    mAccounts.clear();
    mOpen.clear();
}

void Watcher::end() {
    for (const auto& [app, account] : mAccounts) {
        if (mWatch != Watch::kProximity) {
            leave(account, Cause::kNoReport);
        } else if (isSystemApp(*account.uses.front())) {
            blame(Cause::kSystemApp, account.uses);
        } else {
            blame(isOn(account, kEndOfTime) ? Cause::kOpenProximity : Cause::kUnseenEnd,
                  account.uses);
        }
    }
}

/** An account is given up; `cause` counts if no daily report has seen it. */
void Watcher::leave(const Account& account, Cause cause) {
    if (account.atReport != Cause::kTooShort) {
        blame(account.atReport.value_or(cause), account.uses);
        return;
    }
    for (const Use* use : account.uses) {
        const bool isExplained =
                std::any_of(mCauses->begin(), mCauses->end(),
                            [use](const auto& each) { return each.second.count(use) != 0; });
        if (!isExplained) (*mCauses)[Cause::kTooShort].insert(use);
    }
}

/** What happens to the library, in the order in which it counts at one moment. */
struct Happening {
    enum Kind { kReset, kDisable, kEnable, kDisableAtOnce, kReport };

    int64_t boot;
    int64_t at;
    Kind kind;
    const Use* use = nullptr;        // of a disable
    const Enable* enable = nullptr;  // and its `use`

    bool operator<(const Happening& other) const {
        return std::tie(boot, at, kind) < std::tie(other.boot, other.at, other.kind);
    }
};

std::vector<Happening> happeningsOf(const std::vector<Use>& uses,
                                    const std::vector<DailyCall>& calls) {
    std::vector<Happening> happenings;
    happenings.reserve(calls.size() + uses.size());
    for (const DailyCall& call : calls) {
        // A report is made when all calls of its moment have been.
        happenings.push_back(
                {call.boot, call.at, call.isReset ? Happening::kReset : Happening::kReport});
    }
    for (const Use& use : uses) {
        if (watchOf(use.type) == Watch::kNobody) continue;
        for (const Enable& enable : use.enables) {
            happenings.push_back({use.boot, enable.at, Happening::kEnable, &use, &enable});
        }
        if (use.end != End::kOff) continue;  // the library is told of no other end
        const bool isAtOnce = use.to == use.from;
        happenings.push_back({use.boot, use.to,
                              isAtOnce ? Happening::kDisableAtOnce : Happening::kDisable, &use});
    }
    std::stable_sort(happenings.begin(), happenings.end());
    return happenings;
}

}  // namespace

Causes findCauses(const std::vector<Use>& uses, const std::vector<DailyCall>& calls) {
    Causes causes;
    for (const Use& use : uses) {
        if (watchOf(use.type) == Watch::kNobody) causes[Cause::kNobodyWatches].insert(&use);
    }
    std::map<Watch, Watcher> watchers;
    const auto endBoot = [&watchers] {
        for (auto& [watch, watcher] : watchers) watcher.end();
        watchers.clear();
    };
    int64_t boot = -1;
    for (const Happening& each : happeningsOf(uses, calls)) {
        if (each.boot != boot) endBoot();
        boot = each.boot;
        if (each.use != nullptr) {
            const Watch watch = watchOf(each.use->type);
            Watcher& watcher = watchers.try_emplace(watch, watch, &causes).first->second;
            if (each.kind == Happening::kEnable) {
                watcher.enable(*each.use, *each.enable);
            } else {
                watcher.disable(*each.use);
            }
            continue;
        }
        for (auto& [watch, watcher] : watchers) {
            if (each.kind == Happening::kReset) {
                watcher.reset();
            } else {
                watcher.report(each.at);
            }
        }
    }
    endBoot();
    return causes;
}

}  // namespace day
