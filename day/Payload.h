#pragma once

#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "trace/Words.h"

namespace day {

/** An entry of a list: its keys and values, in the payload's order. */
using Entry = std::vector<std::pair<std::string, std::string>>;

/** One value of a payload. */
struct Field {
    std::string key;
    std::string text;            // as the payload has it
    std::vector<Entry> entries;  // of a list, or of an object (one entry); empty: plain text
    bool isList = false;
};

/** A payload taken apart. */
struct Payload {
    trace::EventKind kind = trace::EventKind::kUnknown;
    std::vector<Field> fields;  // in the payload's order of keys
};

/**
 * Takes the payload of the event `id` apart. Values are not escaped in a payload, and an app's name
 * may hold ":" and "&": what is known of the event's keys decides where a name ends.
 */
Payload takeApart(std::string_view id, std::string_view payload);

/** The value of the key, empty if there is none. */
std::string_view valueOf(const Entry& entry, std::string_view key);

}  // namespace day
