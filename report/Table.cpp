#include "report/Table.h"

#include <algorithm>

#include "report/Text.h"

namespace report {

namespace {

constexpr size_t kGap = 2;          // between columns
constexpr size_t kNarrowGap = 1;    // where room is short
constexpr size_t kMinCut = 20;      // what a column that is cut keeps beside others
constexpr size_t kMaxBlanks = 120;  // no column is made wider for one long cell

}  // namespace

void Table::add(const std::vector<std::string>& cells) {
    if (mRows.size() == mLimit) {
        ++mLeftOut;
        return;
    }
    std::vector<std::string>& row = mRows.emplace_back();
    for (const std::string& cell : cells) row.push_back(safe(cell));
}

size_t Table::widest(size_t column) const {
    size_t widest = 0;
    for (const auto& row : mRows) widest = std::max(widest, width(row[column]));
    return widest;
}

Table::Part Table::partOf(size_t indent, const std::vector<size_t>& columns) const {
    Part part{indent, columns, {}, kGap};
    for (const size_t i : columns) {
        part.widths.push_back(std::max(widest(i), width(mColumns[i].title)));
    }
    return part;
}

/** Makes `part` at most `room` wide: narrow gaps first, then the widest that may be cut. */
bool Table::fit(Part* part, size_t room, size_t leastCut) const {
    const auto wide = [part] {
        size_t all = part->indent + part->gap * (part->widths.size() - 1);
        for (const size_t each : part->widths) all += each;
        return all;
    };
    const auto cutTo = [&](size_t least) {
        for (size_t all = wide(); all > room; --all) {
            size_t* widest = nullptr;
            for (size_t i = 0; i < part->widths.size(); ++i) {
                const bool isWider = widest == nullptr || part->widths[i] > *widest;
                if (mColumns[part->columns[i]].layout == Column::kCut && isWider) {
                    widest = &part->widths[i];
                }
            }
            if (widest == nullptr || *widest <= least) return false;
            --*widest;
        }
        return true;
    };
    const std::vector<size_t> natural = part->widths;
    if (cutTo(2 * leastCut)) return true;
    part->widths = natural;
    part->gap = kNarrowGap;
    return cutTo(leastCut);
}

std::vector<Table::Part> Table::layOut(size_t indent, std::optional<size_t> room) const {
    std::vector<size_t> all;
    std::vector<size_t> cut;
    std::vector<size_t> others;
    for (size_t i = 0; i < mColumns.size(); ++i) {
        if (!mRows.empty() && widest(i) == 0) continue;
        all.push_back(i);
        (mColumns[i].layout == Column::kCut ? cut : others).push_back(i);
    }
    Part whole = partOf(indent, all);
    if (!room || cut.empty() || fit(&whole, *room, kMinCut)) return {whole};
    if (others.empty()) {
        fit(&whole, *room, 1);
        return {whole};
    }
    std::vector<Part> parts{partOf(indent, cut)};
    fit(&parts[0], *room, 1);
    std::vector<size_t> fitting;
    for (const size_t i : others) {
        fitting.push_back(i);
        Part part = partOf(indent + kGap, fitting);
        const bool fits = fit(&part, *room, 1);
        if (fits && fitting.size() > 1) {
            parts.back() = part;
            continue;
        }
        fitting = {i};
        parts.push_back(partOf(indent + kGap, fitting));
    }
    return parts;
}

std::string Table::text(size_t indent, std::optional<size_t> columns) const {
    const std::vector<Part> parts = layOut(indent, columns);
    std::string text;
    const auto addLine = [&](const Part& part, const auto& cellOf) {
        std::string line(part.indent, ' ');
        for (size_t i = 0; i < part.columns.size(); ++i) {
            const size_t column = part.columns[i];
            const std::string cell = columns ? cut(cellOf(column), part.widths[i]) : cellOf(column);
            const size_t blanks = std::min(part.widths[i], kMaxBlanks);
            const std::string gap(blanks - std::min(width(cell), blanks), ' ');
            if (i > 0) line.append(part.gap, ' ');
            line += mColumns[column].layout == Column::kRight ? gap + cell : cell + gap;
        }
        text += line.erase(line.find_last_not_of(' ') + 1) + '\n';
    };
    for (const Part& part : parts) {
        addLine(part, [&](size_t i) { return mColumns[i].title; });
    }
    for (const auto& row : mRows) {
        for (const Part& part : parts) {
            addLine(part, [&](size_t i) { return row[i]; });
        }
    }
    if (mLeftOut > 0) text += std::string(indent, ' ') + more() + " (--all shows them)\n";
    return text;
}

std::string Table::more() const {
    return "and " + std::to_string(mLeftOut) + " more";
}

}  // namespace report
