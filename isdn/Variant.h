// The switch variants, and sets of them.
#ifndef ISDN_VARIANT_H
#define ISDN_VARIANT_H

#include <cstdint>

namespace isdn {

enum class Variant : std::uint8_t { net5, ni2, ess4, ess5, dms100, ntt };

struct Variants {
    std::uint8_t members;

    constexpr bool has(Variant variant) const {
        return ((members >> static_cast<unsigned>(variant)) & 1U) != 0;
    }
    friend constexpr Variants operator|(Variants a, Variants b) {
        return {static_cast<std::uint8_t>(a.members | b.members)};
    }
};

constexpr Variants only(Variant variant) {
    return {static_cast<std::uint8_t>(1U << static_cast<unsigned>(variant))};
}

inline constexpr Variants everywhere{0x3F};
constexpr Variants everywhereBut(Variant variant) {
    return {static_cast<std::uint8_t>(everywhere.members & ~only(variant).members)};
}
inline constexpr Variants northAmerica =
    only(Variant::ni2) | only(Variant::ess4) | only(Variant::ess5) | only(Variant::dms100);

}  // namespace isdn

#endif
