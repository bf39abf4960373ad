#include "capture/Levels.h"

#include <algorithm>
#include <cstdlib>

namespace capture {

namespace {

constexpr int64_t kGuessedPeriodUs = 200'000;  // what most clients ask for
constexpr int64_t kShortestPrintedUs = 1000;   // of running requests
constexpr int64_t kRoundingUs = 100;           // running requests are printed in tenths of a ms

int64_t without(int64_t level) {
    return std::max<int64_t>(level - 1, 0);
}

/** A client in a part. */
struct Course {
    std::vector<size_t> lines;
    int64_t carried = 0;  // from the part before
    int64_t start = 0;
    int64_t end = 0;
    int64_t byLines = 0;  // what would be on at the end by `carried` and the lines alone

    /** How many of the connections at the end neither a line nor the part before explains. */
    int64_t unexplained() const { return std::max<int64_t>(end - byLines, 0); }
};

/** The clients of a part: those with lines, those with connections, those with something on. */
struct PartCourses {
    std::vector<size_t> order;
    std::map<size_t, Course> courses;  // by client

    Course* courseOf(size_t client) {
        const auto [entry, isNew] = courses.try_emplace(client);
        if (isNew) order.push_back(client);
        return &entry->second;
    }
};

/** Follows the clients through one part after another. */
class LevelWalk {
public:
    LevelWalk(const JoinedLines& joined, const std::vector<Part>& parts, const ClientTable& clients)
          : mJoined(joined),
            mParts(parts),
            mClients(clients),
            mLines(clients.size()),
            mLevels(clients.size()),
            mPeriods(clients.size()) {
        mResult.behind.resize(joined.lines.size());
        for (size_t line = 0; line < joined.lines.size(); ++line) {
            if (const auto& client = clients.ofLine(line)) mLines[*client].push_back(line);
        }
    }

    Levels walk() {
        for (size_t part = 0; part < mParts.size(); ++part) {
            PartCourses courses = coursesOf(part);
            auto& atStart = mResult.atStart.emplace_back();
            for (auto& [client, course] : courses.courses) {
                follow(client, part, &course);
                atStart[client] = course.start;
            }
            addEarlier(courses, part);
            for (const auto& [client, course] : courses.courses) {
                mLevels[client] = course.end;
                addPeriods(course.lines, &mPeriods[client]);
            }
        }
        return std::move(mResult);
    }

private:
    PartCourses coursesOf(size_t part) const {
        PartCourses courses;
        for (size_t line = mParts[part].first; line < mParts[part].end; ++line) {
            if (const auto& client = mClients.ofLine(line)) {
                courses.courseOf(*client)->lines.push_back(line);
            }
        }
        for (const size_t client : mClients.connected(part)) courses.courseOf(client);
        for (size_t client = 0; client < mLevels.size(); ++client) {
            if (mLevels[client] > 0) courses.courseOf(client);
        }
        return courses;
    }

    void follow(size_t client, size_t part, Course* course) {
        const auto isOn = [&](size_t line) { return mJoined.lines[line].registration.on; };
        course->carried = course->byLines = mLevels[client];
        for (const size_t line : course->lines) {
            course->byLines = isOn(line) ? course->byLines + 1 : without(course->byLines);
        }
        const bool hasTable = mParts[part].dump->service.connections.has_value();
        course->end = hasTable ? mClients.connectionsOf(client, part) : course->byLines;
        course->start = course->end;
        for (auto line = course->lines.rbegin(); line != course->lines.rend(); ++line) {
            mResult.behind[*line] = course->start;
            course->start = isOn(*line) ? without(course->start) : course->start + 1;
        }
    }

