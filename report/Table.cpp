#include "report/Table.h"

#include <algorithm>

#include "report/Text.h"

namespace report {

namespace {

constexpr size_t kGap = 2;      // between columns
constexpr size_t kMinCut = 10;  // what a column that is cut keeps at least

}  // namespace

void Table::add(const std::vector<std::string>& cells) {
    if (mRows.size() == mLimit) {
        ++mLeftOut;
        return;
    }
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
    if (mLeftOut > 0) text += std::string(indent, ' ') + more() + " (--all shows them)\n";
    return text;
}

std::string Table::html() const {
    const auto cell = [this](const char* tag, size_t i, const std::string& text) {
        const bool isRight = mColumns[i].layout == Column::kRight;
        return std::string("<") + tag + (isRight ? " class=\"number\">" : ">") + escape(text) +
               "</" + tag + '>';
    };
    std::string html = "<table>\n<tr>";
    for (size_t i = 0; i < mColumns.size(); ++i) html += cell("th", i, mColumns[i].title);
    html += "</tr>\n";
    for (const auto& row : mRows) {
        html += "<tr>";
        for (size_t i = 0; i < row.size(); ++i) html += cell("td", i, row[i]);
        html += "</tr>\n";
    }
    return html + "</table>\n" + (mLeftOut > 0 ? "<p>" + more() + "</p>\n" : "");
}

std::string Table::more() const {
    return "and " + std::to_string(mLeftOut) + " more";
}

}  // namespace report
