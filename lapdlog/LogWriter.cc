#include "lapdlog/LogWriter.h"

#include <algorithm>
#include <utility>

#include "capture/Sink.h"
#include "decoder/cursor.h"
#include "decoder/frame.h"
#include "decoder/lines.h"
#include "decoder/log_lines.h"
#include "decoder/time_lines.h"
#include "lapdlog/variants.h"

namespace lapdlog {

namespace {

using capture::Clock;
using capture::Frame;
using capture::Item;
using capture::Variant;
using Kind = Item::Kind;

constexpr std::int64_t perSecond = 1'000'000'000;

class LogWriter final : public capture::Writer {
  public:
    LogWriter(int file, const std::string& name, Variant fallback) : sink_(file, name), fallback_(fallback) {}

    void write(const Item& item) override {
        decoder::lineBuffer.clear();
        compose(item);
        sink_.record() += decoder::lineBuffer.composed();
        decoder::lineBuffer.clear();
        sink_.endRecord();
    }
    void flush() override { sink_.flush(); }
    void finish() override { sink_.flush(); }

  private:
    void compose(const Item& item);
    void composeHead(Variant variant);
    void composeFrame(const Item& item);
    Variant variantOf(const Item& item) const;
    std::uint32_t ticksOf(const Frame& frame);

    capture::Sink sink_;
    Variant fallback_;
    bool hasHead_ = false;
    decoder::LocalTime localTime_;
    // The first time of a frame without ticks, from which its ticks are counted.
    bool hasFirst_ = false;
    std::int64_t first_ = 0;
    std::uint32_t lastTicks_ = 0;
};

void LogWriter::compose(const Item& item) {
    switch (item.kind) {
        case Kind::frame:
        case Kind::oversized:
            composeFrame(item);
            break;
        case Kind::run:
            composeHead(item.frame.interface->variant);
            break;
        case Kind::lost:
            decoder::text(decoder::framesLost, decoder::dec(item.count), " \n");
            break;
        case Kind::notQueued:
            decoder::text(decoder::enqueueFailed);
            break;
        case Kind::notTaken:
            decoder::text(decoder::getFailed);
            break;
        default:
            break;
    }
}

// Leaves out the line of the variant if it is unknown, because the run did not get so far.
void LogWriter::composeHead(Variant variant) {
    hasHead_ = true;
    decoder::text("\n", decoder::logTitle, "\n", decoder::logNotice, "\n", decoder::logVersion, "\n",
                  decoder::variantLine(switOf(variant)));
}

void LogWriter::composeFrame(const Item& item) {
    const Frame& frame = item.frame;
    const Variant variant = variantOf(item);
    if (!std::exchange(hasHead_, true) && !frame.written)
        composeHead(variant);
    const std::int64_t second = frame.time / perSecond - (frame.time % perSecond < 0 ? 1 : 0);
    decoder::timeLines(frame.transmitted, ticksOf(frame), localTime_.of(frame.written.value_or(second)));
    decoder::swit = switOf(variant);
    if (item.kind == Kind::oversized || frame.octets.size() > decoder::maximumFrame) {
        decoder::line(decoder::oversizedFrame, " ");
        decoder::line(decoder::frameError, " ");
        return;
    }
    decoder::msglen = static_cast<int>(frame.octets.size());
    decoder::RingBuffer octets;
    decoder::getBlock(&octets, frame.octets, decoder::msglen);
    decoder::composeFrame(octets);
}

Variant LogWriter::variantOf(const Item& item) const {
    const Variant told = item.frame.interface->variant;
    return told == Variant::unknown ? fallback_ : told;
}

// If the clock was set back, the ticks do not change.
std::uint32_t LogWriter::ticksOf(const Frame& frame) {
    if (frame.ticks)
        return *frame.ticks;
    if (!std::exchange(hasFirst_, true))
        first_ = frame.time;
    const std::int64_t since =
        (frame.time - first_ + capture::nanosecondsPerTick / 2) / capture::nanosecondsPerTick;
    lastTicks_ = static_cast<std::uint32_t>(std::clamp<std::int64_t>(since, lastTicks_, UINT32_MAX));
    return lastTicks_;
}

}  // namespace

std::unique_ptr<capture::Writer> makeLogWriter(int file, const std::string& name, Variant fallback) {
    return std::make_unique<LogWriter>(file, name, fallback);
}

}  // namespace lapdlog
