#include <algorithm>
#include <array>
#include <string>
#include <utility>
#include <vector>

#include "capture/Sink.h"
#include "capture/link.h"
#include "capture/notes.h"
#include "capture/pcapng_blocks.h"
#include "capture/put.h"
#include "capture/writers.h"

namespace capture {

namespace {

using namespace pcapng;

constexpr char nanoseconds = 9;                 // as powers of 10
constexpr std::size_t longestComment = 32'000;  // an option's length has 16 bits
constexpr std::size_t mostWaiting = 32'000;     // octets of comments that wait for a packet

void putOption(std::string& block, std::uint16_t code, std::string_view value) {
    put(block, code);
    put(block, static_cast<std::uint16_t>(value.size()));
    block += value;
    block.append(padded(value.size()) - value.size(), '\0');
}

template <std::unsigned_integral Number>
void putOption(std::string& block, std::uint16_t code, Number value) {
    put(block, code);
    put(block, static_cast<std::uint16_t>(sizeof value));
    put(block, value);
}

void putComment(std::string& block, std::string_view text) {
    putOption(block, comment, text.substr(0, longestComment));
}

// Puts a block around what `body` puts.
template <typename Body>
void putBlock(std::string& record, std::uint32_t type, Body body) {
    const std::size_t begin = record.size();
    put(record, type);
    put(record, std::uint32_t{0});
    body();
    const auto size = static_cast<std::uint32_t>(record.size() - begin + sizeof type);
    put(record, size);
    replace(record, begin + sizeof type, size);
}

// A D channel, and what will be written with its next packet.
struct Channel {
    std::string name;
    std::uint64_t dropped = 0;  // frames that were lost in the whole capture
    std::uint64_t waitingDrops = 0;
    std::vector<std::string> waiting;
    std::size_t waitingSize = 0;
};

// An interface that has been described. One channel may have several, as its variant becomes known.
struct Described {
    Interface interface;
    Clock clock = Clock::absolute;
    std::size_t channel = 0;
    std::uint64_t lastTime = 0;
};

class PcapngWriter final : public Writer {
  public:
    PcapngWriter(int file, const std::string& name) : sink_(file, name) {}

    void write(const Item& item) override;
    void flush() override {
        beginSection();
        sink_.flush();
    }
    void finish() override;

  private:
    void beginSection();
    std::size_t channelOf(const std::string& name);
    std::size_t described(const Interface& interface, Clock clock);
    void describe(const Described& on);
    void writePacket(const Item& item, std::size_t index);
    void putPacketOptions(const Item& item, Channel& channel);
    void wait(const Item& item, Channel& channel);
    void writeStatistics(std::size_t index);

