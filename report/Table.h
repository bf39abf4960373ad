#pragma once

#include <cstddef>
#include <limits>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace report {

/** A table for a person. */
class Table {
public:
    struct Column {
        std::string title;
        enum { kLeft, kRight, kCut } layout = kLeft;  // kCut: left, and cut where room is short
    };

    static constexpr size_t kShownRows = 20;  // of a summary, unless all are asked for
    static constexpr size_t kAllRows = std::numeric_limits<size_t>::max();

    /** Shows at most `limit` rows, and how many there are besides. */
    Table(std::vector<Column> columns, size_t limit)
          : mColumns(std::move(columns)),
            mLimit(limit) {}

    /** Adds a row: a cell for each column. */
    void add(const std::vector<std::string>& cells);

    bool isEmpty() const { return mRows.empty(); }

    /**
     * The lines, each with `indent` blanks in front: the titles, then the rows. Columns in which
     * nothing stands are left out. A line is at most `columns` wide, if that is given. The columns
     * that may be cut become narrower then. Where that would leave too little of them, they stand
     * on a line of their own, and the others below on as many lines as they need.
     */
    std::string text(size_t indent, std::optional<size_t> columns = {}) const;

    const std::vector<Column>& columns() const { return mColumns; }

    /** The cells of the rows that are shown, made by `safe`. */
    const std::vector<std::vector<std::string>>& rows() const { return mRows; }

private:
    /** Columns that stand side by side, and how wide they are. */
    struct Part {
        size_t indent;
        std::vector<size_t> columns;
        std::vector<size_t> widths;
        size_t gap;  // between two
    };

    std::vector<Part> layOut(size_t indent, std::optional<size_t> room) const;
    Part partOf(size_t indent, const std::vector<size_t>& columns) const;
    bool fit(Part* part, size_t room, size_t leastCut) const;
    size_t widest(size_t column) const;
    std::string more() const;

    const std::vector<Column> mColumns;
    const size_t mLimit;
    std::vector<std::vector<std::string>> mRows;  // of texts made by `safe`; those that are shown
    size_t mLeftOut = 0;
};

}  // namespace report
