#include "reader/RotatingFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <ctime>
#include <filesystem>
#include <optional>
#include <regex>
#include <vector>

namespace reader {

namespace {

using Kind = capture::Item::Kind;

constexpr std::uint64_t mostPending = 64UL * 1024;
constexpr char unfinished[] = ".part";

std::int64_t secondOf(const capture::Item& item) {
    if (item.frame.clock == capture::Clock::absolute)
        return item.frame.time / 1'000'000'000;
    return std::time(nullptr);
}

bool standsForAFrame(const capture::Item& item) {
    return item.kind == Kind::frame || item.kind == Kind::oversized || item.kind == Kind::cut;
}

std::uint64_t sizeOf(int descriptor) {
    struct stat status {};
    return fstat(descriptor, &status) == 0 ? static_cast<std::uint64_t>(status.st_size) : 0;
}

}  // namespace

std::string fileNameOf(const std::string& trunk) {
    std::string name = trunk.empty() ? "trunk" : trunk;
    for (char& character : name) {
        const bool isSafe =
            (character >= '0' && character <= '9') || (character >= 'a' && character <= 'z') ||
            (character >= 'A' && character <= 'Z') || std::strchr("-_+@=.", character) != nullptr;
        if (!isSafe || character == '\0')
            character = '_';
    }
    if (name.front() == '.')
        name.front() = '_';
    return name;
}

RotatingFile::RotatingFile(const RotationRules& rules, const std::string& trunk, Chatter& chatter)
    : rules_(rules), chatter_(chatter), trunk_(fileNameOf(trunk)) {}

RotatingFile::~RotatingFile() { finish(); }

// Local time, so that a period of a day ends at midnight.
std::int64_t RotatingFile::periodOf(std::int64_t second) const {
    if (rules_.period == 0)
        return 0;
    const std::time_t time = second;
    std::tm local{};
    localtime_r(&time, &local);
    return (second + local.tm_gmtoff) / rules_.period;
}

// Files that begin within one second are told apart by a number.
std::string RotatingFile::pathOf(std::int64_t second) const {
    const std::time_t time = second;
    std::tm utc{};
    gmtime_r(&time, &utc);
    char start[40];
    start[std::strftime(start, sizeof start, "%Y%m%dT%H%M%SZ", &utc)] = '\0';
    const std::string beginning = rules_.folder + "/" + trunk_ + "." + start;
    const std::string end = "." + std::string(rules_.form->name);
    std::string path = beginning + end;
    for (int i = 2; std::filesystem::exists(path) || std::filesystem::exists(path + unfinished); ++i) {
        path = beginning;
        ((path += '.') += std::to_string(i)) += end;
    }
    return path;
}

bool RotatingFile::begin(const capture::Item& item) {
    if (failing_ && HostClock::now() < retryAt_)
        return false;
    const std::int64_t second = secondOf(item);
    path_ = pathOf(second);
    const std::string part = path_ + unfinished;
    descriptor_ = open(part.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
    if (descriptor_ < 0) {
        fail("cannot write " + part + ": " + std::strerror(errno));
        return false;
    }
    period_ = periodOf(second);
    size_ = 0;
    try {
        writer_ = rules_.form->makeWriter(descriptor_, part);
        writeLoss(item);
    } catch (const capture::WriteError& error) {
        fail(error.what());
        return false;
    }
    return true;
}

// A new file begins with what is missing before it.
void RotatingFile::writeLoss(const capture::Item& item) {
    if (lost_ == 0)
        return;
    capture::Item loss = item;
    loss.kind = Kind::lost;
    loss.frame.octets = {};
    loss.count = lost_;
    loss.text = {};
    writer_->write(loss);
    writer_->flush();
    size_ = sizeOf(descriptor_);
    chatter_.error(trunk_ + ": writing works again; frames lost: " + std::to_string(lost_));
    lost_ = 0;
}

void RotatingFile::write(const capture::Item& item) {
    const std::uint64_t frames = standsForAFrame(item) ? 1 : 0;
    if (writer_ != nullptr && periodOf(secondOf(item)) != period_)
        finish();
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
        writer_->flush();
    } catch (const capture::WriteError& error) {
        fail(error.what());
        return;
    }
    size_ = sizeOf(descriptor_);
    pending_ = 0;
    pendingFrames_ = 0;
    failing_ = false;
    const bool isFull = rules_.size != 0 && size_ >= rules_.size;
    if (isFull)
        finish();
}

void RotatingFile::finish() {
    if (writer_ == nullptr)
        return;
    try {
        writer_->finish();
    } catch (const capture::WriteError& error) {
        fail(error.what());
        return;
    }
    pending_ = 0;
    pendingFrames_ = 0;
    closeFile();
    nameFinished();
}

// The file keeps what it safely has; the rest is counted. Another file is tried after a while.
void RotatingFile::fail(const std::string& why) {
    lose(pendingFrames_);
    pending_ = 0;
    pendingFrames_ = 0;
    if (!failing_)
        chatter_.error(why + "; recording goes on when that works again");
    failing_ = true;
    retryAt_ = HostClock::now() + betweenAttempts_;
    if (descriptor_ < 0)
        return;
    const bool isCut = ftruncate(descriptor_, static_cast<off_t>(size_)) == 0;
    closeFile();
    if (size_ > 0 && isCut)
        nameFinished();
    else if (size_ == 0)
        unlink((path_ + unfinished).c_str());
}

void RotatingFile::closeFile() {
    writer_.reset();
    close(descriptor_);
    descriptor_ = -1;
}

void RotatingFile::nameFinished() {
    const std::string part = path_ + unfinished;
    if (rename(part.c_str(), path_.c_str()) != 0) {
        chatter_.error("cannot rename " + part + ": " + std::strerror(errno));
        return;
    }
    chatter_.detail("finished " + path_);
    if (rules_.kept != 0)
        removeOldest();
}

void RotatingFile::removeOldest() const {
    struct Finished {
        std::string start;
        int number;
        std::filesystem::path path;
    };
    std::vector<Finished> finished;
    const std::regex rule(R"(\.(\d{8}T\d{6}Z)(?:\.(\d{1,9}))?\.)" + std::string(rules_.form->name));
    std::error_code ignored;
    for (const auto& entry : std::filesystem::directory_iterator(rules_.folder, ignored)) {
        const std::string name = entry.path().filename();
        std::smatch part;
        const std::string rest = name.starts_with(trunk_) ? name.substr(trunk_.size()) : "";
        if (std::regex_match(rest, part, rule))
            finished.push_back({part[1], part[2].matched ? std::stoi(part[2]) : 1, entry.path()});
    }
    std::sort(finished.begin(), finished.end(), [](const Finished& a, const Finished& b) {
        return a.start != b.start ? a.start < b.start : a.number < b.number;
    });
    for (std::size_t i = 0; i + rules_.kept < finished.size(); ++i) {
        if (std::filesystem::remove(finished[i].path, ignored))
            chatter_.detail("removed " + finished[i].path.string());
    }
}

}  // namespace reader
