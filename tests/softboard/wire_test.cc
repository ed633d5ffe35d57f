#include "softboard/wire.h"

#include <gtest/gtest.h>

#include "softboard/hex.h"

namespace softboard {
namespace {

TEST(WireTest, FieldsAreLittleEndianPackedAndInOrder) {
    const Octets bytes{0xff};
    const Octets body =
        BodyWriter().u8(1).u16(0x0302).u32(0x07060504).address({0x0908, 10, 11, 12, 13}).octets(bytes).take();
    EXPECT_EQ(body, (Octets{1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 0xff}));

    BodyReader reader(body);
    EXPECT_EQ(reader.u8(), 1);
    EXPECT_EQ(reader.u16(), 0x0302);
    EXPECT_EQ(reader.u32(), 0x07060504U);
    EXPECT_EQ(reader.address(), (Address{0x0908, 10, 11, 12, 13}));
    EXPECT_EQ(reader.left(), 1U);
    EXPECT_EQ(reader.rest(), Octets{0xff});
    EXPECT_TRUE(reader.ok());
    EXPECT_EQ(reader.left(), 0U);
}

TEST(WireTest, AFieldThatIsNotWholeIsZeroAndTheRestIsSkipped) {
    const Octets body{1, 2, 3};
    BodyReader reader(body);
    EXPECT_EQ(reader.u32(), 0U);
    EXPECT_FALSE(reader.ok());
    EXPECT_EQ(reader.u8(), 0);
    EXPECT_TRUE(reader.rest().empty());
}

TEST(WireTest, AMessageGoesIntoABufferAndComesBack) {
    alignas(NvMsg32Bit) uint8_t buffer[64] = {};
    auto& nv = *reinterpret_cast<NvMsg32Bit*>(buffer);
    const Message message{0x1234567f, 18, {1001, 2, 3, 4, 5}, {1006, 7, 8, 9, 10}, {11, 12}};
    store(message, nv);
    const Octets expected{0x7f, 0x56, 0x34, 0x12, 18, 0,  0, 0, 0xe9, 0x03, 2, 3,  0xee,
                          0x03, 7,    8,    5,    4,  10, 9, 2, 0,    0,    0, 11, 12};
    EXPECT_EQ(Octets(buffer, buffer + expected.size()), expected);
    const Message back = messageOf(nv);
    EXPECT_EQ(back.source, message.source);
    EXPECT_EQ(back.target, message.target);
    EXPECT_EQ(back.body, message.body);
}

TEST(HexTest, OctetsAreTwoDigitsEach) {
    EXPECT_EQ(hex(Octets{0x00, 0x7f, 0xa5}), "007fa5");
    EXPECT_EQ(fromHex("007fa5"), (Octets{0x00, 0x7f, 0xa5}));
    EXPECT_THROW(fromHex("0"), std::invalid_argument);
    EXPECT_THROW(fromHex("zz"), std::invalid_argument);
}

}  // namespace
}  // namespace softboard
