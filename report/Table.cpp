#include "report/Table.h"

#include <algorithm>

#include "report/Text.h"

namespace report {

namespace {

constexpr size_t kGap = 2;      // between columns
constexpr size_t kMinCut = 10;  // what a column that is cut keeps at least

}  // namespace

void Table::add(const std::vector<std::string>& cells) {
    std::vector<std::string>& row = mRows.emplace_back();
    for (const std::string& cell : cells) row.push_back(safe(cell));
}

std::vector<size_t> Table::widths(size_t indent) const {
    std::vector<size_t> widths;
    size_t all = indent + kGap * (mColumns.size() - 1);
    for (size_t i = 0; i < mColumns.size(); ++i) {
        size_t widest = width(mColumns[i].title);
        for (const auto& row : mRows) widest = std::max(widest, width(row[i]));
        widths.push_back(widest);
        all += widest;
    }
    // The widest of those that may be cut gives way first.
    for (; all > kWidth; --all) {
        size_t* widest = nullptr;
        for (size_t i = 0; i < mColumns.size(); ++i) {
            const bool isFirst = widest == nullptr || widths[i] > *widest;
            if (mColumns[i].layout == Column::kCut && isFirst) widest = &widths[i];
        }
        if (widest == nullptr || *widest <= kMinCut) break;
        --*widest;
    }
    return widths;
}

std::string Table::text(size_t indent) const {
    const std::vector<size_t> columns = widths(indent);
    std::string text;
    const auto addLine = [&](const auto& cellOf) {
        std::string line(indent, ' ');
        for (size_t i = 0; i < columns.size(); ++i) {
            const std::string cell = cut(cellOf(i), columns[i]);
            const std::string blanks(columns[i] - width(cell), ' ');
            if (i > 0) line.append(kGap, ' ');
            line += mColumns[i].layout == Column::kRight ? blanks + cell : cell + blanks;
        }
        text += line.erase(line.find_last_not_of(' ') + 1) + '\n';
    };
    addLine([&](size_t i) { return mColumns[i].title; });
    for (const auto& row : mRows) addLine([&](size_t i) { return row[i]; });
    return text;
}

}  // namespace report
