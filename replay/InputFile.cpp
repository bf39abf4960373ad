#include "replay/InputFile.h"

#include <cerrno>
#include <cstring>

#include <fcntl.h>
#include <unistd.h>

#include "trace/TraceLine.h"

namespace replay {

bool InputFile::isCapture() const {
    return first && first->find_first_not_of(" \t") != first->find('{');
}

std::optional<trace::Failure> open(const std::string& name, InputFile* file) {
    const int fd = name == "-" ? dup(STDIN_FILENO) : ::open(name.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) return trace::Failure{name + ": cannot open: " + std::strerror(errno)};
    file->name = name;
    file->lines = std::make_unique<trace::LineReader>(fd);
    do {
        file->first = file->lines->next();
    } while (file->first && trace::isSkipped(*file->first));
    if (!file->lines->error()) return std::nullopt;
    return trace::Failure{trace::at(name, file->lines->lineNumber()) + *file->lines->error()};
}

}  // namespace replay
