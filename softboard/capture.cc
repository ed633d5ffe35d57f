#include "softboard/capture.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <memory>
#include <utility>

#include "capture/open.h"
#include "capture/pcap.h"
#include "capture/pcapng.h"
#include "softboard/codes.h"
#include "softboard/settings.h"

namespace softboard {

namespace {

using capture::Item;

constexpr size_t longestFrame = 65535;
constexpr size_t mostFrames = 500000;
constexpr std::array forms{capture::pcapForm, capture::pcapngForm};

// Time since the first frame; a clock that was set back stands still.
uint32_t ticksSince(int64_t first, int64_t then, uint32_t least) {
    const double seconds = (static_cast<double>(then) - static_cast<double>(first)) / 1e9;
    const double ticks = std::round(seconds * ticksPerSecond);
    return static_cast<uint32_t>(
        std::clamp(ticks, static_cast<double>(least), static_cast<double>(UINT32_MAX)));
}

[[noreturn]] void fail(const std::string& path, const Item& item, const std::string& reason) {
    throw BadInput(path + ": frame " + std::to_string(item.frame.place.number) + ": " + reason);
}

// Throws for what cannot be played; false for what is no frame.
bool isFrame(const std::string& path, const Item& item, size_t frames) {
    if (item.kind == Item::Kind::cut || item.kind == Item::Kind::damaged)
        fail(path, item, std::string(item.text));
    if (!item.isFrame())
        return false;
    if (item.frame.octets.empty())
        fail(path, item, "it has no octets");
    if (item.frame.octets.size() > longestFrame)
        fail(path, item, "it has more than " + std::to_string(longestFrame) + " octets");
    if (frames == mostFrames)
        fail(path, item, "a capture may hold " + std::to_string(mostFrames) + " frames at most");
    return true;
}

Frames readAll(const std::string& path) {
    const std::unique_ptr<capture::Reader> reader = capture::openReader(path, {}, forms);
    Frames frames;
    int64_t first = 0;
    Item item;
    for (auto next = reader->next(item); next != capture::Reader::Next::end; next = reader->next(item)) {
        if (next == capture::Reader::Next::pause) {
            reader->wait(std::chrono::seconds(1));
            continue;
        }
        if (!isFrame(path, item, frames.size()))
            continue;
        if (frames.empty())
            first = item.frame.time;
        frames.push_back({item.frame.transmitted,
                          ticksSince(first, item.frame.time, frames.empty() ? 0 : frames.back().ticks),
                          {item.frame.octets.begin(), item.frame.octets.end()}});
    }
    return frames;
}

}  // namespace

Frames readCapture(const std::string& path) {
    try {
        Frames frames = readAll(path);
        if (frames.empty())
            throw BadInput(path + ": the capture holds no frame");
        return frames;
    } catch (const capture::BadInput& bad) {
        throw BadInput(bad.what());
    }
}

}  // namespace softboard
