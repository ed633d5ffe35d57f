#include "app/Log.h"

#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <iostream>
#include <iterator>
#include <utility>

namespace app {

Log traceLog;

namespace {

// Octets written; fewer than there are, with errno, when a write failed.
std::size_t writeAll(int file, std::string_view text) {
    std::size_t written = 0;
    while (written < text.size()) {
        const ssize_t some = ::write(file, text.data() + written, text.size() - written);
        if (some > 0) {
            written += static_cast<std::size_t>(some);
        } else if (some < 0 && errno == EAGAIN) {
            pollfd room{file, POLLOUT, 0};
            poll(&room, 1, -1);
        } else if (some == 0 || errno != EINTR) {
            errno = some == 0 ? ENOSPC : errno;
            break;
        }
    }
    return written;
}

std::string gapLine(unsigned long frames) { return "Frames Lost: " + std::to_string(frames) + " \n"; }

}  // namespace

Log::~Log() { close(); }

std::FILE* Log::open(const char* name) {
    name_ = name;
    stream_ = std::fopen(name, "w");
    return stream_;
}

void Log::write(std::string_view text) {
    held_ += text;
    if (writesOfFrame_ > 1) {
        --writesOfFrame_;
        return;
    }
    endEntry();
    if (held_.size() >= BlockSize)
        writeOut();
}

void Log::framesMissing(unsigned long frames) {
    held_ += gapLine(frames);
    entries_.push_back({.end = held_.size(), .missing = frames});
}

void Log::endEntry() {
    entries_.push_back({.end = held_.size(), .isFrame = std::exchange(writesOfFrame_, 0) != 0});
}

// Puts before what is held what has to come first. Returns its length.
std::size_t Log::putHead() {
    std::string head = std::exchange(rest_, {});
    std::vector<Entry> first;
    if (!head.empty())
        first.push_back({.end = head.size(), .isFrame = restIsFrame_, .isBegun = true});
    if (gap_ != 0) {
        head += gapLine(gap_);
        first.push_back({.end = head.size()});
    }
    held_.insert(0, head);
    for (Entry& entry : entries_)
        entry.end += head.size();
    entries_.insert(entries_.begin(), first.begin(), first.end());
    return head.size();
}

void Log::writeOut() {
    const std::size_t headSize = putHead();
    const std::size_t written = writeAll(fileno(stream_), held_);
    if (written < held_.size())
        writeFailed(headSize, written, errno);
    else
        gap_ = 0;
    held_.clear();
    entries_.clear();
}

void Log::writeFailed(std::size_t headSize, std::size_t written, int reason) {
    complain(reason);
    // What squeezes in behind a gap, before a disk is full again, is not worth a line that says how much.
    const bool again = gap_ != 0 && takeBack(written);
    const std::size_t kept = again ? 0 : settle(written);
    if (kept >= headSize)
        gap_ = 0;
    countLost(kept);
}

// Leaves whole entries in the file: takes back what is there of the entry in which a write has ended, or
// keeps what is missing of it for later. Returns how much of what is held is in the file or will be.
std::size_t Log::settle(std::size_t written) {
    const auto cut = std::find_if(entries_.begin(), entries_.end(),
                                  [written](const Entry& entry) { return written <= entry.end; });
    if (written == cut->end)
        return written;
    const std::size_t begin = cut == entries_.begin() ? 0 : std::prev(cut)->end;
    if (!cut->isBegun && (written == begin || takeBack(written - begin)))
        return begin;
    rest_ = held_.substr(written, cut->end - written);
    restIsFrame_ = cut->isFrame;
    return cut->end;
}

// Shortens the file, if it is one that can be.
bool Log::takeBack(std::size_t octets) const {
    const int file = fileno(stream_);
    struct stat status {};
    if (fstat(file, &status) != 0 || !S_ISREG(status.st_mode))
        return false;
    const off_t end = lseek(file, 0, SEEK_CUR) - static_cast<off_t>(octets);
    return end >= 0 && ftruncate(file, end) == 0 && lseek(file, end, SEEK_SET) == end;
}

void Log::countLost(std::size_t kept) {
    for (const Entry& entry : entries_) {
        if (entry.end <= kept)
            continue;
        lost_ += entry.isFrame ? 1 : 0;
        gap_ += entry.isFrame ? 1 : entry.missing;
    }
}

void Log::complain(int reason) {
    if (std::exchange(complete_, false))
        std::cerr << name_ + ": " + std::strerror(reason) + "\n" << std::flush;
}

void Log::close() {
    if (stream_ == nullptr)
        return;
    if (held_.size() > (entries_.empty() ? 0 : entries_.back().end))
        endEntry();  // a frame whose writes do not come any more
    if (!held_.empty() || !rest_.empty())
        writeOut();
    if (!rest_.empty() && restIsFrame_)
        ++lost_;
    if (std::fclose(std::exchange(stream_, nullptr)) != 0)
        complain(errno);
    if (!complete_)
        std::cerr << name_ + ": frames lost: " + std::to_string(lost_) + "\n" << std::flush;
}

}  // namespace app
