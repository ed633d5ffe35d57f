#include "relay/frame.h"

#include <string>

#include "relay/ended.h"

namespace relay {

FrameHeader FrameHeader::parse(std::span<const std::uint8_t, frameHeaderSize> octets) {
    const FrameHeader header{wordAt(octets, 0), wordAt(octets, 1), wordAt(octets, 2), wordAt(octets, 3)};
    for (const std::uint32_t size : {header.dataSize, header.extraSize}) {
        if (size > largestPart)
            throw Ended("a frame with a part of " + std::to_string(size) + " octets; the most is " +
                        std::to_string(largestPart));
    }
    return header;
}

Octets encodeFrame(std::uint32_t type, std::uint32_t transaction, std::span<const std::uint8_t> data,
                   std::span<const std::uint8_t> extra) {
    Octets octets;
    octets.reserve(frameHeaderSize + data.size() + extra.size());
    appendWord(octets, type);
    appendWord(octets, transaction);
    appendWord(octets, static_cast<std::uint32_t>(data.size()));
    appendWord(octets, static_cast<std::uint32_t>(extra.size()));
    appendWord(octets, 0);
    octets.insert(octets.end(), data.begin(), data.end());
    octets.insert(octets.end(), extra.begin(), extra.end());
    return octets;
}

}  // namespace relay
