#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <utility>
#include <vector>

#include "capture/dump/Registration.h"

namespace capture {

/** A registration and the dump in which it was read. */
struct DumpLine {
    Registration registration;
    size_t dump;  // by the order of adding
};

/** Where a dump stands among the lines that were joined. */
struct JoinedDump {
    size_t dump;  // by the order of adding
    size_t last;  // its newest line
};

/** The registrations of one device, oldest first, by all dumps of it. */
struct JoinedLines {
    std::vector<DumpLine> lines;
    std::vector<JoinedDump> dumps;  // in the order of what they hold
    std::vector<size_t> gaps;       // lines before which others are missing

    /** Two dumps that do not meet, if there are such and no dates tell which is older. */
    std::optional<std::pair<size_t, size_t>> unordered;
};

/**
 * Joins dumps of one device, of which each holds the newest registrations only. Two dumps meet at
 * the longest run of lines that ends the older and begins the newer; one may also lie within the
 * other. Dumps may come in any order.
 */
class DumpJoin {
public:
    /** `lines`: oldest first, at least one. `taken`: when, as far as it is known. */
    void add(std::vector<Registration> lines, std::optional<int64_t> taken);

    /** All of them. Those that do not meet stand in the order in which they were taken. */
    JoinedLines finish();

private:
    /** Dumps that meet. */
    struct Piece {
        std::vector<DumpLine> lines;
        std::vector<JoinedDump> dumps;
    };

    /** How well a piece meets another. */
    struct Match {
        size_t length = 0;  // of the run
        size_t piece = 0;
        bool isOlder = false;  // that piece is the older one
        size_t at = 0;         // where the run begins in the older one
    };

    static Match match(const Piece& older, const Piece& newer);
    static Piece join(Piece older, Piece newer, size_t at);

    Match bestMatch(const Piece& piece) const;
    std::optional<int64_t> takenOf(const Piece& piece) const;

    /** Returns two dumps that keep the pieces from being put in order. */
    std::optional<std::pair<size_t, size_t>> sortPieces();

    std::vector<Piece> mPieces;
    std::vector<std::optional<int64_t>> mTaken;  // by dump
};

}  // namespace capture
