// The header of a message in the form of the relay protocol.
#ifndef HOSTSVC_KSHEADERBLOCK_H
#define HOSTSVC_KSHEADERBLOCK_H

#include <array>
#include <cstdint>

#include "norv/norv.h"

// Fourteen 32-bit words, big-endian: the header's low octet of word 0, transaction, type; node, board and
// processor of source and target; instance and component of source and target; body size.
using KSHeaderBlock = std::array<std::uint32_t, 14>;

// Makes the block from the header of msg. Its words are already big-endian.
KSHeaderBlock ks_headerBlock(const NvMsg32Bit& msg);

// Sets the header of msg from a block of nbytes octets, except for the size, which is that of the buffer. If
// the block has fewer than fourteen words, the missing ones count as 0.
void ks_fillHeader(NvMsg32Bit& msg, const char* block, int nbytes);

#endif
