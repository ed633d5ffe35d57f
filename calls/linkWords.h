// What a LinkWatch and its deadlines have in common. Internal to calls/.
#ifndef CALLS_LINKWORDS_H
#define CALLS_LINKWORDS_H

#include <array>
#include <cstdint>
#include <string>

#include "calls/Message.h"

namespace calls {

inline constexpr unsigned repetitions200 = 3;  // N200
inline constexpr std::array bothSides{Side::us, Side::peer};

inline std::string wordsOf(Side side) { return side == Side::us ? "our side" : "the other side"; }

// "1.0 s".
inline std::string secondsOf(std::int64_t duration) {
    const std::int64_t tenths = (duration + 50 * millisecond) / (100 * millisecond);
    return std::to_string(tenths / 10) + "." + std::to_string(tenths % 10) + " s";
}

}  // namespace calls

#endif
