#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <utility>

#include "report/Section.h"
#include "report/Stdout.h"
#include "report/Table.h"

namespace report {

/** How a person gets to see text. */
struct Looks {
    bool showsAll = false;               // all rows of tables, not the first 20
    bool hasColours = false;             // headings are bold
    std::optional<size_t> columns = {};  // of the terminal; without, nothing is cut

    size_t rows() const { return showsAll ? Table::kAllRows : Table::kShownRows; }
};

/** Writes text for a person: as wide as the terminal, if there is one. */
class Terminal {
public:
    Terminal(Stdout* out, const Looks& looks) : mOut(out), mLooks(looks) {}

    void title(const std::string& name);

    /** Behind an empty line. */
    void heading(const std::string& text);
    void table(const Table& table, size_t indent);

    /** With all that stands in it, each step deeper by two blanks. */
    void section(const Section& section, size_t indent = 0);

    /** A name, cut where the terminal ends; a sentence, broken there. */
    void name(const std::string& text, size_t indent);
    void sentence(const std::string& text, size_t indent);

private:
    std::string emphasised(const std::string& text) const;

    Stdout* const mOut;
    const Looks mLooks;
};

}  // namespace report
