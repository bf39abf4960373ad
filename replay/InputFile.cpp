#include "replay/InputFile.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <utility>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "capture/CaptureImport.h"
#include "capture/text/TextSource.h"
#include "trace/TraceLine.h"

namespace replay {

bool InputFile::isCapture() const {
    return first && first->find_first_not_of(" \t") != first->find('{');
}

base::Result<InputFile> open(const std::string& name, size_t inputs) {
    const int fd = name == "-" ? dup(STDIN_FILENO) : ::open(name.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) return base::fail(name + ": cannot open: " + std::strerror(errno));
    auto opened = capture::openText(fd);
    if (!opened) return base::fail(name + ": " + opened.error().text, opened.error().status);
    InputFile file{name, std::make_unique<base::LineReader>(std::move(opened->text)), {}};
    bool isEmpty = name != "/dev/null" || inputs == 1;
    while ((file.first = file.lines->next()) && trace::isSkipped(*file.first)) {
        isEmpty &= file.first->find('#') == std::string_view::npos;
    }
    if (file.lines->error()) {
        return base::fail(base::at(name, file.lines->lineNumber()) + *file.lines->error());
    }
    if (!file.first && isEmpty) {
        return base::fail(name + ": empty: adb leaves such a file when it finds no device");
    }
    if (file.first && !opened->isPlain && !file.isCapture()) {
        return base::fail(name + ": a trace must be plain UTF-8, not packed or UTF-16");
    }
    return file;
}

base::Result<capture::ImportedCapture> importCaptures(const std::vector<std::string>& names,
                                                      size_t inputs) {
    capture::CaptureImport import;
    for (const std::string& name : names) {
        const auto file = open(name, inputs);
        if (!file) return tl::unexpected(file.error());
        if (!file->isCapture()) return base::fail(name + ": not a device capture");
        import.add(name, *file->first, file->lines.get());
    }
    return import.finish();
}

bool isSurelyCapture(const std::string& name) {
    struct stat info {};
    if (name == "-" || stat(name.c_str(), &info) != 0 || !S_ISREG(info.st_mode)) return false;
    const int fd = ::open(name.c_str(), O_RDONLY | O_CLOEXEC);
    char bytes[4096];
    const ssize_t count = fd < 0 ? 0 : read(fd, bytes, sizeof(bytes));
    if (fd >= 0) close(fd);
    auto text = base::withoutMark({bytes, static_cast<size_t>(std::max<ssize_t>(count, 0))});
    while (trace::isSkipped(text.substr(0, text.find('\n')))) {
        if (text.find('\n') == std::string_view::npos) return false;
        text.remove_prefix(text.find('\n') + 1);
    }
    return text[text.find_first_not_of(" \t\r")] != '{';
}

}  // namespace replay
