#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "day/Spans.h"
#include "report/Section.h"

/**
 * What the page shows, in the page's order. Whoever fills it in has decided everything but the
 * looks. Each text is data from outside or English; none is markup. Times are nanoseconds since the
 * midnight of the day in which they stand, unless something else is said.
 */
namespace report::page {

using day::Span;

struct Column {
    enum class Kind {
        kName,  // says what the row is: an app, a sensor; a filter looks here
        kText,
        kNumber,
    };

    std::string title;
    std::string key;  // by which the page's address names it: lower-case letters
    Kind kind = Kind::kText;
};

struct Cell {
    std::string text;
    std::optional<double> value = {};  // by which it is sorted; nothing: by its text
};

struct Table {
    std::string caption;
    std::string kind;  // tables of one kind are sorted alike; lower-case letters
    std::vector<Column> columns;
    std::vector<std::vector<Cell>> rows;
    std::vector<Cell> total;  // a cell for each column; empty: none
};

/** The part of a use of a sensor that lies within a day. */
struct Use {
    Span span;
    bool isBefore = false;       // it began before `span.from`, unseen
    bool isUnseen = false;       // it ended at `span.to` at the latest, or perhaps in the next day
    bool isOn = false;           // it was on when the capture was taken, or when the trace ended
    std::optional<double> rate;  // samples a second that it costs; nothing: unknown
    std::vector<int64_t> enables;  // of this day
    std::string facts;             // all of the use, in words, but the app and the sensor
};

/** A row of the table of a day, drawn. */
struct Lane {
    std::string app;
    std::string sensor;
    std::vector<Use> uses;  // ordered by their begins
};

/** A state of the device. Of what is neither on nor unknown it is known that it was off. */
struct Band {
    std::vector<Span> on;       // in order, apart from each other
    std::vector<Span> unknown;  // likewise
};

/** Something at a moment. */
struct Mark {
    enum class Kind {
        kReport,  // telemetry
        kAhead,   // telemetry that comes if nothing changes
        kTaken,   // the moment of the capture
    };

    Kind kind;
    int64_t at;
    std::string text;
};

/** A day of one boot. */
struct Day {
    std::string name;
    Band display;
    Band charge;
    std::vector<Span> unseen;  // uses are not known here
    std::vector<Mark> marks;
    std::vector<Lane> lanes;  // lane N is row N of `uses`
    std::optional<Table> uses;
};

/** One input: a trace, a capture, or several merged ones. */
struct Input {
    std::string name;
    std::vector<std::string> lines;     // what it is
    std::vector<std::string> findings;  // worst first
    std::vector<Section> before;        // what stands before the days: what is on
    std::vector<Day> days;
    std::vector<Section> after;  // what stands behind them
    std::string end;             // the last line
};

}  // namespace report::page
