#include "bench/road/log_watch.h"

#include <algorithm>

#include "softboard/player.h"

namespace bench {

namespace {

std::string dumpOf(const std::vector<std::uint8_t>& octets) {
    constexpr std::string_view digits = "0123456789abcdef";
    std::string dump;
    for (const std::uint8_t octet : octets)
        dump.append({digits[octet >> 4], digits[octet & 15], ' '});
    return dump;
}

}  // namespace

Played::Played(const softboard::Frames& frames) : frames_(frames) {
    for (const softboard::Frame& frame : frames)
        dumps_.push_back(dumpOf(frame.octets));
}

std::string Played::header(std::uint64_t i) const {
    const softboard::Frame& frame = frames_[i % frames_.size()];
    const std::uint64_t round = frames_.back().ticks + softboard::Player::ticksBetweenRounds;
    const auto ticks = static_cast<std::uint32_t>(i / frames_.size() * round + frame.ticks);
    return std::string(frame.transmitted ? "TX" : "RX") + " Frame: Time = " + std::to_string(ticks / 250) +
           "." + std::to_string(ticks % 250 * 4);
}

std::uint64_t LogWatch::take(std::string_view piece) {
    const std::uint64_t before = headers_;
    for (std::size_t end = piece.find('\n'); end != std::string_view::npos; end = piece.find('\n')) {
        if (rest_.empty()) {
            takeLine(piece.substr(0, end));
        } else {
            rest_.append(piece.substr(0, end));
            takeLine(rest_);
            rest_.clear();
        }
        piece.remove_prefix(end + 1);
    }
    rest_.append(piece);
    return headers_ - before;
}

void LogWatch::takeLine(std::string_view line) {
    line.remove_prefix(std::min(line.find_first_not_of(' '), line.size()));
    if (line.empty()) {
        endFrame();
    } else if (line.substr(1).starts_with("X Frame: Time = ")) {
        header_ = line;
        ++headers_;
    } else if (line == "Hex Dump: ") {
        inDump_ = true;
    } else if (inDump_) {
        dump_.append(line);
    } else if (line == "Enqueue Failed ") {
        ++checked_.refused;
    }
}

void LogWatch::endFrame() {
    if (!inDump_)
        return;
    constexpr std::uint64_t furthest = 1000;
    std::uint64_t found = next_;
    while (found < next_ + furthest && (dump_ != played_.dump(found) || header_ != played_.header(found)))
        ++found;
    if (found == next_ + furthest) {
        ++checked_.outOfOrder;
    } else {
        checked_.lost += found - next_;
        next_ = found + 1;
    }
    ++checked_.frames;
    dump_.clear();
    inDump_ = false;
}

}  // namespace bench
