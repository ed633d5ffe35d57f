#include "softboard/journal.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <string_view>

#include "softboard/message_text.h"

namespace softboard {

namespace {

constexpr size_t linesKept = 65536;

const char* wayText(Journal::Way way) {
    switch (way) {
        case Journal::Way::hostToBoard:
            return "host->board";
        case Journal::Way::boardToHost:
            return "board->host";
        case Journal::Way::hostToHost:
            return "host->host";
        case Journal::Way::hostToNobody:
            return "host->nobody";
        case Journal::Way::boardToNobody:
            return "board->nobody";
    }
    return "?";
}

void writeWhole(int file, std::string_view text) {
    while (!text.empty()) {
        const ssize_t written = ::write(file, text.data(), text.size());
        if (written < 0 && errno != EINTR) {
            return;
        }
        text.remove_prefix(written < 0 ? 0 : static_cast<size_t>(written));
    }
}

}  // namespace

Journal::~Journal() {
    if (file_ >= 0) {
        ::close(file_);
    }
}

bool Journal::writeTo(const std::string& file) {
    const int opened = ::open(file.c_str(), O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC, 0666);
    if (opened < 0) {
        return false;
    }
    const std::lock_guard guard(lock_);
    if (file_ >= 0) {
        ::close(file_);
    }
    file_ = opened;
    return true;
}

void Journal::add(Way way, const Message& message) {
    const std::string body = bodyText(message);
    const std::string type = std::to_string(message.type);
    Line line;
    line.text = std::string(wayText(way)) + " " + type + " " + messageName(message) + " " + body + " from " +
                toString(message.source) + " to " + toString(message.target) + " trans " +
                std::to_string(message.transaction >> 8);
    if (way == Way::hostToBoard || way == Way::hostToNobody) {
        line.heard = type + " " + body + "\n";
    }
    const std::lock_guard guard(lock_);
    append(std::move(line));
    ++counts_[message.type];
    grown_.notify_all();
}

void Journal::note(const std::string& text) {
    const std::lock_guard guard(lock_);
    append({text, {}});
}

void Journal::append(Line line) {
    line.text += '\n';
    if (file_ >= 0) {
        writeWhole(file_, line.text);
    }
    lines_.push_back(std::move(line));
    if (lines_.size() > linesKept) {
        lines_.pop_front();
    }
}

std::string Journal::text() const {
    const std::lock_guard guard(lock_);
    std::string all;
    for (const Line& line : lines_) {
        all += line.text;
    }
    return all;
}

std::string Journal::heard() const {
    const std::lock_guard guard(lock_);
    std::string all;
    for (const Line& line : lines_) {
        all += line.heard;
    }
    return all;
}

void Journal::clear() {
    const std::lock_guard guard(lock_);
    lines_.clear();
    counts_.clear();
}

bool Journal::waitFor(uint32_t type, size_t count, std::chrono::milliseconds limit) const {
    std::unique_lock guard(lock_);
    return grown_.wait_for(guard, limit, [&] {
        const auto counted = counts_.find(type);
        return (counted == counts_.end() ? 0 : counted->second) >= count;
    });
}

}  // namespace softboard
