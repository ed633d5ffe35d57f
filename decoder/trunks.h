// The switch variants of a trunk, and sets of them.
#ifndef DECODER_TRUNKS_H
#define DECODER_TRUNKS_H

#include "decoder/state.h"

namespace decoder {

// A set of variants; a variant's place in it is the value that `swit` has on such a trunk.
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

// The trunks whose elements are shown in full. 5ESS and NI2, and a trunk of no known variant, get the short
// form.
inline constexpr Trunks inFull = att4ess | dms100 | ntt | net5;

// Whether the trunk being traced is one of them.
inline bool on(Trunks trunks) { return swit > 0 && swit < 32 && ((trunks.members >> swit) & 1U) != 0; }

}  // namespace decoder

#endif
