#include "app/LogFile.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <iostream>
#include <string>
#include <utility>

namespace app {

namespace {

constexpr mode_t asTheUmaskSays = 0666;
constexpr int forEver = -1;

bool isRegular(int file) {
    struct stat status {};
    return fstat(file, &status) == 0 && S_ISREG(status.st_mode);
}

void setNonBlocking(int file) { static_cast<void>(fcntl(file, F_SETFL, fcntl(file, F_GETFL) | O_NONBLOCK)); }

}  // namespace

LogFile::~LogFile() {
    close();
    ::close(wakeUp_.exchange(-1));
}

std::FILE* LogFile::open(const char* name) {
    const int file = ::open(name, O_WRONLY | O_CREAT | O_CLOEXEC, asTheUmaskSays);
    if (file < 0)
        return nullptr;
    stream_ = fdopen(file, "w");
    if (stream_ == nullptr || !lockAndEmpty(name)) {
        const int reason = errno;
        if (stream_ == nullptr)
            ::close(file);
        close();
        errno = reason;
        return nullptr;
    }
    setNonBlocking(file);
    if (wakeUp_ < 0)
        wakeUp_ = eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK);
    return stream_;
}

// Returns false, with errno set, when another process has locked the file or it cannot be emptied.
bool LogFile::lockAndEmpty(const char* name) const {
    const int file = fileno(stream_);
    if (!isRegular(file))
        return true;
    if (flock(file, LOCK_EX | LOCK_NB) != 0) {
        if (errno == EWOULDBLOCK)
            return false;
        std::cerr << "lapdmon: cannot lock " + std::string(name) + ": " + std::strerror(errno) +
                         "; make sure that no other trace writes to it\n"
                  << std::flush;
    }
    return ftruncate(file, 0) == 0;
}

std::size_t LogFile::append(std::string_view text) const {
    std::size_t written = 0;
    while (written < text.size()) {
        const ssize_t some = ::write(fileno(stream_), text.data() + written, text.size() - written);
        if (some > 0) {
            written += static_cast<std::size_t>(some);
        } else if (some == 0) {
            errno = ENOSPC;
            break;
        } else if (errno == EAGAIN ? !awaitRoom() : errno != EINTR) {
            break;
        }
    }
    return written;
}

// Waits until the file takes text. Returns false, with errno set, when giveUp was called or waiting fails.
bool LogFile::awaitRoom() const {
    std::array<pollfd, 2> waited{pollfd{fileno(stream_), POLLOUT, 0}, pollfd{wakeUp_, POLLIN, 0}};
    if (!givenUp_)
        static_cast<void>(poll(waited.data(), waited.size(), forEver));
    errno = ECANCELED;
    return !givenUp_;
}

bool LogFile::takeBack(std::size_t octets) const {
    const int file = fileno(stream_);
    if (!isRegular(file))
        return false;
    const off_t end = lseek(file, 0, SEEK_CUR) - static_cast<off_t>(octets);
    return end >= 0 && ftruncate(file, end) == 0 && lseek(file, end, SEEK_SET) == end;
}

bool LogFile::close() { return stream_ == nullptr || std::fclose(std::exchange(stream_, nullptr)) == 0; }

void LogFile::giveUp() {
    givenUp_ = true;
    const std::uint64_t once = 1;
    static_cast<void>(!write(wakeUp_, &once, sizeof once));
}

}  // namespace app
