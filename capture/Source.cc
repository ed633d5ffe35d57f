#include "capture/Source.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <utility>

namespace capture {

namespace {

constexpr std::size_t readSize = std::size_t{1} << 18;
constexpr std::size_t lastSize = 64;             // how many octets are kept to recognise another content
constexpr std::chrono::milliseconds glance{20};  // how often a growing file is looked at

[[noreturn]] void fail(const std::string& name) { throw BadInput(name + ": " + std::strerror(errno)); }

// `flags` may say not to wait for the writer of a FIFO.
int open(const std::string& name, int flags = 0) {
    if (name == "-")
        return STDIN_FILENO;
    const int file = ::open(name.c_str(), O_RDONLY | O_CLOEXEC | flags);
    if (file < 0)
        fail(name);
    return file;
}

struct stat statusOf(int file, const std::string& name) {
    struct stat status {};
    if (fstat(file, &status) != 0)
        fail(name);
    return status;
}

}  // namespace

Source::Source(std::string path, bool follow)
    : name_(std::move(path)),
      file_(open(name_, follow ? O_NONBLOCK : 0)),
      follow_(follow),
      capacity_(2 * readSize) {
    const struct stat status = statusOf(file_, name_);
    isRegular_ = S_ISREG(status.st_mode);
    if (follow_ && S_ISFIFO(status.st_mode) && file_ != STDIN_FILENO) {
        ownWriter_ = ::open(name_.c_str(), O_WRONLY | O_NONBLOCK | O_CLOEXEC);
        if (ownWriter_ < 0) {  // its end would come before its first writer
            ::close(file_);
            file_ = open(name_);
        }
    }
    buffer_ = std::make_unique_for_overwrite<char[]>(capacity_);
}

Source::~Source() {
    for (const int file : {file_, ownWriter_}) {
        if (file > STDIN_FILENO)
            ::close(file);
    }
}

Source::State Source::want(std::size_t octets) {
    while (end_ - begin_ < octets) {
        if (ended_ || replaced_)
            return State::end;
        makeRoom(octets);
        if (const State state = readMore(); state != State::ready)
            return state;
    }
    return State::ready;
}

// Makes room for the octets that are wanted, and for a whole read after those that are held.
void Source::makeRoom(std::size_t octets) {
    const std::size_t held = end_ - begin_;
    const std::size_t needed = std::max(octets, held) + readSize + 1;  // and for heldReturn_
    if (capacity_ - begin_ >= needed)
        return;
    if (capacity_ < needed) {
        capacity_ = std::max(needed, 2 * capacity_);
        auto grown = std::make_unique_for_overwrite<char[]>(capacity_);
        std::memcpy(grown.get(), buffer_.get() + begin_, held);
        buffer_ = std::move(grown);
    } else {
        std::memmove(buffer_.get(), buffer_.get() + begin_, held);
    }
    begin_ = 0;
    end_ = held;
}

Source::State Source::readMore() {
    if (!isRegular_ && !isReadable())
        return State::pause;
    if (std::exchange(paused_, false) && isRegular_ && isAnotherContent())
        return foundReplaced();
    const std::size_t from = end_;
    if (std::exchange(heldReturn_, false))
        buffer_[end_++] = '\r';
    const ssize_t some = ::read(file_, buffer_.get() + end_, readSize);
    if (some > 0) {
        end_ += static_cast<std::size_t>(some);
        read_ += static_cast<std::uint64_t>(some);
        if (joinsLineEnds_)
            joinLineEndsFrom(from);
        return State::ready;
    }
    if (some < 0 && errno != EINTR && errno != EAGAIN)
        fail(name_);
    const State state = some == 0 ? atEnd() : State::pause;
    heldReturn_ = state == State::pause && end_ > from;
    if (heldReturn_)
        end_ = from;
    return state;
}

void Source::joinLineEnds() {
    joinsLineEnds_ = true;
    joinLineEndsFrom(begin_);
}

// A carriage return at the end can only be understood when more octets have come.
void Source::joinLineEndsFrom(std::size_t from) {
    std::size_t to = from;
    for (std::size_t at = from; at < end_; ++at) {
        const bool belongsToLineEnd = buffer_[at] == '\r' && at + 1 < end_ && buffer_[at + 1] == '\n';
        if (!belongsToLineEnd)
            buffer_[to++] = buffer_[at];
    }
    heldReturn_ = to > from && buffer_[to - 1] == '\r';
    end_ = heldReturn_ ? to - 1 : to;
}

Source::State Source::atEnd() {
    if (!follow_ || !isRegular_) {
        ended_ = !follow_ || ownWriter_ < 0;
        return ended_ ? State::end : State::pause;
    }
    if (isReplaced())
        return foundReplaced();
    keepLastOctets();
    paused_ = true;
    return State::pause;
}

Source::State Source::foundReplaced() {
    replaced_ = everReplaced_ = true;
    return State::end;
}

bool Source::isReadable() const {
    pollfd input{file_, POLLIN, 0};
    return ::poll(&input, 1, 0) > 0;
}

// Called at the end of the content. If the name leads to no file, it counts as not replaced, because the new
// file may be about to get the name.
bool Source::isReplaced() const {
    const struct stat here = statusOf(file_, name_);
    if (static_cast<std::uint64_t>(here.st_size) < read_)
        return true;
    struct stat named {};
    if (file_ == STDIN_FILENO || ::stat(name_.c_str(), &named) != 0)
        return false;
    // If the old file grew before the new one replaced it, read that part first.
    return (named.st_ino != here.st_ino || named.st_dev != here.st_dev) &&
           static_cast<std::uint64_t>(here.st_size) == read_;
}

bool Source::isAnotherContent() const {
    if (static_cast<std::uint64_t>(statusOf(file_, name_).st_size) < read_)
        return true;
    std::array<char, lastSize> now{};
    const ssize_t size = ::pread(file_, now.data(), last_.size(), static_cast<off_t>(read_ - last_.size()));
    return size != static_cast<ssize_t>(last_.size()) || std::string_view(now.data(), last_.size()) != last_;
}

// Reads the last octets again from the file, because the window may no longer hold them.
void Source::keepLastOctets() {
    std::array<char, lastSize> octets{};
    const std::size_t size = std::min<std::uint64_t>(lastSize, read_);
    const ssize_t some = ::pread(file_, octets.data(), size, static_cast<off_t>(read_ - size));
    last_.assign(octets.data(), some > 0 ? static_cast<std::size_t>(some) : 0);
}

void Source::restart() {
    const int file = open(name_);
    if (file_ > STDIN_FILENO)
        ::close(file_);
    file_ = file;
    if (file_ == STDIN_FILENO)
        static_cast<void>(::lseek(file_, 0, SEEK_SET));
    replaced_ = paused_ = joinsLineEnds_ = heldReturn_ = false;
    begin_ = end_ = 0;
    read_ = 0;
    last_.clear();
}

void Source::wait(std::chrono::milliseconds most) {
    const auto until = std::chrono::steady_clock::now() + most;
    pollfd input{file_, POLLIN, 0};
    if (!isRegular_) {
        ::poll(&input, 1, static_cast<int>(most.count()));
        return;
    }
    const std::uint64_t before = read_;
    while (std::chrono::steady_clock::now() < until) {
        const auto size = static_cast<std::uint64_t>(statusOf(file_, name_).st_size);
        if (size != before || isReplaced())
            return;
        if (::poll(nullptr, 0, static_cast<int>(std::min(glance, most).count())) < 0)
            return;  // a signal
    }
}

Reader::Progress Source::progress() const {
    const std::uint64_t done = read_ - (end_ - begin_);
    if (!isRegular_)
        return {done};
    struct stat status {};
    return {done, fstat(file_, &status) == 0 ? static_cast<std::uint64_t>(status.st_size) : 0, everReplaced_};
}

}  // namespace capture
