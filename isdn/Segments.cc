#include "isdn/Segments.h"

#include "isdn/values.h"

namespace isdn {

namespace {

// A message has at most eight segments (Q.931 H.2), each in the information field of a frame (N201 octets).
constexpr std::uint8_t mostSegments = 8;
constexpr std::size_t longestSegment = 260;

bool isSegment(const Layer3& message) {
    return message.hasType && !message.national && message.discriminator == callControl &&
           message.type == message::segment;
}

}  // namespace

void Segments::clear() {
    pending_ = false;
    message_.clear();
}

Segments::Outcome Segments::add(const Layer3& message) {
    const auto header = isSegment(message) ? segmentHeader(*message.elements.begin()) : std::nullopt;
    const bool fits = message.raw.size() <= longestSegment;
    const bool goesOn = fits && pending_ && header && !header->first && header->messageType == type_ &&
                        header->remaining + 1 == remaining_;
    const bool begins = fits && header && header->first && header->remaining < mostSegments;
    dropped_ = pending_ && !goesOn;
    if (!goesOn)
        clear();
    if (!goesOn && !begins)
        return isSegment(message) ? Outcome::stray : Outcome::none;
    if (begins) {
        // The whole has the discriminator and the reference of its segments, and the type that they name.
        message_.assign(message.header.begin(), message.header.end() - 1);
        message_.push_back(header->messageType);
        type_ = header->messageType;
    }
    message_.insert(message_.end(), message.raw.begin(), message.raw.end());
    remaining_ = header->remaining;
    pending_ = remaining_ != 0;
    return pending_ ? Outcome::waiting : Outcome::complete;
}

}  // namespace isdn
