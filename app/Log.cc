#include "app/Log.h"

#include <cerrno>
#include <cstring>
#include <iostream>
#include <utility>

namespace app {

Log traceLog;

Log::~Log() { close(); }

std::FILE* Log::open(const char* name) {
    name_ = name;
    lastWrite_ = {};
    return file_.open(name);
}

void Log::write(std::string_view entry) {
    block_.add(entry, std::exchange(isFrame_, false));
    if (block_.text().size() >= blockSize)
        writeOut();
}

void Log::framesMissing(unsigned long frames) { block_.addGap(frames); }

// Whether there is text to write. If there is only the rest of an entry, it waits until more text comes,
// because the file has just refused it.
bool Log::holdsSomethingNew() const { return !block_.entries().empty() && !block_.holdsOnlyARest(); }

void Log::flush() {
    if (file_.isOpen() && holdsSomethingNew())
        writeOut();
}

void Log::flushIfDue() {
    if (holdsSomethingNew() && std::chrono::steady_clock::now() - lastWrite_ >= dueAfter)
        flush();
}

void Log::writeOut() {
    const bool behindGap = gap_ != 0;
    if (behindGap)
        block_.putGapFirst(std::exchange(gap_, 0));
    if (const std::size_t written = file_.append(block_.text()); written == block_.text().size()) {
        block_.clear();
    } else {
        complain(errno);
        const LogLoss loss = repair(file_, block_, written, behindGap);
        lost_ += loss.frames;
        gap_ = loss.frames + loss.missing;
    }
    lastWrite_ = std::chrono::steady_clock::now();
}

void Log::complain(int reason) {
    if (!std::exchange(complete_, false))
        return;
    const std::string why = reason == ECANCELED ? "given up, since nobody reads it" : std::strerror(reason);
    std::cerr << name_ + ": " + why + "\n" << std::flush;
}

void Log::close() {
    if (!file_.isOpen())
        return;
    if (!block_.entries().empty())
        writeOut();
    if (block_.holdsOnlyARest() && block_.entries().front().isFrame)
        ++lost_;
    block_.clear();
    if (!file_.close())
        complain(errno);
    if (!complete_)
        std::cerr << name_ + ": frames lost: " + std::to_string(lost_) + "\n" << std::flush;
}

}  // namespace app
