#include "capture/pcapng.h"

#include <algorithm>
#include <optional>
#include <utility>
#include <vector>

#include "capture/link.h"
#include "capture/notes.h"
#include "capture/octets.h"
#include "capture/pcapng_blocks.h"
#include "capture/pcapng_framing.h"
#include "capture/pcapng_interface.h"

namespace capture {

namespace {

using namespace pcapng;

constexpr std::size_t mostInterfaces = 4096;  // of one section

struct Packet {
    std::string_view octets;  // the octets of the packet that are in the block
    std::uint32_t original;   // how many it had
    std::optional<std::uint64_t> units;
    std::uint64_t drops;  // packets lost before it
};

class PcapngParser final : public Parser {
  public:
    explicit PcapngParser(const Context& context)
        : source_(context.source),
          blocks_(context.source),
          options_(context.options),
          interfaces_(context.interfaces),
          unnamed_(context.unnamed) {}

    Reader::Next next(Item& item) override {
        while (shown_ == items_.size()) {
            items_.clear();
            shown_ = 0;
            if (const Reader::Next read = readBlock(); read != Reader::Next::item)
                return read;
        }
        item = items_[shown_++];
        return Reader::Next::item;
    }

  private:
    // The field of the block that begins at this octet, as a number.
    template <typename Number>
    Number field(std::size_t at) const {
        return numberAt<Number>(body_, at, order_);
    }

    // Returns Next::item when a block was read. The block may have brought several items, or none.
    Reader::Next readBlock();
    void readBody(std::uint32_t type);
    void describeInterface();
    void readStamped(bool isOld);
    void readSimple();
    void readStatistics();
    void readPacket(DescribedInterface& on, const Packet& packet, std::string_view optionOctets);
    void setFrame(Item& item, DescribedInterface& on, const Packet& packet, std::optional<bool> told);
    std::string_view packetOctets(std::size_t at, std::size_t captured) const;
    DescribedInterface* interfaceAt(std::size_t index);
    Item& add(Item::Kind kind, const Interface* interface);
    void say(Item::Kind kind, std::string text);
    std::uint64_t addNote(const Note& note, const DescribedInterface& on);
    void addDropped(DescribedInterface& on, std::uint64_t count, std::uint64_t accounted);

