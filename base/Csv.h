#pragma once

#include <string>
#include <string_view>
#include <type_traits>

namespace base {

/**
 * Writes tables as RFC 4180 has them: commas between fields, CRLF behind rows. A field with a
 * comma, a quote or a line end stands in quotes. The caller gives each row as many fields as the
 * header.
 */
class CsvWriter {
public:
    explicit CsvWriter(std::string* out) : mOut(*out) {}

    /** Appends a field of the row: a text, or a whole number. An empty text is an unknown value. */
    template <typename T>
    CsvWriter& field(const T& value) {
        if (mFollows) mOut += ',';
        mFollows = true;
        if constexpr (std::is_integral_v<T>) {
            mOut += std::to_string(value);
        } else {
            append(value);
        }
        return *this;
    }

    void endRow() {
        mOut += "\r\n";
        mFollows = false;
    }

private:
    void append(std::string_view text) {
        if (text.find_first_of(",\"\r\n") == std::string_view::npos) {
            mOut += text;
            return;
        }
        mOut += '"';
        for (const char c : text) {
            if (c == '"') mOut += '"';
            mOut += c;
        }
        mOut += '"';
    }

    std::string& mOut;
    bool mFollows = false;  // a field of the row stands before
};

}  // namespace base
