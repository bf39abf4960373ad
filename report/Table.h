#pragma once

#include <cstddef>
#include <string>
#include <utility>
#include <vector>

namespace report {

/** A table for a person: text at most 100 columns wide, or HTML. */
class Table {
public:
    struct Column {
        std::string title;
        enum { kLeft, kRight, kCut } layout = kLeft;  // kCut: left, and cut where room is short
    };

    /** Shows at most `limit` rows, and how many there are besides. */
    Table(std::vector<Column> columns, size_t limit)
          : mColumns(std::move(columns)),
            mLimit(limit) {}

    /** Adds a row: a cell for each column. */
    void add(const std::vector<std::string>& cells);

    bool isEmpty() const { return mRows.empty(); }

    /** The lines, each with `indent` blanks in front: the titles, then the rows. */
    std::string text(size_t indent) const;

    /** The element "table". */
    std::string html() const;

private:
    std::vector<size_t> widths(size_t indent) const;
    std::string more() const;

    const std::vector<Column> mColumns;
    const size_t mLimit;
    std::vector<std::vector<std::string>> mRows;  // of texts made by `safe`; those that are shown
    size_t mLeftOut = 0;
};

}  // namespace report
