#include <algorithm>
#include <string>
#include <utility>

#include "capture/Sink.h"
#include "capture/hex_digits.h"
#include "capture/link.h"
#include "capture/notes.h"
#include "capture/octets.h"
#include "capture/put.h"
#include "capture/time_text.h"
#include "capture/writers.h"

namespace capture {

namespace {

constexpr std::int64_t perSecond = 1'000'000'000;

class PcapWriter final : public Writer {
  public:
    PcapWriter(int file, const std::string& name) : sink_(file, name) {}

    void write(const Item& item) override {
        begin();
        if (item.isFrame())
            writePacket(item.frame);
        sink_.endRecord();
    }
    void flush() override {
        begin();
        sink_.flush();
    }
    void finish() override { flush(); }

  private:
    void begin() {
        if (std::exchange(hasBegun_, true))
            return;
        constexpr std::uint32_t magic = 0xa1b23c4d;  // of times in nanoseconds
        constexpr std::uint32_t longestPacket = 262144;
        std::string& record = sink_.record();
        for (const std::uint32_t number : {magic, 0x00040002U, 0U, 0U, longestPacket, linuxLapd})
            put(record, number);
    }

    void writePacket(const Frame& frame) {
        std::string& record = sink_.record();
        const bool countsTicks = frame.clock == Clock::none && frame.ticks;
        const std::int64_t time =
            std::max<std::int64_t>(countsTicks ? *frame.ticks * nanosecondsPerTick : frame.time, 0);
        const auto size = static_cast<std::uint32_t>(pseudoHeaderSize + frame.octets.size());
        put(record, static_cast<std::uint32_t>(time / perSecond));
        put(record, static_cast<std::uint32_t>(time % perSecond));
        put(record, size);
        put(record, size);
        record += textOf(pseudoHeaderOf(frame));
        record += textOf(frame.octets);
    }

    Sink sink_;
    bool hasBegun_ = false;
};

class HexWriter final : public Writer {
  public:
    HexWriter(int file, const std::string& name) : sink_(file, name) {}

    void write(const Item& item) override {
        if (item.isFrame() && !item.frame.octets.empty())
            writeFrame(item.frame);
        else
            writeComment(item);
        sink_.endRecord();
    }
    void flush() override { sink_.flush(); }
    void finish() override { sink_.flush(); }

  private:
    void writeFrame(const Frame& frame) {
        std::string& line = sink_.record();
        line += frame.transmitted ? "TX " : "RX ";
        if (frame.clock != Clock::none)
            line += toText({frame.clock, frame.time}) + " ";
        else if (frame.ticks &&
                 frame.octets.size() > 1)  // a number before one octet would be an octet itself
            line += std::to_string(*frame.ticks) + " ";
        appendDigits(frame.octets, line);
        line += '\n';
    }

    // Control characters of an input's text must not end the line.
    void writeComment(const Item& item) {
        std::string& line = sink_.record();
        const std::size_t begin = line.size();
        line += item.isFrame() ? std::string("# a frame without octets") : "# " + noteOf(item);
        std::replace_if(
            line.begin() + static_cast<std::ptrdiff_t>(begin), line.end(),
            [](unsigned char c) { return c < ' ' || c == 0x7f; }, '.');
        line += '\n';
    }

    Sink sink_;
};

}  // namespace

std::unique_ptr<Writer> makePcapWriter(int file, const std::string& name) {
    return std::make_unique<PcapWriter>(file, name);
}

std::unique_ptr<Writer> makeHexWriter(int file, const std::string& name) {
    return std::make_unique<HexWriter>(file, name);
}

}  // namespace capture
