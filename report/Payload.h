#pragma once

#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace report {

/** An entry of a list: its keys and values, in the payload's order. */
using Entry = std::vector<std::pair<std::string, std::string>>;

/** One value of a payload. */
struct Field {
    std::string key;
    std::string text;            // as the payload has it
    std::vector<Entry> entries;  // of a list, or of an object (one entry); empty: plain text
    bool isList = false;
};

/** A payload taken apart, in its own order of keys. */
using Fields = std::vector<Field>;

/**
 * Takes the payload of the event `id` apart. Values are not escaped in a payload, and an app's name
 * may hold ":" and "&": what is known of the event's keys decides where a name ends.
 */
Fields takeApart(std::string_view id, std::string_view payload);

/** `fields` as a JSON object. Lists are arrays of objects; all other values are texts. */
std::string toJson(const Fields& fields);

/** The event in words, as "screen samples of the day"; empty for an unknown one. */
std::string_view describeEvent(std::string_view id, const Fields& fields);

/** The meaning of a key of the event, in words; the key itself if it is unknown. */
std::string_view describeKey(std::string_view id, std::string_view key);

/** The value of the key, empty if there is none. */
std::string_view valueOf(const Entry& entry, std::string_view key);
const Field* find(const Fields& fields, std::string_view key);

}  // namespace report
