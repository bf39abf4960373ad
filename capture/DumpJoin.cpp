#include "capture/DumpJoin.h"

#include <algorithm>
#include <iterator>
#include <tuple>
#include <utility>

namespace capture {

namespace {

bool isSame(const DumpLine& a, const DumpLine& b) {
    return isSameLine(a.registration, b.registration);
}

/**
 * The table of Knuth, Morris and Pratt for the first `count` lines: `border[n]` is the longest
 * proper prefix of the first n lines that is also their suffix.
 */
std::vector<size_t> borders(const std::vector<DumpLine>& lines, size_t count) {
    std::vector<size_t> border(count + 1, 0);
    size_t length = 0;
    for (size_t i = 1; i < count; ++i) {
        while (length > 0 && !isSame(lines[i], lines[length])) length = border[length];
        if (isSame(lines[i], lines[length])) ++length;
        border[i + 1] = length;
    }
    return border;
}

}  // namespace

void DumpJoin::add(std::vector<Registration> lines, std::optional<int64_t> taken) {
    const size_t dump = mTaken.size();
    mTaken.push_back(taken);
    Piece piece;
    piece.dumps.push_back({dump, lines.size() - 1});
    for (Registration& line : lines) piece.lines.push_back({std::move(line), dump});
    for (Match best = bestMatch(piece); best.length > 0; best = bestMatch(piece)) {
        Piece other = std::move(mPieces[best.piece]);
        mPieces.erase(mPieces.begin() + static_cast<ptrdiff_t>(best.piece));
        piece = best.isOlder ? join(std::move(other), std::move(piece), best.at)
                             : join(std::move(piece), std::move(other), best.at);
    }
    mPieces.push_back(std::move(piece));
}

JoinedLines DumpJoin::finish() {
    JoinedLines joined;
    joined.unordered = sortPieces();
    for (Piece& piece : mPieces) {
        const size_t first = joined.lines.size();
        if (first > 0) joined.gaps.push_back(first);
        for (JoinedDump& dump : piece.dumps) joined.dumps.push_back({dump.dump, dump.last + first});
        std::move(piece.lines.begin(), piece.lines.end(), std::back_inserter(joined.lines));
    }
    std::sort(joined.dumps.begin(), joined.dumps.end(),
              [&](const JoinedDump& a, const JoinedDump& b) {
                  return std::tuple(a.last, mTaken[a.dump], a.dump) <
                         std::tuple(b.last, mTaken[b.dump], b.dump);
              });
    return joined;
}

// Searches the newer piece's lines in the older one. What counts is how many of them end the older
// one. Where none do, the older may hold all of them further inside.
DumpJoin::Match DumpJoin::match(const Piece& older, const Piece& newer) {
    const size_t count = std::min(newer.lines.size(), older.lines.size());
    const std::vector<size_t> border = borders(newer.lines, count);
    std::optional<size_t> inside;  // where they all are
    size_t length = 0;
    for (size_t i = 0; i < older.lines.size(); ++i) {
        if (length == count) {
            inside = i - count;
            length = border[length];
        }
        while (length > 0 && !isSame(older.lines[i], newer.lines[length])) length = border[length];
        if (isSame(older.lines[i], newer.lines[length])) ++length;
    }
    if (inside && length < count) return {count, 0, true, *inside};
    return {length, 0, true, older.lines.size() - length};
}

DumpJoin::Piece DumpJoin::join(Piece older, Piece newer, size_t at) {
    const size_t known = std::min(older.lines.size() - at, newer.lines.size());
    std::move(newer.lines.begin() + static_cast<ptrdiff_t>(known), newer.lines.end(),
              std::back_inserter(older.lines));
    for (const JoinedDump& dump : newer.dumps) older.dumps.push_back({dump.dump, dump.last + at});
    return older;
}

DumpJoin::Match DumpJoin::bestMatch(const Piece& piece) const {
    Match best;
    for (size_t i = 0; i < mPieces.size(); ++i) {
        for (const bool isOlder : {true, false}) {
            Match found = isOlder ? match(mPieces[i], piece) : match(piece, mPieces[i]);
            if (found.length <= best.length) continue;
            best = found;
            best.piece = i;
            best.isOlder = isOlder;
        }
    }
    return best;
}

std::optional<int64_t> DumpJoin::takenOf(const Piece& piece) const {
    std::optional<int64_t> taken;
    for (const JoinedDump& dump : piece.dumps) taken = std::max(taken, mTaken[dump.dump]);
    return taken;
}

std::optional<std::pair<size_t, size_t>> DumpJoin::sortPieces() {
    const auto undated = std::find_if(mPieces.begin(), mPieces.end(),
                                      [&](const Piece& piece) { return !takenOf(piece); });
    if (mPieces.size() > 1 && undated != mPieces.end()) {
        const Piece& other = undated == mPieces.begin() ? mPieces[1] : mPieces[0];
        return std::pair(other.dumps.front().dump, undated->dumps.front().dump);
    }
    std::stable_sort(mPieces.begin(), mPieces.end(),
                     [&](const Piece& a, const Piece& b) { return takenOf(a) < takenOf(b); });
    return std::nullopt;
}

}  // namespace capture
