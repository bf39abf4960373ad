#include "replay/InputFile.h"

#include <cerrno>
#include <cstring>
#include <utility>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "base/Result.h"
#include "capture/text/TextSource.h"
#include "trace/TraceLine.h"

namespace replay {

bool InputFile::isCapture() const {
    return first && first->find_first_not_of(" \t") != first->find('{');
}

std::optional<base::Failure> open(const std::string& name, size_t inputs, InputFile* file) {
    const int fd = name == "-" ? dup(STDIN_FILENO) : ::open(name.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) return base::Failure{name + ": cannot open: " + std::strerror(errno)};
    auto opened = capture::openText(fd);
    if (!opened) return base::Failure{name + ": " + opened.error().text, opened.error().status};
    file->name = name;
    file->lines = std::make_unique<base::LineReader>(std::move(opened->text));
    bool isEmpty = name != "/dev/null" || inputs == 1;
    while ((file->first = file->lines->next()) && trace::isSkipped(*file->first)) {
        isEmpty &= file->first->find('#') == std::string_view::npos;
    }
    if (file->lines->error()) {
        return base::Failure{base::at(name, file->lines->lineNumber()) + *file->lines->error()};
    }
    if (!file->first && isEmpty) {
        return base::Failure{name + ": empty: adb leaves such a file when it finds no device"};
    }
    if (file->first && !opened->isPlain && !file->isCapture()) {
        return base::Failure{name + ": a trace must be plain UTF-8, not packed or UTF-16"};
    }
    return std::nullopt;
}

bool isSurelyCapture(const std::string& name) {
    struct stat info {};
    if (name == "-" || stat(name.c_str(), &info) != 0 || !S_ISREG(info.st_mode)) return false;
    const int fd = ::open(name.c_str(), O_RDONLY | O_CLOEXEC);
    char bytes[4096];
    const ssize_t count = fd < 0 ? 0 : read(fd, bytes, sizeof(bytes));
    if (fd >= 0) close(fd);
    if (count <= 0) return false;
    const std::string_view text(bytes, static_cast<size_t>(count));
    const size_t first = text.find_first_not_of(" \t\r\n\xEF\xBB\xBF");
    return first != std::string_view::npos && text[first] != '{' && text[first] != '#';
}

}  // namespace replay
