#include "capture/pcap.h"

#include <algorithm>
#include <optional>
#include <utility>

#include "capture/link.h"
#include "capture/octets.h"

namespace capture {

namespace {

constexpr std::size_t fileHeaderSize = 24;
constexpr std::size_t longestPacket = std::size_t{1} << 24;  // more is no packet but damage

// What a magic number says.
struct Shape {
    Order order;
    std::int64_t nanoseconds;  // of a unit of the time's fraction
    std::size_t packetHeaderSize;
};

constexpr struct {
    std::uint32_t magic;
    std::int64_t nanoseconds;
    std::size_t packetHeaderSize;
} magics[] = {{0xa1b2c3d4, 1000, 16}, {0xa1b23c4d, 1, 16}, {0xa1b2cd34, 1000, 24}};

std::optional<Shape> shapeOf(std::string_view beginning) {
    if (beginning.size() < 4)
        return std::nullopt;
    for (const Order order : {Order::little, Order::big}) {
        for (const auto& known : magics) {
            if (numberAt<std::uint32_t>(beginning, 0, order) == known.magic)
                return Shape{order, known.nanoseconds, known.packetHeaderSize};
        }
    }
    return std::nullopt;
}

class PcapParser final : public Parser {
  public:
    explicit PcapParser(const Context& context) : source_(context.source), interface_(context.unnamed) {}

    Reader::Next next(Item& item) override {
        if (!link_) {
            if (const Reader::Next read = readFileHeader(); read != Reader::Next::item)
                return read;
        }
        source_.consume(std::exchange(toConsume_, 0));
        if (isOver_)
            return Reader::Next::end;
        return readPacket(item);
    }

  private:
    Reader::Next readFileHeader() {
        const Source::State state = source_.want(fileHeaderSize);
        if (state == Source::State::pause)
            return Reader::Next::pause;
        if (state == Source::State::end && source_.replaced())
            return Reader::Next::end;
        if (state == Source::State::end)
            throw BadInput(source_.name() + ": truncated dump file: it ends within its header");
        shape_ = *shapeOf(source_.held());
        constexpr std::uint32_t typeBits = 0x03ffffff;
        constexpr std::uint32_t hasCheckSequence = 0x04000000;
        const std::uint32_t field = numberAt<std::uint32_t>(source_.held(), 20, shape_.order);
        if (const std::string complaint = complaintAbout(field & typeBits); !complaint.empty())
            throw BadInput(source_.name() + ": " + complaint);
        link_.emplace(field & typeBits, (field & hasCheckSequence) != 0 ? (field >> 28U) * 2 : 0);
        source_.consume(fileHeaderSize);
        return Reader::Next::item;
    }

    Reader::Next readPacket(Item& item) {
        const Source::State header = source_.want(shape_.packetHeaderSize);
        if (header == Source::State::pause)
            return Reader::Next::pause;
        if (header == Source::State::end && source_.held().empty())
            return Reader::Next::end;
        begin(item);
        if (header == Source::State::end)
            return endWith(item, "truncated dump file: it ends within a packet's header");
        const std::uint32_t size = numberAt<std::uint32_t>(source_.held(), 8, shape_.order);
        if (size > longestPacket) {
            item.kind = Item::Kind::damaged;
            return endWith(
                item, "bogus packet of " + std::to_string(size) + " octets; nothing is read from here on");
        }
        const Source::State packet = source_.want(shape_.packetHeaderSize + size);
        if (packet == Source::State::pause) {
            --number_;
            return Reader::Next::pause;
        }
        take(item, source_.held().substr(shape_.packetHeaderSize, size));
        if (packet == Source::State::end)
            return endWith(item, "truncated dump file: it ends within a packet");
        toConsume_ = shape_.packetHeaderSize + size;
        return Reader::Next::item;
    }

    void begin(Item& item) {
        item.kind = Item::Kind::cut;
        item.count = 0;
        item.text = {};
        item.frame = {};
        item.frame.interface = interface_;
        item.frame.place = {source_.name(), ++number_, Place::Unit::packet};
    }

    // The packet's header is in the window, and `octets` are those of the packet that are there.
    void take(Item& item, std::string_view octets) {
        const std::string_view header = source_.held();
        const auto field = [&](std::size_t at) { return numberAt<std::uint32_t>(header, at, shape_.order); };
        item.frame.clock = Clock::absolute;
        item.frame.time =
            std::int64_t{field(0)} * 1'000'000'000 + std::int64_t{field(4)} * shape_.nanoseconds;
        const std::uint32_t captured = field(8);
        const std::uint32_t original = field(12);
        if (!link_->take(octetsOf(octets), std::nullopt, item.frame)) {
            say(item, "it has no octets");
        } else if (captured < original) {
            item.count = original - std::min<std::size_t>(original, link_->before());
            say(item, "only " + std::to_string(captured) + " of its " + std::to_string(original) +
                          " octets were captured");
        } else {
            item.kind = Item::Kind::frame;
        }
    }

    void say(Item& item, std::string text) {
        text_ = std::move(text);
        item.text = text_;
    }

    Reader::Next endWith(Item& item, std::string text) {
        item.kind = item.kind == Item::Kind::frame ? Item::Kind::cut : item.kind;
        say(item, std::move(text));
        isOver_ = true;
        return Reader::Next::item;
    }

    Source& source_;
    const Interface* interface_;
    Shape shape_{};
    std::optional<Link> link_;
    std::uint64_t number_ = 0;
    std::size_t toConsume_ = 0;
    bool isOver_ = false;
    std::string text_;
};

}  // namespace

Form::Match isPcap(std::string_view beginning, bool isAll) {
    if (shapeOf(beginning))
        return Form::Match::yes;
    return beginning.size() < 4 && !isAll ? Form::Match::perhaps : Form::Match::no;
}

std::unique_ptr<Parser> readPcap(const Context& context) { return std::make_unique<PcapParser>(context); }

}  // namespace capture
