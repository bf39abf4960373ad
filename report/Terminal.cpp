#include "report/Terminal.h"

#include <algorithm>
#include <vector>

#include "report/Text.h"

namespace report {

void Terminal::title(const std::string& name) {
    mOut->write(emphasised(mLooks.columns ? cut(name, *mLooks.columns) : name) + '\n');
}

void Terminal::heading(const std::string& text) {
    mOut->write('\n' + emphasised(text) + '\n');
}

void Terminal::table(const Table& table, size_t indent) {
    mOut->write(table.text(indent, mLooks.columns));
}

void Terminal::section(const Section& section, size_t indent) {
    if (indent == 0) {
        heading(section.heading + (section.isEmpty() ? " nothing" : ""));
    } else {
        name(section.heading, indent);
    }
    const size_t inner = indent + 2;
    for (const std::string& line : section.lines) sentence(line, inner);
    for (const auto& [title, items] : section.lists) {
        if (!title.empty()) sentence(title, inner);
        const size_t itemIndent = title.empty() ? inner : inner + 2;
        const size_t shown = std::min(items.size(), mLooks.rows());
        for (size_t i = 0; i < shown; ++i) name(items[i], itemIndent);
        const size_t more = items.size() - shown;
        if (more > 0) name("and " + std::to_string(more) + " more", itemIndent);
    }
    for (const auto& shown : section.tables) table(shown.table, inner);
    for (const std::string& line : section.below) sentence(line, inner);
    for (const Section& part : section.parts) this->section(part, inner);
}

void Terminal::name(const std::string& text, size_t indent) {
    const auto& columns = mLooks.columns;
    mOut->write(std::string(indent, ' ') + (columns ? cut(text, *columns - indent) : text) + '\n');
}

void Terminal::sentence(const std::string& text, size_t indent) {
    const auto& columns = mLooks.columns;
    const auto lines = columns ? wrap(text, *columns - indent - 2) : std::vector{text};
    for (const std::string& line : lines) {
        mOut->write(std::string(&line == lines.data() ? indent : indent + 2, ' ') + line + '\n');
    }
}

std::string Terminal::emphasised(const std::string& text) const {
    return mLooks.hasColours ? "\x1b[1m" + text + "\x1b[0m" : text;
}

}  // namespace report
