#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace report {

/** A table of text for a terminal, at most 100 columns wide. */
class Table {
public:
    struct Column {
        std::string title;
        enum { kLeft, kRight, kCut } layout = kLeft;  // kCut: left, and cut where room is short
    };

    explicit Table(std::vector<Column> columns) : mColumns(std::move(columns)) {}

    /** Adds a row: a cell for each column. */
    void add(const std::vector<std::string>& cells);

    bool isEmpty() const { return mRows.empty(); }

    /** The lines, each with `indent` blanks in front: the titles, then the rows. */
    std::string text(size_t indent) const;

private:
    std::vector<size_t> widths(size_t indent) const;

    const std::vector<Column> mColumns;
    std::vector<std::vector<std::string>> mRows;  // of texts made by `safe`
};

}  // namespace report
