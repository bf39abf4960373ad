#include "trace/TraceReader.h"

namespace trace {

base::Result<bool> TraceReader::next(TraceLine* line) {
    while (const auto text = mLines->next()) {
        if (isSkipped(*text)) continue;
        auto judged = judge(*text, line);
        mIsTorn = !judged && mAllowsTornEnd && mLines->isLastOpen();
        if (mIsTorn) return false;
        return judged.map([] { return true; });
    }
    if (mLines->error()) return fail(*mLines->error());
    return false;
}

base::Result<void> TraceReader::judge(std::string_view text, TraceLine* line) {
    if (const auto error = mParser.parse(text, mName, line)) return fail(*error);
    return {};
}

}  // namespace trace
