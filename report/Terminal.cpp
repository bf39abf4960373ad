#include "report/Terminal.h"

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
