#include "reader/Output.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <utility>

#include "reader/errors.h"
#include "recording/files.h"

namespace reader {

namespace {

int openForWriting(const std::string& path) {
    const int descriptor = open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (descriptor < 0)
        throw FileError("cannot write " + path + ": " + std::strerror(errno));
    return descriptor;
}

}  // namespace

Output::Output() : Output(STDOUT_FILENO, "standard output") {}

Output::Output(int descriptor, std::string name)
    : descriptor_(descriptor), ours_(false), terminal_(isatty(descriptor) == 1), name_(std::move(name)) {}

Output::Output(const std::string& path)
    : descriptor_(openForWriting(path)), ours_(true), terminal_(isatty(descriptor_) == 1), name_(path) {}

Output::~Output() {
    if (ours_)
        close(descriptor_);
}

void Output::flush() {
    if (buffer_.empty())
        return;
    try {
        writeThrough(buffer_);
    } catch (...) {
        buffer_.clear();  // text that could not be written is not tried again
        throw;
    }
    buffer_.clear();
}

void Output::writeThrough(std::string_view text) {
    const int error = recording::writeAll(descriptor_, text);
    if (error == EPIPE)
        throw ReaderGone();
    if (error != 0)
        throw FileError("cannot write " + name_ + ": " + std::strerror(error));
}

}  // namespace reader
