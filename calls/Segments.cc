#include "calls/Segments.h"

#include <algorithm>
#include <utility>

#include "isdn/values.h"

namespace calls {

Segments::Taken Segments::take(Message& message) {
    const isdn::Layer3& layer3 = message.layer3;
    if (layer3.discriminator != isdn::callControl || !layer3.hasType || layer3.type != isdn::message::segment)
        return Taken::no;
    const auto header = isdn::segmentHeader(layer3.elements.find(isdn::element::segmentedMessage));
    const Key key{layer3.callReference.value, message.from(), layer3.callReference.flag};
    const auto known = pieces_.find(key);
    if (!header || header->remaining >= mostSegments)
        return Taken::outOfOrder;
    if (header->first) {
        if (known == pieces_.end() && pieces_.size() >= mostMessages)
            return Taken::outOfOrder;
        if (known != pieces_.end())
            replaced_ = Unfinished{known->second.moment, key.from};
        Pieces pieces;
        pieces.type = header->messageType;
        // The whole message has the header of its segments, except for the message type.
        pieces.octets.assign(layer3.header.begin(), layer3.header.end());
        pieces.octets.back() = header->messageType;
        pieces.remaining = header->remaining + 1U;
        pieces_[key] = std::move(pieces);
    } else if (known == pieces_.end() || known->second.type != header->messageType ||
               known->second.remaining != header->remaining + 1U) {
        pieces_.erase(key);
        return Taken::outOfOrder;
    }
    Pieces& pieces = pieces_.at(key);
    pieces.octets.insert(pieces.octets.end(), layer3.raw.begin(), layer3.raw.end());
    pieces.remaining = header->remaining;
    pieces.moment = momentOf(message);
    if (pieces.remaining != 0)
        return Taken::kept;
    whole_ = std::move(pieces.octets);
    pieces_.erase(key);
    message.layer3 = isdn::parseLayer3(whole_);
    return Taken::complete;
}

std::int64_t Segments::oldest() const {
    const auto age = [](const auto& each) { return each.second.moment.at; };
    return age(*std::ranges::min_element(pieces_, {}, age));
}

std::optional<Segments::Unfinished> Segments::unfinished(std::int64_t at, std::int64_t limit) {
    const auto late = std::find_if(pieces_.begin(), pieces_.end(),
                                   [&](const auto& each) { return at - each.second.moment.at > limit; });
    if (late == pieces_.end())
        return std::nullopt;
    const Unfinished found{late->second.moment, late->first.from};
    pieces_.erase(late);
    return found;
}

}  // namespace calls
