#include "reader/Output.h"

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <utility>

#include "reader/errors.h"

namespace reader {

namespace {

// A descriptor that does not block (a terminal that another program has left so) is waited for.
void awaitRoom(int descriptor) {
    pollfd room{descriptor, POLLOUT, 0};
    poll(&room, 1, -1);
}

int openForWriting(const std::string& path) {
    const int descriptor = open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (descriptor < 0)
        throw FileError("cannot write " + path + ": " + std::strerror(errno));
    return descriptor;
}

}  // namespace

int writeAll(int descriptor, std::string_view text) {
    while (!text.empty()) {
        const ssize_t written = ::write(descriptor, text.data(), text.size());
        if (written >= 0)
            text.remove_prefix(static_cast<std::size_t>(written));
        else if (errno == EAGAIN)
            awaitRoom(descriptor);
        else if (errno != EINTR)
            return errno;
    }
    return 0;
}

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
        buffer_.clear();  // what cannot be written is not tried again
        throw;
    }
    buffer_.clear();
}

void Output::writeThrough(std::string_view text) {
    const int error = writeAll(descriptor_, text);
    if (error == EPIPE)
        throw ReaderGone();
    if (error != 0)
        throw FileError("cannot write " + name_ + ": " + std::strerror(error));
}

}  // namespace reader
