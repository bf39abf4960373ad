#include "trace/Record.h"

#include <cstring>

namespace trace {

namespace {

constexpr size_t kFlushSize = size_t{64} << 10;

/** What stands in front of a record's texts. */
struct Header {
    int64_t at;
    int64_t number;
    uint32_t sizes[3];
    int32_t value;
    Record::Kind kind;
};

}  // namespace

void RecordWriter::add(const Record& record) {
    Header header{record.at, record.number, {}, record.value, record.kind};
    for (size_t i = 0; i < record.texts.size(); ++i) {
        header.sizes[i] = static_cast<uint32_t>(record.texts[i].size());
    }
    mGathered.append(reinterpret_cast<const char*>(&header), sizeof(header));
    for (const std::string_view text : record.texts) mGathered.append(text);
    if (mGathered.size() >= kFlushSize) flush();
}

void RecordWriter::flush() {
    mHandOn(mGathered);
    mGathered.clear();
}

void RecordReader::take(const char* bytes, size_t size,
                        const std::function<void(const Record&)>& handOn) {
    mPending.append(bytes, size);
    std::string_view rest = mPending;
    for (Header header; rest.size() >= sizeof(header);) {
        std::memcpy(&header, rest.data(), sizeof(header));
        size_t length = sizeof(header);
        for (const uint32_t textSize : header.sizes) length += textSize;
        if (rest.size() < length) break;
        Record record{header.kind, header.at, {}, header.number, header.value};
        size_t begin = sizeof(header);
        for (size_t i = 0; i < record.texts.size(); ++i) {
            record.texts[i] = rest.substr(begin, header.sizes[i]);
            begin += header.sizes[i];
        }
        handOn(record);
        rest.remove_prefix(length);
    }
    mPending.erase(0, mPending.size() - rest.size());
}

}  // namespace trace
