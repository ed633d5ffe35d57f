#include "hostsvc/KSHeaderBlock.h"

#include <algorithm>
#include <cstring>

#include "hostsvc/KSByteOrder.h"

KSHeaderBlock ks_headerBlock(const NvMsg32Bit& msg) {
    KSHeaderBlock block{msg.transaction & 0xFFU,
                        msg.transaction >> 8,
                        msg.type,
                        msg.sourceNode,
                        msg.sourceBoard,
                        msg.sourceProcessor,
                        msg.targetNode,
                        msg.targetBoard,
                        msg.targetProcessor,
                        msg.sourceInstance,
                        msg.sourceComponent,
                        msg.targetInstance,
                        msg.targetComponent,
                        msg.size};
    KS_htonU32(block.data(), block.data(), sizeof block);
    return block;
}

void ks_fillHeader(NvMsg32Bit& msg, const char* octets, int nbytes) {
    KSHeaderBlock block{};
    std::memcpy(block.data(), octets, std::min(static_cast<std::size_t>(std::max(nbytes, 0)), sizeof block));
    KS_ntohU32(block.data(), block.data(), sizeof block);
    const auto octet = [&](std::size_t word) { return static_cast<std::uint8_t>(block[word]); };
    msg.transaction = block[1] << 8 | octet(0);
    msg.type = block[2];
    msg.sourceNode = octet(3);
    msg.sourceBoard = octet(4);
    msg.sourceProcessor = octet(5);
    msg.targetNode = octet(6);
    msg.targetBoard = octet(7);
    msg.targetProcessor = octet(8);
    msg.sourceInstance = static_cast<std::uint16_t>(block[9]);
    msg.sourceComponent = octet(10);
    msg.targetInstance = static_cast<std::uint16_t>(block[11]);
    msg.targetComponent = octet(12);
}