    // Of a client's enables the older ones are those that its offs need. Those that only its
    // connections show come behind them; their periods are among the running requests.
    void addEarlier(const PartCourses& courses, size_t part) {
        auto& earlier = mResult.earlier.emplace_back();
        std::map<uint32_t, std::vector<RunningRequest>> free;  // by handle
        for (const size_t client : courses.order) {
            const Course& course = courses.courses.at(client);
            const uint32_t handle = mClients[client].handle;
            const int64_t count = course.start - course.carried;
            const auto inPart = part > 0 ? firstOn(course.lines) : std::nullopt;
            for (int64_t i = 0; i < count; ++i) {
                auto request = inPart;
                if (!request && i >= count - course.unexplained()) {
                    const auto [entry, isNew] = free.try_emplace(handle);
                    if (isNew) entry->second = freeRequests(handle, courses, part);
                    auto& left = entry->second;
                    if (!left.empty()) {
                        request = left.front();
                        left.erase(left.begin());
                    }
                }
                if (!request) request = firstOn(mLines[client]);
                EarlierEnable enable{client, kGuessedPeriodUs, {}, request.has_value()};
                if (request) {
                    enable.periodUs = request->periodUs;
                    enable.batchUs = request->batchUs;
                }
                earlier.push_back(enable);
            }
        }
        for (const EarlierEnable& enable : earlier) {
            if (enable.isKnown) mPeriods[enable.client].push_back(enable.periodUs);
        }
    }

    // A sensor's running requests that belong to no line, in the printed order. None if there are
    // more requests than connections: some are a virtual sensor's own, and nothing tells which.
    std::vector<RunningRequest> freeRequests(uint32_t handle, const PartCourses& courses,
                                             size_t part) const {
        std::vector<RunningRequest> free = mParts[part].dump->service.device.requestsOf(handle);
        int64_t connections = 0;
        for (const size_t client : mClients.connected(part)) {
            if (mClients[client].handle != handle) continue;
            connections += mClients.connectionsOf(client, part);
        }
        if (static_cast<int64_t>(free.size()) > connections) return {};
        const auto takeOut = [&](int64_t periodUs) {
            periodUs = std::max(periodUs, kShortestPrintedUs);
            const auto distance = [&](const RunningRequest& request) {
                return std::abs(request.periodUs - periodUs);
            };
            const auto nearest =
                    std::min_element(free.begin(), free.end(),
                                     [&](const RunningRequest& a, const RunningRequest& b) {
                                         return distance(a) < distance(b);
                                     });
            if (nearest != free.end() && distance(*nearest) <= kRoundingUs) free.erase(nearest);
        };
        for (const size_t client : courses.order) {
            if (mClients[client].handle != handle) continue;
            const Course& course = courses.courses.at(client);
            std::vector<int64_t> periods = mPeriods[client];
            addPeriods(course.lines, &periods);
            int64_t on = std::min(course.end, course.byLines);
            for (auto period = periods.rbegin(); on > 0 && period != periods.rend();
                 ++period, --on) {
                takeOut(*period);
            }
        }
        return free;
    }

    /** The client's first on among `lines`; nothing if there is none. */
    std::optional<RunningRequest> firstOn(const std::vector<size_t>& lines) const {
        for (const size_t line : lines) {
            const Registration& registration = mJoined.lines[line].registration;
            if (registration.on) return RunningRequest{registration.periodUs, registration.batchUs};
        }
        return std::nullopt;
    }

    /** Appends the periods of the ons among `lines`. */
    void addPeriods(const std::vector<size_t>& lines, std::vector<int64_t>* periods) const {
        for (const size_t line : lines) {
            const Registration& registration = mJoined.lines[line].registration;
            if (registration.on) periods->push_back(registration.periodUs);
        }
    }

    const JoinedLines& mJoined;
    const std::vector<Part>& mParts;
    const ClientTable& mClients;
    Levels mResult;

    // By client.
    std::vector<std::vector<size_t>> mLines;
    std::vector<int64_t> mLevels;                // at the end of the part before
    std::vector<std::vector<int64_t>> mPeriods;  // of all ons so far
};

}  // namespace

Levels levelsOf(const JoinedLines& joined, const std::vector<Part>& parts,
                const ClientTable& clients) {
    return LevelWalk(joined, parts, clients).walk();
}

}  // namespace capture
