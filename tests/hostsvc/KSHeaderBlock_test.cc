#include "hostsvc/KSHeaderBlock.h"

#include <gmock/gmock.h>

#include <cstring>

#include "tests/support/tcp.h"

namespace {

constexpr NvMsg32Bit sentHeader{0x12345678, 0x800001, 1001, 2, 3, 1004, 5, 6, 7, 8, 9, 10, 11};

const tcp::Octets sentBlock = tcp::words({0x78, 0x123456, 0x800001, 7, 2, 3, 9, 5, 6, 1001, 8, 1004, 10, 11});

tcp::Octets octetsOf(const KSHeaderBlock& block) {
    tcp::Octets octets(sizeof block);
    std::memcpy(octets.data(), block.data(), sizeof block);
    return octets;
}

NvMsg32Bit filled(std::size_t octets) {
    NvMsg32Bit msg{};
    msg.size = 77;
    ks_fillHeader(msg, reinterpret_cast<const char*>(sentBlock.data()), static_cast<int>(octets));
    return msg;
}

TEST(KSHeaderBlock, EachFieldHasItsWord) { EXPECT_EQ(octetsOf(ks_headerBlock(sentHeader)), sentBlock); }

TEST(KSHeaderBlock, TheHeaderComesBackButForTheSizeOfItsBuffer) {
    NvMsg32Bit expected = sentHeader;
    expected.size = 77;
    const NvMsg32Bit msg = filled(56);
    EXPECT_EQ(std::memcmp(&msg, &expected, sizeof msg), 0);
}

TEST(KSHeaderBlock, WordsThatAreMissingLeaveTheirFields0) {
    const NvMsg32Bit msg = filled(4 * 12);
    EXPECT_EQ(msg.targetInstance, 1004);
    EXPECT_EQ(msg.targetComponent, 0);
    const NvMsg32Bit none = filled(0);
    EXPECT_EQ(none.transaction, 0U);
    EXPECT_EQ(none.size, 77U);
}

}  // namespace
