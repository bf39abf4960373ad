#include "capture/Refusals.h"

#include <algorithm>
#include <cstdint>
#include <map>
#include <string>
#include <tuple>

namespace capture {

namespace {

/** A refused line: how many joined lines are older, and what tells it from others there. */
using Place = std::tuple<int64_t, int64_t, size_t>;

struct Count {
    int64_t count = 0;
    const Registration* line = nullptr;
};

}  // namespace

// Refused lines do not join dumps. Their place among those that do tells which of them are the
// same; equal ones at one place are as many as the dump with the most of them has.
std::vector<trace::RefusedNote> refusalsOf(const std::vector<NamedDump>& dumps,
                                           const JoinedLines& joined) {
    std::map<Place, Count> all;
    for (const JoinedDump& dump : joined.dumps) {
        std::map<Place, Count> own;
        const auto& refused = dumps[dump.dump].dump.registrations.refused();
        for (auto line = refused.rbegin(); line != refused.rend(); ++line) {
            const auto older =
                    static_cast<int64_t>(dump.last + 1) - static_cast<int64_t>(line->newer);
            Count& count = own[{older, line->line.timeOfDay, line->line.textHash}];
            ++count.count;
            count.line = &line->line;
        }
        for (const auto& [place, count] : own) {
            Count& known = all[place];
            if (known.count < count.count) known = count;
        }
    }
    std::vector<trace::RefusedNote> notes;
    for (const auto& [place, count] : all) {
        const Registration& line = *count.line;
        const trace::Client client{line.package, line.uid, line.handle};
        auto note = std::find_if(notes.begin(), notes.end(), [&](const auto& known) {
            return known.client == client && known.result == line.refusal;
        });
        if (note == notes.end()) note = notes.insert(note, {client, 0, line.refusal});
        note->count += count.count;
    }
    return notes;
}

}  // namespace capture
