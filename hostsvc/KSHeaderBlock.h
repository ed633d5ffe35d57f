// A message's header as the relay protocol carries it.
#ifndef HOSTSVC_KSHEADERBLOCK_H
#define HOSTSVC_KSHEADERBLOCK_H

#include <array>
#include <cstdint>

#include "norv/norv.h"

// Fourteen 32-bit words, big-endian: the header's low octet of word 0, transaction, type; node, board and
// processor of source and target; instance and component of source and target; body size.
using KSHeaderBlock = std::array<std::uint32_t, 14>;

// Words that go over the wire as they are.
KSHeaderBlock ks_headerBlock(const NvMsg32Bit& msg);

// Fills msg's header, but for its size, which is its buffer's. A block of fewer octets than fourteen words
// leaves the rest 0.
void ks_fillHeader(NvMsg32Bit& msg, const char* block, int nbytes);

#endif
