// The switch variants of a trunk, and sets of them.
#ifndef DECODER_TRUNKS_H
#define DECODER_TRUNKS_H

#include "decoder/state.h"

namespace decoder {

// A set of variants. Bit n stands for the variant for which `swit` is n.
struct Trunks {
    unsigned members;
};

constexpr Trunks operator|(Trunks a, Trunks b) { return {a.members | b.members}; }

inline constexpr Trunks att4ess{1U << 1};
inline constexpr Trunks ess5{1U << 2};
inline constexpr Trunks dms100{1U << 3};
inline constexpr Trunks ntt{1U << 4};
inline constexpr Trunks net5{1U << 7};
inline constexpr Trunks ni2{1U << 10};

// The trunks whose elements are shown in full. 5ESS and NI2, and trunks of unknown variants, have the short
// form: several of their elements are shown only in part.
inline constexpr Trunks inFull = att4ess | dms100 | ntt | net5;

// Whether the trunk that this thread decodes for is one of them.
inline bool on(Trunks trunks) { return swit > 0 && swit < 32 && ((trunks.members >> swit) & 1U) != 0; }

}  // namespace decoder

#endif
