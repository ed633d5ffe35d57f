// Whether fields cover octets: each bit exactly once, in order.
#ifndef TESTS_ISDN_COVERAGE_H
#define TESTS_ISDN_COVERAGE_H

#include <cstddef>

#include "isdn/Field.h"

namespace isdn::testing {

// The bit at which a field begins and the one behind its end, counted from the start of `octets`.
struct Extent {
    std::size_t begin, end;
};

inline Extent extentOf(const Field& field, Octets octets) {
    const auto first = static_cast<std::size_t>(field.at.data() - octets.data());
    return {first * 8 + 8 - field.high, (first + field.at.size()) * 8 - (field.low - 1U)};
}

// How many bits from the first on are covered without a gap or an overlap.
inline std::size_t bitsCovered(const Fields& fields, Octets octets) {
    std::size_t covered = 0;
    for (const Field& field : fields) {
        const Extent extent = extentOf(field, octets);
        if (extent.begin != covered || extent.end <= extent.begin)
            return covered;
        covered = extent.end;
    }
    return covered;
}

}  // namespace isdn::testing

#endif
