#include "hostsvc/KSByteOrder.h"

#include <cstdint>
#include <cstring>

void KS_htonU32(void* dst, void* src, int nbytes) {
    auto* to = static_cast<unsigned char*>(dst);
    const auto* from = static_cast<const unsigned char*>(src);
    for (int words = nbytes / 4; words > 0; --words, to += 4, from += 4) {
        std::uint32_t word = 0;
        std::memcpy(&word, from, sizeof word);
        word = __builtin_bswap32(word);
        std::memcpy(to, &word, sizeof word);
    }
}

void KS_ntohU32(void* dst, void* src, int nbytes) { KS_htonU32(dst, src, nbytes); }
