#include "report/CallReader.h"

#include "trace/LineReader.h"

namespace report {

const trace::Call& CallReader::read(const Record& record) {
    static const trace::Call kNone{};
    const std::string_view line = record.texts[0];
    mText.assign(line).append(trace::LineReader::kPadding, '\0');
    // The line has been judged before the call was made; a call needs no file beside the trace.
    mParser.parse({mText.data(), line.size()}, "", &mLine);
    const auto* call = std::get_if<trace::Call>(&mLine.action);
    return call == nullptr ? kNone : *call;
}

}  // namespace report
