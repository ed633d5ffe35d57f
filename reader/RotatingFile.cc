#include "reader/RotatingFile.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <ctime>
#include <filesystem>
#include <utility>
#include <vector>

#include "recording/files.h"

namespace reader {

namespace {

using Kind = capture::Item::Kind;

constexpr std::uint64_t mostPending = 64UL * 1024;
constexpr std::uint64_t leastRoom = 64UL * 1024;   // octets that a full disk must have again
constexpr std::uint64_t roomAhead = 16UL * 1024;   // octets of room that are asked for ahead, if there are
constexpr std::uint64_t roomForHead = 4UL * 1024;  // octets that a form puts around items, at most
constexpr std::size_t mostEarly = 100;             // items
constexpr std::int64_t lateness = 2;               // seconds by which frames may come late

std::int64_t secondOf(const capture::Item& item) {
    if (item.frame.clock == capture::Clock::absolute)
        return item.frame.time / 1'000'000'000;
    return std::time(nullptr);
}

// Whether the item tells of the recorder and has no time.
bool isWithoutTime(const capture::Item& item) {
    return item.frame.clock == capture::Clock::none &&
           (item.kind == Kind::run || item.kind == Kind::restart || item.kind == Kind::replaced ||
            item.kind == Kind::comment);
}

bool standsForAFrame(const capture::Item& item) {
    return item.kind == Kind::frame || item.kind == Kind::oversized || item.kind == Kind::cut;
}

std::uint64_t sizeOf(int descriptor) {
    struct stat status {};
    return fstat(descriptor, &status) == 0 ? static_cast<std::uint64_t>(status.st_size) : 0;
}

}  // namespace

RotatingFile::RotatingFile(const RotationRules& rules, const std::string& trunk, Chatter& chatter)
    : rules_(rules), chatter_(chatter), trunk_(recording::fileNameOf(trunk)) {}

RotatingFile::~RotatingFile() { finish(); }

// Uses local time, so that a period of a day ends at midnight.
std::int64_t RotatingFile::periodOf(std::int64_t second) const {
    if (rules_.period == 0)
        return 0;
    const std::time_t time = second;
    std::tm local{};
    localtime_r(&time, &local);
    return (second + local.tm_gmtoff) / rules_.period;
}

// A frame that is a little late does not begin a file, because frames of the two directions may come in the
// wrong order.
bool RotatingFile::isAnotherPeriod(std::int64_t second) const {
    return periodOf(second) > period_ || periodOf(second + lateness) < period_;
}

recording::RecordingKind RotatingFile::kind() const {
    return {rules_.folder, trunk_, rules_.mark, std::string(rules_.form->name)};
}

// After a failure: whether the disk has so much room again that a new file would hold more than its head.
bool RotatingFile::hasRoom() const {
    struct statvfs disk {};
    return statvfs(rules_.folder.c_str(), &disk) != 0 || disk.f_bavail * disk.f_frsize >= leastRoom;
}

bool RotatingFile::begin(const capture::Item& item) {
    if (failing_ && (HostClock::now() < retryAt_ || !hasRoom()))
        return false;
    const std::int64_t second = secondOf(item);
    path_ = recording::newRecording(kind(), second);
    const std::string part = path_ + std::string(recording::unfinishedEnding);
    descriptor_ = open(part.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
    if (descriptor_ < 0) {
        fail("cannot write " + part + ": " + std::strerror(errno));
        return false;
    }
    flock(descriptor_, LOCK_EX | LOCK_NB);
    newest_ = path_.substr(rules_.folder.size() + 1);
    ++begun_;
    isNewestGone_ = false;
    period_ = periodOf(second);
    size_ = 0;
    reserved_ = 0;
    try {
        writer_ = rules_.form->makeWriter(descriptor_, part);
        writeLoss(item);
        for (const HeldItem& held : early_)
            writer_->write(held.item());
        early_.clear();
    } catch (const capture::WriteError& error) {
        fail(error.what());
        return false;
    }
    return true;
}

// Begins a new file with the number of frames that are missing before it. Until the file is flushed, that
// number may be lost with the file.
void RotatingFile::writeLoss(const capture::Item& item) {
    if (lost_ == 0)
        return;
    capture::Item loss = item;
    loss.kind = Kind::lost;
    loss.frame.octets = {};
    loss.count = lost_;
    loss.text = {};
    writer_->write(loss);
    telling_ = lost_;
}

void RotatingFile::sayWritingWorks() {
    if (failing_)
        chatter_.error(trunk_ + ": writing works again; frames lost: " + std::to_string(unsaid_));
    failing_ = false;
    unsaid_ = 0;
}

void RotatingFile::write(const capture::Item& item) {
    const std::uint64_t frames = standsForAFrame(item) ? 1 : 0;
    if (isWithoutTime(item)) {
        if (writer_ == nullptr && early_.size() < mostEarly) {
            early_.emplace_back(item);
            return;
        }
    } else {
        newestSecond_ = secondOf(item);
        if (writer_ != nullptr && isAnotherPeriod(newestSecond_))
            finish();
    }
    if (writer_ == nullptr && !begin(item)) {
        lose(frames);
        return;
    }
    pendingFrames_ += frames;
    pending_ += item.frame.octets.size() + item.text.size() + 64;
    try {
        writer_->write(item);
    } catch (const capture::WriteError& error) {
        fail(error.what());
        return;
    }
    if (pending_ >= std::min(mostPending, rules_.size == 0 ? mostPending : rules_.size / 8 + 1))
        flush();
}

void RotatingFile::flush() {
    if (writer_ == nullptr)
        return;
    try {
        reserve();
        writer_->flush();
    } catch (const capture::WriteError& error) {
        fail(error.what());
        return;
    }
    size_ = sizeOf(descriptor_);
    haveWritten();
    if (size_ > 0)
        sayWritingWorks();
    const bool isFull = rules_.size != 0 && size_ >= rules_.size;
    if (isFull)
        finish();
}

void RotatingFile::finish() {
    if (writer_ == nullptr)
        return;
    try {
        reserve();
        writer_->finish();
        recording::giveRoomBack(descriptor_);
        synchronise();
    } catch (const capture::WriteError& error) {
        fail(error.what());
        return;
    }
    haveWritten();
    closeFile();
    nameFinished();
    sayWritingWorks();
}

// Sees to it that the disk has room for what waits, or fails before any of it is written. Otherwise a reader
// that follows the file could read frames which are cut off again.
void RotatingFile::reserve() {
    const std::uint64_t needed = pending_ == 0 ? 0 : size_ + 2 * pending_ + roomForHead;
    if (needed <= reserved_ || isReservedTo(needed + roomAhead) || isReservedTo(needed))
        return;
    throw capture::WriteError(path_ + ": " + std::strerror(ENOSPC), ENOSPC);
}

// Returns false if the disk is full. On a file system that cannot reserve room, the file counts as reserved.
bool RotatingFile::isReservedTo(std::uint64_t end) {
    const auto from = static_cast<off_t>(size_);
    while (fallocate(descriptor_, FALLOC_FL_KEEP_SIZE, from, static_cast<off_t>(end) - from) != 0) {
        if (errno == ENOSPC || errno == EDQUOT)
            return false;
        if (errno != EINTR)
            break;
    }
    reserved_ = end;
    return true;
}

void RotatingFile::haveWritten() {
    pending_ = 0;
    pendingFrames_ = 0;
    lost_ -= std::exchange(telling_, 0);
}

// Makes the system write the file to the disk, so that it survives a power failure.
void RotatingFile::synchronise() const {
    constexpr int cannot = EINVAL;  // the error of a file that is not on a disk
    if (fdatasync(descriptor_) != 0 && errno != cannot)
        throw capture::WriteError(path_ + ": " + std::strerror(errno), errno);
}

void RotatingFile::passTime(std::int64_t second) {
    if (rules_.period != 0 && periodOf(second - lateness) > period_)
        finish();
}

// Cuts the file back to what is safely in it, and counts the rest as lost. Another file is tried after a
// while. The cut comes first, because somebody may be reading what will not stay.
void RotatingFile::fail(const std::string& why) {
    const bool isCut = descriptor_ >= 0 && ftruncate(descriptor_, static_cast<off_t>(size_)) == 0;
    lose(pendingFrames_);
    pending_ = 0;
    pendingFrames_ = 0;
    telling_ = 0;
    if (!failing_)
        chatter_.error(why + "; recording goes on when that works again");
    failing_ = true;
    retryAt_ = HostClock::now() + betweenAttempts_;
    if (descriptor_ < 0)
        return;
    closeFile();
    isNewestGone_ = size_ == 0;
    if (isNewestGone_)
        unlink((path_ + std::string(recording::unfinishedEnding)).c_str());
    else if (isCut)
        nameFinished();
}

void RotatingFile::closeFile() {
    writer_.reset();
    close(descriptor_);
    descriptor_ = -1;
}

void RotatingFile::nameFinished() {
    const std::string part = path_ + std::string(recording::unfinishedEnding);
    if (rename(part.c_str(), path_.c_str()) != 0) {
        chatter_.error("cannot rename " + part + ": " + std::strerror(errno));
        return;
    }
    chatter_.detail("finished " + path_);
    removeOldest();
}

// Removes the oldest files. A file is as old as the beginning of the next one.
void RotatingFile::removeOldest() const {
    const std::vector<recording::Recording> finished = recording::finishedRecordings(kind());
    for (std::size_t i = 0; i < finished.size(); ++i) {
        const bool isBeyondNumber = rules_.kept != 0 && i + rules_.kept < finished.size();
        const bool isBeyondSpan = rules_.span != 0 && i + 1 < finished.size() &&
                                  finished[i + 1].start <= newestSecond_ - rules_.span;
        if (!isBeyondNumber && !isBeyondSpan)
            return;
        std::error_code ignored;
        const std::string path = rules_.folder + "/" + finished[i].name;
        if (std::filesystem::remove(path, ignored))
            chatter_.detail("removed " + path);
    }
}

}  // namespace reader
