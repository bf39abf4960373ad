#include "report/page/TableOf.h"

#include <algorithm>
#include <cstdlib>
#include <string_view>

namespace report::page {

namespace {

Column::Kind kindOf(const report::Table::Column& column) {
    if (column.title == "App" || column.title == "Sensor") return Column::Kind::kName;
    return column.layout == report::Table::Column::kRight ? Column::Kind::kNumber
                                                          : Column::Kind::kText;
}

/** `title` as a key: its letters, in lower case. */
std::string keyOf(std::string_view title) {
    std::string key;
    for (const char c : title) {
        if (c >= 'A' && c <= 'Z') key += static_cast<char>(c - 'A' + 'a');
        if (c >= 'a' && c <= 'z') key += c;
    }
    return key;
}

/** The number, or the h:mm:ss in seconds, that `text` begins with behind a mark; k and M count. */
std::optional<double> valueOf(const std::string& text) {
    const size_t start = text.find_first_of("0123456789");
    if (start == std::string::npos) return {};
    const int sign = text[0] == '-' ? -1 : 1;
    const char* at = text.c_str() + start;
    double value = 0;
    while (true) {
        char* end = nullptr;
        value += std::strtod(at, &end);
        if (*end == 'k') return sign * value * 1e3;
        if (*end == 'M') return sign * value * 1e6;
        if (*end != ':') return sign * value;
        value *= 60;
        at = end + 1;
    }
}

}  // namespace

Table tableOf(const report::Table& table, const std::string& kind, const std::string& caption) {
    Table result;
    result.caption = caption;
    result.kind = kind;
    result.rows.resize(table.rows().size());
    for (size_t i = 0; i < table.columns().size(); ++i) {
        const auto& column = table.columns()[i];
        const bool isEmpty = std::all_of(table.rows().begin(), table.rows().end(),
                                         [i](const auto& row) { return row[i].empty(); });
        if (isEmpty && kindOf(column) != Column::Kind::kName) continue;
        const std::string title = column.title.empty() ? "State" : column.title;
        result.columns.push_back({title, keyOf(title), kindOf(column)});
        const bool isNumber = kindOf(column) == Column::Kind::kNumber;
        for (size_t row = 0; row < result.rows.size(); ++row) {
            const std::string& text = table.rows()[row][i];
            result.rows[row].push_back({text, isNumber ? valueOf(text) : std::nullopt});
        }
    }
    return result;
}

}  // namespace report::page