    Sink sink_;
    bool hasBegun_ = false;
    std::vector<Channel> channels_;
    std::vector<Described> interfaces_;
    std::size_t last_ = 0;
};

// The clock of the frame. A frame without a time has the second in which the recorder wrote it.
Clock clockOf(const Frame& frame) {
    return frame.clock == Clock::none && frame.written ? Clock::absolute : frame.clock;
}

std::int64_t timeOf(const Frame& frame) {
    std::int64_t time = frame.time;
    if (frame.clock == Clock::none && frame.written)
        time = *frame.written * 1'000'000'000;
    else if (frame.clock == Clock::none && frame.ticks)
        time = *frame.ticks * nanosecondsPerTick;
    return std::max<std::int64_t>(time, 0);
}

bool isPacket(const Item& item) {
    return item.isFrame() || item.kind == Item::Kind::oversized ||
           (item.kind == Item::Kind::cut && !item.frame.octets.empty());
}

// The length of the frame on the line, or the least length that it can have had.
std::size_t originalSize(const Item& item) {
    constexpr std::size_t leastOversized = 258;
    const std::size_t held = item.frame.octets.size();
    if (item.kind == Item::Kind::oversized)
        return leastOversized;
    constexpr std::size_t most = 0xffffffff - pseudoHeaderSize;  // a packet's length has 32 bits
    return item.isFrame() ? held : std::clamp<std::size_t>(item.count, held + 1, most);
}

void PcapngWriter::write(const Item& item) {
    beginSection();
    const Interface& interface = *item.frame.interface;
    if (isPacket(item)) {
        writePacket(item, described(interface, clockOf(item.frame)));
    } else {
        Channel& channel = channels_[channelOf(interface.name)];
        wait(item, channel);
        if (channel.waitingSize > mostWaiting)
            writeStatistics(described(interface, Clock::absolute));
    }
    sink_.endRecord();
}

void PcapngWriter::beginSection() {
    if (std::exchange(hasBegun_, true))
        return;
    constexpr std::uint64_t unknownSize = ~std::uint64_t{0};
    std::string& record = sink_.record();
    putBlock(record, sectionHeader, [&] {
        put(record, orderMagic);
        put(record, std::uint16_t{1});
        put(record, std::uint16_t{0});
        put(record, unknownSize);
        putOption(record, userApplication, std::string_view("lapdmon"));
        putOption(record, endOfOptions, std::string_view());
    });
}

std::size_t PcapngWriter::channelOf(const std::string& name) {
    const auto found = std::find_if(channels_.begin(), channels_.end(),
                                    [&](const Channel& known) { return known.name == name; });
    if (found != channels_.end())
        return static_cast<std::size_t>(found - channels_.begin());
    channels_.push_back({name, 0, 0, {}, 0});
    return channels_.size() - 1;
}

// The number of an interface, which is described when it comes first.
std::size_t PcapngWriter::described(const Interface& interface, Clock clock) {
    const auto fits = [&](const Described& on) { return on.interface == interface && on.clock == clock; };
    if (last_ < interfaces_.size() && fits(interfaces_[last_]))
        return last_;
    const auto found = std::find_if(interfaces_.begin(), interfaces_.end(), fits);
    last_ = static_cast<std::size_t>(found - interfaces_.begin());
    if (found == interfaces_.end()) {
        interfaces_.push_back({interface, clock, channelOf(interface.name), 0});
        describe(interfaces_.back());
    }
    return last_;
}

void PcapngWriter::describe(const Described& on) {
    std::string& record = sink_.record();
    putBlock(record, interfaceDescription, [&] {
        put(record, static_cast<std::uint16_t>(linuxLapd));
        put(record, std::uint16_t{0});
        put(record, std::uint32_t{0});  // no limit to a packet's length
        putOption(record, interfaceName, std::string_view(on.interface.name).substr(0, longestComment));
        putOption(record, interfaceText, descriptionOf(on.interface.variant));
        putOption(record, timeResolution, std::string_view(&nanoseconds, 1));
        if (on.clock != Clock::absolute)
            putComment(record, on.clock == Clock::none ? noTimes : relativeTimes);
        putOption(record, endOfOptions, std::string_view());
    });
}

void PcapngWriter::writePacket(const Item& item, std::size_t index) {
    Described& on = interfaces_[index];
    std::string& record = sink_.record();
    const auto header = pseudoHeaderOf(item.frame);
    const std::span<const std::uint8_t> octets = item.frame.octets;
    const std::size_t captured = header.size() + octets.size();
    on.lastTime = static_cast<std::uint64_t>(timeOf(item.frame));
    putBlock(record, enhancedPacket, [&] {
        put(record, static_cast<std::uint32_t>(index));
        put(record, static_cast<std::uint32_t>(on.lastTime >> 32U));
        put(record, static_cast<std::uint32_t>(on.lastTime));
        put(record, static_cast<std::uint32_t>(captured));
        put(record, static_cast<std::uint32_t>(header.size() + originalSize(item)));
        record += textOf(header);
        record += textOf(octets);
        record.append(padded(captured) - captured, '\0');
        putPacketOptions(item, channels_[on.channel]);
    });
}

void PcapngWriter::putPacketOptions(const Item& item, Channel& channel) {
    std::string& record = sink_.record();
    putOption(record, packetFlags, item.frame.transmitted ? outbound : inbound);
    if (channel.waitingDrops != 0)
        putOption(record, dropCount, std::exchange(channel.waitingDrops, 0));
    for (const std::string& note : channel.waiting)
        putComment(record, note);
    channel.waiting.clear();
    channel.waitingSize = 0;
    if (item.kind == Item::Kind::oversized)
        putComment(record, noteOf(item));
    if (item.frame.ticks || item.frame.written)
        putComment(record, noteOfFrame(item.frame));
    putOption(record, endOfOptions, std::string_view());
}

void PcapngWriter::wait(const Item& item, Channel& channel) {
    const bool isLoss = item.kind == Item::Kind::lost || item.kind == Item::Kind::dropped;
    const std::uint64_t drops = isLoss ? item.count : item.kind == Item::Kind::notQueued ? 1 : 0;
    channel.dropped += drops;
    channel.waitingDrops += drops;
    if (item.kind == Item::Kind::dropped)
        return;  // such an item has nothing besides the count
    channel.waiting.push_back(noteOf(item));
    channel.waitingSize += channel.waiting.back().size();
}

// Writes the statistics of an interface, with the comments and counts that still wait.
void PcapngWriter::writeStatistics(std::size_t index) {
    const Described& on = interfaces_[index];
    Channel& channel = channels_[on.channel];
    std::string& record = sink_.record();
    putBlock(record, interfaceStatistics, [&] {
        put(record, static_cast<std::uint32_t>(index));
        put(record, static_cast<std::uint32_t>(on.lastTime >> 32U));
        put(record, static_cast<std::uint32_t>(on.lastTime));
        for (const std::string& note : channel.waiting)
            putComment(record, note);
        putOption(record, interfaceDrops, channel.dropped);
        putOption(record, endOfOptions, std::string_view());
    });
    channel.waiting.clear();
    channel.waitingSize = 0;
    channel.waitingDrops = 0;
}

void PcapngWriter::finish() {
    beginSection();
    for (std::size_t i = 0; i < channels_.size(); ++i) {
        const auto on = std::find_if(interfaces_.begin(), interfaces_.end(),
                                     [&](const Described& known) { return known.channel == i; });
        const bool isDescribed = on != interfaces_.end();
        if (channels_[i].dropped != 0 || !channels_[i].waiting.empty())
            writeStatistics(isDescribed ? static_cast<std::size_t>(on - interfaces_.begin())
                                        : described({channels_[i].name, Variant::unknown}, Clock::absolute));
    }
    sink_.flush();
}

}  // namespace

std::unique_ptr<Writer> makePcapngWriter(int file, const std::string& name) {
    return std::make_unique<PcapngWriter>(file, name);
}

}  // namespace capture
