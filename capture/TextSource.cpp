#include "capture/TextSource.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <utility>

#include <unistd.h>

#include "capture/GzipSource.h"
#include "capture/PeekedSource.h"
#include "capture/Utf16Source.h"
#include "capture/ZipSource.h"
#include "trace/FileIo.h"

namespace capture {

namespace {

using Source = std::unique_ptr<trace::ByteSource>;

constexpr size_t kBlock = size_t{64} << 10;

OpenedText failed(std::string error) {
    OpenedText opened;
    opened.error = std::move(error);
    return opened;
}

OpenedText openZip(int fd) {
    auto zip = std::make_unique<ZipSource>(fd);
    if (!zip->error().empty()) return failed(zip->error());
    OpenedText opened;
    opened.text = std::move(zip);
    return opened;
}

OpenedText openZip(trace::ByteSource* packed) {
    std::string error;
    const int fd = spool(packed, &error);
    return fd < 0 ? failed(error) : openZip(fd);
}

/** Without the packing by which `opened` begins, if there is one. */
OpenedText unpacked(OpenedText opened) {
    auto peeked = std::make_unique<PeekedSource>(std::move(opened.text));
    const std::string start(peeked->start());
    if (start == "\x1F\x8B") {
        opened.text = std::make_unique<GzipSource>(std::move(peeked));
        opened.isPlain = false;
        return unpacked(std::move(opened));
    }
    if (Utf16Source::isMark(start)) {
        opened.text = std::make_unique<Utf16Source>(std::move(peeked));
        opened.isPlain = false;
    } else {
        opened.text = std::move(peeked);
    }
    return opened;
}

}  // namespace

OpenedText openText(int fd) {
    auto file = std::make_unique<PeekedSource>(std::make_unique<trace::FileSource>(fd));
    const bool isZip = file->start() == "PK";
    OpenedText opened;
    if (!isZip) {
        opened.text = std::move(file);
        return unpacked(std::move(opened));
    }
    opened = lseek(fd, 0, SEEK_CUR) >= 0 ? openZip(dup(fd)) : openZip(file.get());
    if (!opened.error.empty()) return opened;
    opened.isPlain = false;
    return unpacked(std::move(opened));
}

int spool(trace::ByteSource* source, std::string* error) {
    FILE* const file = std::tmpfile();
    const int fd = file != nullptr ? dup(fileno(file)) : -1;
    if (file != nullptr) std::fclose(file);
    char block[kBlock];
    ssize_t count = 0;
    bool isKept = fd >= 0;
    while (isKept && (count = source->read(block, sizeof(block))) > 0) {
        isKept = trace::writeAll(fd, block, static_cast<size_t>(count));
    }
    if (!isKept) *error = std::string("cannot make a temporary file: ") + std::strerror(errno);
    if (count < 0) *error = source->error();
    if (isKept && count == 0 && lseek(fd, 0, SEEK_SET) == 0) return fd;
    if (fd >= 0) close(fd);
    return -1;
}

}  // namespace capture
