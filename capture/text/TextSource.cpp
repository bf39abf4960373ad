#include "capture/text/TextSource.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <string>
#include <utility>

#include <unistd.h>

#include "base/FileIo.h"
#include "capture/text/Block.h"
#include "capture/text/GzipSource.h"
#include "capture/text/PeekedSource.h"
#include "capture/text/Utf16Source.h"
#include "capture/text/ZipSource.h"

namespace capture {

namespace {

using Source = std::unique_ptr<base::ByteSource>;

constexpr int kMostPackings = 2;  // a zip or gzip in another

/** A temporary file without a name that holds all of `source`. */
base::Result<int> spool(base::ByteSource* source) {
    FILE* const file = std::tmpfile();
    const int fd = file != nullptr ? dup(fileno(file)) : -1;
    if (file != nullptr) std::fclose(file);
    char block[kBlock];
    ssize_t count = 0;
    bool isKept = fd >= 0;
    while (isKept && (count = source->read(block, sizeof(block))) > 0) {
        isKept = base::writeAll(fd, block, static_cast<size_t>(count));
    }
    if (isKept && count == 0) return fd;
    const auto failure = isKept ? base::fail(source->error())
                                : base::fail(std::string("cannot make a temporary file: ") +
                                                     std::strerror(errno),
                                             base::kStatusFailed);
    if (fd >= 0) close(fd);
    return failure;
}

base::Result<Source> openZip(base::ByteSource* packed) {
    return spool(packed).and_then(ZipSource::open);
}

}  // namespace

base::Result<OpenedText> openText(int fd) {
    const bool canSeek = lseek(fd, 0, SEEK_CUR) >= 0;
    Source source = std::make_unique<base::FileSource>(fd);
    for (int packings = 0;; ++packings) {
        auto peeked = std::make_unique<PeekedSource>(std::move(source));
        const std::string start(peeked->start());
        const bool isZip = start == "PK";
        if (!isZip && start != "\x1F\x8B") {
            if (!Utf16Source::isMark(start)) return OpenedText{std::move(peeked), packings == 0};
            return OpenedText{std::make_unique<Utf16Source>(std::move(peeked)), false};
        }
        if (packings == kMostPackings) {
            return base::fail("packed too often: only a zip or gzip in another is opened");
        }
        if (!isZip) {
            source = std::make_unique<GzipSource>(std::move(peeked));
            continue;
        }
        auto zip = packings == 0 && canSeek ? ZipSource::open(dup(fd)) : openZip(peeked.get());
        if (!zip) return tl::unexpected(zip.error());
        source = std::move(*zip);
    }
}

}  // namespace capture
