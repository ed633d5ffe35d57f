#include "capture/pcapng_framing.h"

#include <utility>

#include "capture/pcapng_blocks.h"

namespace capture::pcapng {

namespace {

constexpr std::size_t headerSize = 8;
constexpr std::size_t orderSize = 4;                        // behind a section's header
constexpr std::size_t longestBlock = std::size_t{1} << 24;  // more is no block but damage

}  // namespace

Framing::Next Framing::next() {
    source_.consume(std::exchange(toConsume_, 0));
    if (!damage_.empty())
        return Next::end;
    std::size_t size = 0;
    if (const Next header = readHeader(size); header != Next::block)
        return header;
    if (size < blockOverhead || size > longestBlock || size % 4 != 0)
        return damaged("bad block of " + std::to_string(size) + " octets; nothing is read from here on");
    const Source::State block = source_.want(size);
    if (block == Source::State::pause)
        return Next::pause;
    if (block == Source::State::end)
        return damaged("truncated dump file: it ends within a block");
    body_ = source_.held().substr(headerSize, size - blockOverhead);
    toConsume_ = size;
    return Next::block;
}

// The order of octets in a section's length is known only from the word after it.
Framing::Next Framing::readHeader(std::size_t& size) {
    Source::State state = source_.want(headerSize);
    if (state == Source::State::ready && numberAt<std::uint32_t>(source_.held(), 0, order_) == sectionHeader)
        state = source_.want(headerSize + orderSize);
    if (state == Source::State::pause)
        return Next::pause;
    if (state == Source::State::end)
        return source_.held().empty() ? Next::end
                                      : damaged("truncated dump file: it ends within a block's header");
    type_ = numberAt<std::uint32_t>(source_.held(), 0, order_);
    if (type_ == sectionHeader && !readOrder())
        return damaged("bad section header: no order of octets; nothing is read from here on");
    size = numberAt<std::uint32_t>(source_.held(), sizeof type_, order_);
    return Next::block;
}

bool Framing::readOrder() {
    for (const Order order : {Order::little, Order::big}) {
        if (numberAt<std::uint32_t>(source_.held(), headerSize, order) == orderMagic) {
            order_ = order;
            return true;
        }
    }
    return false;
}

Framing::Next Framing::damaged(std::string words) {
    damage_ = std::move(words);
    return Next::damaged;
}

}  // namespace capture::pcapng
