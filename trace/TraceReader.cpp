#include "trace/TraceReader.h"

namespace trace {

bool TraceReader::next(TraceLine* line, std::optional<Failure>* failure) {
    while (const auto text = mLines->next()) {
        if (!isSkipped(*text)) return judge(*text, line, failure);
    }
    return mLines->error() ? fail(*mLines->error(), failure) : false;
}

bool TraceReader::judge(std::string_view text, TraceLine* line, std::optional<Failure>* failure) {
    mText = text;
    if (const auto error = mParser.parse(text, mName, line)) return fail(*error, failure);
    return true;
}

bool TraceReader::fail(const std::string& what, std::optional<Failure>* failure) const {
    *failure = Failure{at(mName, lineNumber()) + what};
    return false;
}

}  // namespace trace
