#pragma once

#include <string>
#include <utility>
#include <vector>

#include "report/Table.h"

namespace report {

/**
 * A part of what a person reads, laid out: the summary prints it, the page writes it. Texts are
 * English, or made by `safe`. What it has stands in the order of its members.
 */
struct Section {
    struct List {
        std::string title;  // may be empty
        std::vector<std::string> items;
    };

    struct ShownTable {
        Table table;
        std::string kind;     // on a page, tables of one kind are sorted alike; lower-case letters
        std::string caption;  // on a page
    };

    std::string heading;
    std::vector<std::string> lines;  // sentences
    std::vector<List> lists;
    std::vector<ShownTable> tables;
    std::vector<std::string> below;  // sentences about the tables
    std::vector<Section> parts;

    /** A table without rows is not shown. */
    void add(Table table, const std::string& kind, const std::string& caption) {
        if (!table.isEmpty()) tables.push_back({std::move(table), kind, caption});
    }

    /** It has a heading only, which promises something: a view says that there is nothing. */
    bool isEmpty() const {
        return lines.empty() && lists.empty() && tables.empty() && below.empty() && parts.empty();
    }
};

}  // namespace report