    Source& source_;
    Framing blocks_;
    const ReadOptions& options_;
    Interfaces& interfaces_;
    const Interface* unnamed_;
    Order order_ = Order::little;
    std::vector<DescribedInterface> section_;
    std::string_view body_;    // of the block being read
    std::vector<Item> items_;  // of the block read last
    std::size_t shown_ = 0;
    std::string text_;
    std::uint64_t packets_ = 0;
    bool foundLapd_ = false;
    std::string strangeLink_;
};

Reader::Next PcapngParser::readBlock() {
    switch (blocks_.next()) {
        case Framing::Next::pause:
            return Reader::Next::pause;
        case Framing::Next::end:
            if (!foundLapd_ && !strangeLink_.empty() && !source_.replaced())
                throw BadInput(source_.name() + ": " + strangeLink_);
            return Reader::Next::end;
        case Framing::Next::damaged:
            say(Item::Kind::damaged, blocks_.damage());
            break;
        case Framing::Next::block:
            body_ = blocks_.body();
            order_ = blocks_.order();
            readBody(blocks_.type());
            break;
    }
    return Reader::Next::item;
}

void PcapngParser::readBody(std::uint32_t type) {
    switch (type) {
        case sectionHeader:
            section_.clear();
            break;
        case interfaceDescription:
            describeInterface();
            break;
        case enhancedPacket:
            readStamped(false);
            break;
        case simplePacket:
            readSimple();
            break;
        case packet:
            readStamped(true);
            break;
        case interfaceStatistics:
            readStatistics();
            break;
        default:  // names, secrets, others' own
            break;
    }
}

void PcapngParser::describeInterface() {
    if (body_.size() < DescribedInterface::fields || section_.size() == mostInterfaces) {
        say(Item::Kind::damaged, "bad interface description; it is passed over");
        return;
    }
    DescribedInterface described(body_, order_);
    if (const std::string complaint = complaintAbout(described.linkType()); complaint.empty()) {
        foundLapd_ = true;
    } else {
        strangeLink_ = complaint;
        say(Item::Kind::damaged,
            "packets of interface " + std::to_string(section_.size()) + " are passed over: " + complaint);
    }
    described.interface = interfaces_.of(described.named(*unnamed_, options_));
    section_.push_back(std::move(described));
}

DescribedInterface* PcapngParser::interfaceAt(std::size_t index) {
    if (index < section_.size())
        return &section_[index];
    say(Item::Kind::damaged,
        "a packet of interface " + std::to_string(index) + ", which is not described, is passed over");
    return nullptr;
}

// As many as the block holds.
std::string_view PcapngParser::packetOctets(std::size_t at, std::size_t captured) const {
    return body_.substr(at, std::min(captured, body_.size() - at));
}

// Both forms of packets that have a time differ in how they name the interface.
void PcapngParser::readStamped(bool isOld) {
    constexpr std::size_t fields = 20;
    ++packets_;
    if (body_.size() < fields) {
        say(Item::Kind::damaged, "bad packet block; it is passed over");
        return;
    }
    DescribedInterface* const on = interfaceAt(isOld ? field<std::uint16_t>(0) : field<std::uint32_t>(0));
    if (on == nullptr || !on->link)
        return;
    constexpr std::uint16_t unknownDrops = 0xffff;
    const std::uint16_t drops = isOld ? field<std::uint16_t>(2) : unknownDrops;
    const std::uint64_t units = std::uint64_t{field<std::uint32_t>(4)} << 32U | field<std::uint32_t>(8);
    const std::size_t captured = field<std::uint32_t>(12);
    readPacket(
        *on,
        {packetOctets(fields, captured), field<std::uint32_t>(16), units, drops == unknownDrops ? 0U : drops},
        body_.substr(std::min(body_.size(), fields + padded(captured))));
}

void PcapngParser::readSimple() {
    constexpr std::size_t fields = 4;
    ++packets_;
    if (body_.size() < fields) {
        say(Item::Kind::damaged, "bad packet block; it is passed over");
        return;
    }
    DescribedInterface* const on = interfaceAt(0);
    if (on == nullptr || !on->link)
        return;
    const std::uint32_t original = field<std::uint32_t>(0);
    const std::uint32_t captured = on->snapLength() == 0 ? original : std::min(original, on->snapLength());
    readPacket(*on, {packetOctets(fields, captured), original, std::nullopt, 0}, {});
}

// Items in the comments of a packet come before its frame.
void PcapngParser::readPacket(DescribedInterface& on, const Packet& packet, std::string_view optionOctets) {
    std::optional<bool> told;
    Note ofFrame;
    bool isOversized = false;
    std::uint64_t drops = packet.drops;
    std::uint64_t accounted = 0;  // by notes, which say more
    Options options(optionOctets, order_);
    std::uint16_t code = 0;
    for (std::string_view value; options.next(code, value);) {
        if (code == packetFlags && value.size() == 4) {
            const std::uint32_t direction = numberAt<std::uint32_t>(value, 0, order_) & directionMask;
            if (direction == inbound || direction == outbound)
                told = direction == outbound;
        } else if (code == dropCount && value.size() == 8) {
            drops = numberAt<std::uint64_t>(value, 0, order_);
        } else if (code == comment) {
            const Note note = noteIn(value);
            isOversized = isOversized || note.kind == Note::Kind::oversized;
            if (note.kind == Note::Kind::frame)
                ofFrame = note;
            else if (note.kind != Note::Kind::oversized)
                accounted += addNote(note, on);
        }
    }
    addDropped(on, drops, accounted);
    Item& item = add(Item::Kind::frame, on.interface);
    setFrame(item, on, packet, told);
    item.frame.ticks = ofFrame.ticks;
    item.frame.written = ofFrame.written;
    if (isOversized) {
        item.kind = Item::Kind::oversized;
        item.frame.octets = {};
        item.count = 0;
        item.text = {};
    }
}

void PcapngParser::setFrame(Item& item, DescribedInterface& on, const Packet& packet,
                            std::optional<bool> told) {
    if (packet.units && on.clock() != Clock::none) {
        item.frame.clock = on.clock();
        item.frame.time = on.time(*packet.units);
    }
    const std::size_t captured = packet.octets.size();
    if (!on.link->take(octetsOf(packet.octets), told, item.frame)) {
        text_ = "it has no octets";
    } else if (captured < packet.original) {
        item.count = packet.original - std::min<std::size_t>(packet.original, on.link->before());
        text_ = "only " + std::to_string(captured) + " of its " + std::to_string(packet.original) +
                " octets were captured";
    } else {
        return;
    }
    item.kind = Item::Kind::cut;
    item.text = text_;
}

void PcapngParser::readStatistics() {
    constexpr std::size_t fields = 12;
    if (body_.size() < fields || field<std::uint32_t>(0) >= section_.size())
        return;
    DescribedInterface& on = section_[field<std::uint32_t>(0)];
    std::uint64_t drops = on.dropped;
    std::uint64_t accounted = 0;
    Options options(body_.substr(fields), order_);
    std::uint16_t code = 0;
    for (std::string_view value; options.next(code, value);) {
        if (code == comment)
            accounted += addNote(noteIn(value), on);
        else if (code == interfaceDrops && value.size() == 8)
            drops = numberAt<std::uint64_t>(value, 0, order_);  // all of the capture
    }
    addDropped(on, drops - std::min(drops, on.dropped), accounted);
}

// Returns how many lost frames the note accounts for.
std::uint64_t PcapngParser::addNote(const Note& note, const DescribedInterface& on) {
    const bool isRun = note.item.kind == Item::Kind::run;
    Item& item =
        add(note.item.kind, isRun ? interfaces_.of({on.interface->name, note.variant}) : on.interface);
    item.count = note.item.count;
    item.text = note.item.text;
    return item.kind == Item::Kind::lost ? item.count : item.kind == Item::Kind::notQueued ? 1 : 0;
}

void PcapngParser::addDropped(DescribedInterface& on, std::uint64_t count, std::uint64_t accounted) {
    on.dropped += count;
    if (count > accounted)
        add(Item::Kind::dropped, on.interface).count = count - accounted;
}

Item& PcapngParser::add(Item::Kind kind, const Interface* interface) {
    Item& item = items_.emplace_back();
    item.kind = kind;
    item.frame.interface = interface;
    item.frame.place = {source_.name(), packets_, Place::Unit::packet};
    return item;
}

void PcapngParser::say(Item::Kind kind, std::string text) {
    text_ = std::move(text);
    add(kind, section_.empty() ? unnamed_ : section_.back().interface).text = text_;
}

}  // namespace

Form::Match isPcapng(std::string_view beginning, bool isAll) {
    constexpr std::string_view magic = "\n\r\r\n";
    if (beginning.starts_with(magic))
        return Form::Match::yes;
    return magic.starts_with(beginning) && !isAll ? Form::Match::perhaps : Form::Match::no;
}

std::unique_ptr<Parser> readPcapng(const Context& context) { return std::make_unique<PcapngParser>(context); }

}  // namespace capture
