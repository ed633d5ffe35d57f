// Contents of FACILITY of every kind, and what holds for the fields of any octets.
#ifndef TESTS_ISDN_FACILITY_OCTETS_H
#define TESTS_ISDN_FACILITY_OCTETS_H

#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "isdn/facility.h"

namespace isdn::testing {

inline constexpr const char* facilities[] = {
    "91 A1 1A 02 01 06 02 01 23 30 12 30 10 A1 0E 81 03 45 55 52 A2 07 81 02 04 D2 82 01 01",
    "91 A1 1E 02 01 07 02 01 0F 30 16 02 01 01 0A 01 02 A1 0E A0 0C A1 0A 0A 01 02 12 05 31 32 33 34 35",
    "9F AA 0D 80 01 00 A1 05 80 03 31 32 33 82 01 01 8B 01 00 A1 0B 02 01 08 02 01 00 80 03 42 6F 62",
    "91 A1 80 02 01 01 02 01 63 30 80 12 02 34 32 01 01 FF 05 00 85 01 AB 06 01 2A 00 00 00 00",
    "91 A2 10 02 01 0A 30 0B 06 06 04 00 82 71 01 04 02 01 2A A3 06 02 01 09 02 01 00 A4 05 05 00 80 01 02",
    "92 30 05 9F 81 01 01 AA",
};

// The fields of these contents stand in order and cover each bit of them exactly once.
inline void expectEachBitOnce(const std::vector<std::uint8_t>& contents) {
    Fields fields;
    facilityFields(contents, Variant::net5, fields);
    const std::uint8_t* at = contents.data();
    int bit = 8;
    for (const Field& field : fields) {
        ASSERT_EQ(field.at.data(), at) << "field " << field.name;
        ASSERT_FALSE(field.at.empty()) << "field " << field.name;
        ASSERT_EQ(int{field.high}, bit) << "field " << field.name;
        bit = field.low - 1;
        if (bit == 0) {
            at += field.at.size();
            bit = 8;
        }
    }
    ASSERT_EQ(at, contents.data() + contents.size());
    ASSERT_EQ(bit, 8);
}

}  // namespace isdn::testing

#endif
