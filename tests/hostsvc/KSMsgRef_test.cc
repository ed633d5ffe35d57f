#include "hostsvc/KSMsgRef.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <cstring>

#include "tests/support/fake_norv.h"

namespace {

using fake_norv::Op;
using testing::ElementsAre;

class KSMsgRefTest : public testing::Test {
  protected:
    KSMsgRefTest() { fake_norv::reset(); }
    ~KSMsgRefTest() override {
        EXPECT_EQ(fake_norv::outstanding(), 0U);
        EXPECT_THAT(fake_norv::misuses(), ElementsAre());
    }

    static unsigned char* octets(const KSMsgRef& msg) {
        return reinterpret_cast<unsigned char*>(msg.getMsgRef());
    }
};

using KSMsgRefDeathTest = KSMsgRefTest;

TEST_F(KSMsgRefTest, AHandleIsEmptyUntilItIsGivenABuffer) {
    const KSMsgRef empty;
    EXPECT_EQ(empty.getMsgRef(), nullptr);
    EXPECT_EQ(fake_norv::calls().size(), 0U);
}

TEST_F(KSMsgRefTest, ASizedHandleHasABufferForABodyOfThatSize) {
    KSMsgRef msg(17U);
    EXPECT_EQ(msg.getSize(), 17U);
    EXPECT_EQ(msg.free(), 0U);
    EXPECT_EQ(msg.getMsgRef(), nullptr);
    EXPECT_THAT(fake_norv::texts(), ElementsAre("nvMsgAllocate(17)", "nvMsgFree()"));
}

TEST_F(KSMsgRefTest, AnAllocationThatFailsThrowsTheSize) {
    fake_norv::fail(Op::allocate);
    try {
        const KSMsgRef msg(1234U);
        FAIL() << "no exception";
    } catch (const KSMsgRef::AllocationError& error) {
        EXPECT_EQ(error.size(), 1234U);
    }
    fake_norv::fail(Op::allocate);
    EXPECT_THROW(KSMsgRef(1U), KSException);
}

TEST_F(KSMsgRefTest, CopiesShareTheBufferAndNoneReleasesIt) {
    KSMsgRef msg(4U);
    {
        const KSMsgRef copy(msg);
        KSMsgRef assigned;
        assigned = msg;
        EXPECT_EQ(copy.getMsgRef(), msg.getMsgRef());
        EXPECT_EQ(assigned.getMsgRef(), msg.getMsgRef());
    }
    EXPECT_EQ(fake_norv::outstanding(), 1U);
    msg.free();
}

TEST_F(KSMsgRefTest, FreeingThroughOneCopyEmptiesThatOneAlone) {
    KSMsgRef msg(4U);
    const KSMsgRef other(msg);
    msg.free();
    EXPECT_EQ(msg.getMsgRef(), nullptr);
    EXPECT_NE(other.getMsgRef(), nullptr);
    EXPECT_EQ(fake_norv::count(Op::free), 1U);
}

TEST_F(KSMsgRefTest, FreeReturnsTheLibrarysStatus) {
    KSMsgRef msg(4U);
    fake_norv::fail(Op::free);
    EXPECT_EQ(msg.free(), NVSTATUS_ERROR);
    EXPECT_EQ(msg.getMsgRef(), nullptr);
}

TEST_F(KSMsgRefTest, ATransactionKeepsItsLow24BitsAndTheHeadersLowOctet) {
    KSMsgRef msg(0U);
    msg.setTrans(0x1234567);
    EXPECT_EQ(msg.getTrans(), 0x234567U);
    EXPECT_EQ(msg.getMsgRef()->transaction, 0x2345675AU);
    msg.free();
}

TEST_F(KSMsgRefTest, TheHeaderStandsAtItsPlaces) {
    KSMsgRef msg(2U);
    std::fill_n(octets(msg), 20, static_cast<unsigned char>(0));
    msg.setTrans(0x030201);
    msg.setMsgType(0x07060504);
    msg.setSrcAddr({0x0908, 10, 0xEE, 11, 17, 16, 0xEE});
    msg.setTgtAddr({0x0D0C, 14, 0xEE, 15, 19, 18, 0xEE});
    const std::vector<int> header(octets(msg), octets(msg) + 24);
    EXPECT_THAT(header, ElementsAre(0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16, 17, 18, 19,  //
                                    2, 0, 0, 0));
    EXPECT_EQ(msg.getTrans(), 0x030201U);
    EXPECT_EQ(msg.getMsgType(), 0x07060504U);
    EXPECT_EQ(msg.getSize(), 2U);
    EXPECT_TRUE(descComp(msg.getSrcAddr(), {0x0908, 10, 0, 11, 17, 16, 0}));
    EXPECT_TRUE(descComp(msg.getTgtAddr(), {0x0D0C, 14, 0, 15, 19, 18, 0}));
    msg.free();
}

TEST_F(KSMsgRefTest, ACloneHasTheHeaderTheBodyAndTheOctetsAfterIt) {
    KSMsgRef msg(5U);
    msg.setMsgType(8);
    for (unsigned char i = 0; i < 5 + 48 - 24; ++i)
        octets(msg)[24 + i] = i;
    KSMsgRef copy = msg.clone();
    EXPECT_NE(copy.getMsgRef(), msg.getMsgRef());
    EXPECT_EQ(std::memcmp(octets(copy), octets(msg), 5 + 48), 0);
    EXPECT_THAT(fake_norv::texts(), ElementsAre("nvMsgAllocate(5)", "nvMsgAllocate(5)"));
    msg.free();
    copy.free();
}

TEST_F(KSMsgRefTest, ACloneOfAnEmptyBodyCopies48Octets) {
    KSMsgRef msg(0U);
    msg.setTrans(77);
    std::fill_n(octets(msg) + 24, 24, static_cast<unsigned char>(0x31));
    KSMsgRef copy = msg.clone();
    EXPECT_EQ(copy.getTrans(), 77U);
    EXPECT_EQ(std::count(octets(copy) + 24, octets(copy) + 48, 0x31), 24);
    msg.free();
    copy.free();
}

TEST_F(KSMsgRefTest, ACloneWithoutMemoryThrowsAndLeavesTheOriginal) {
    KSMsgRef msg(9U);
    fake_norv::fail(Op::allocate);
    EXPECT_THROW(msg.clone(), KSMsgRef::AllocationError);
    EXPECT_EQ(msg.getSize(), 9U);
    msg.free();
}

TEST_F(KSMsgRefTest, ReallocResizesTheBodyAndKeepsTheMessage) {
    KSMsgRef msg(4U);
    msg.setMsgType(8);
    octets(msg)[24] = 42;
    msg.realloc(400);
    EXPECT_EQ(msg.getSize(), 400U);
    EXPECT_EQ(msg.getMsgType(), 8U);
    EXPECT_EQ(octets(msg)[24], 42);
    EXPECT_THAT(fake_norv::texts(), ElementsAre("nvMsgAllocate(4)", "nvMsgReallocate(400)"));
    msg.free();
}

TEST_F(KSMsgRefTest, ReallocOfAnEmptyHandleAllocates) {
    KSMsgRef msg;
    msg.realloc(6);
    EXPECT_EQ(msg.getSize(), 6U);
    EXPECT_THAT(fake_norv::texts(), ElementsAre("nvMsgAllocate(6)"));
    msg.free();
}

TEST_F(KSMsgRefTest, AReallocThatFailsThrowsTheSizeAndKeepsTheBuffer) {
    KSMsgRef msg(4U);
    NvMsg32Bit* const before = msg.getMsgRef();
    fake_norv::fail(Op::reallocate);
    try {
        msg.realloc(4000);
        FAIL() << "no exception";
    } catch (const KSMsgRef::AllocationError& error) {
        EXPECT_EQ(error.size(), 4000U);
    }
    EXPECT_EQ(msg.getMsgRef(), before);
    EXPECT_EQ(msg.getSize(), 4U);
    msg.free();

    fake_norv::fail(Op::allocate);
    KSMsgRef empty;
    EXPECT_THROW(empty.realloc(4), KSMsgRef::AllocationError);
    EXPECT_EQ(empty.getMsgRef(), nullptr);
}

TEST_F(KSMsgRefTest, FixedFieldsGoThroughTheLibraryAndItsStatusComesBack) {
    KSMsgRef msg(0U);
    std::uint32_t value = 1001;
    EXPECT_EQ(msg.fieldPut(3, &value), 0U);
    value = 0;
    EXPECT_EQ(msg.fieldGet(3, &value), 0U);
    EXPECT_EQ(value, 1001U);
    fake_norv::fail(Op::fieldGet);
    fake_norv::fail(Op::fieldPut);
    EXPECT_EQ(msg.fieldGet(3, &value), NVSTATUS_ERROR);
    EXPECT_EQ(msg.fieldPut(3, &value), NVSTATUS_ERROR);
    EXPECT_EQ(fake_norv::calls(Op::fieldPut).front().text, "nvMsgFieldPut(3)");
    msg.free();
}

TEST_F(KSMsgRefDeathTest, EveryAccessToAnEmptyHandleFailsTheSameAssertion) {
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    const auto failure =
        testing::HasSubstr("KSMsgRef:58: void KSMsgRef::checkValid() const: Assertion `__null' failed.\n");
    KSMsgRef empty;
    std::uint32_t value = 0;
    EXPECT_EXIT(empty.checkValid(), testing::KilledBySignal(SIGABRT), failure);
    EXPECT_DEATH(empty.clone(), failure);
    EXPECT_DEATH(empty.free(), failure);
    EXPECT_DEATH(empty.getMsgType(), failure);
    EXPECT_DEATH(empty.getSize(), failure);
    EXPECT_DEATH(empty.getTrans(), failure);
    EXPECT_DEATH(empty.getSrcAddr(), failure);
    EXPECT_DEATH(empty.getTgtAddr(), failure);
    EXPECT_DEATH(empty.setMsgType(1), failure);
    EXPECT_DEATH(empty.setTrans(1), failure);
    EXPECT_DEATH(empty.setSrcAddr({}), failure);
    EXPECT_DEATH(empty.setTgtAddr({}), failure);
    EXPECT_DEATH(empty.fieldGet(0, &value), failure);
    EXPECT_DEATH(empty.fieldPut(0, &value), failure);
}

TEST(descComp, AddressesThatDifferInUnusedOctetsAloneAreEqual) {
    EXPECT_TRUE(descComp({1, 2, 3, 4, 5, 6, 7}, {1, 2, 99, 4, 5, 6, 99}));
}

TEST(descComp, EachFieldCounts) {
    const NvCompDesc address{1, 2, 0, 4, 5, 6, 0};
    EXPECT_FALSE(descComp(address, {9, 2, 0, 4, 5, 6, 0}));
    EXPECT_FALSE(descComp(address, {0x0101, 2, 0, 4, 5, 6, 0}));
    EXPECT_FALSE(descComp(address, {1, 9, 0, 4, 5, 6, 0}));
    EXPECT_FALSE(descComp(address, {1, 2, 0, 9, 5, 6, 0}));
    EXPECT_FALSE(descComp(address, {1, 2, 0, 4, 9, 6, 0}));
    EXPECT_FALSE(descComp(address, {1, 2, 0, 4, 5, 9, 0}));
}

TEST(KSHost, StartUpMakesTheTransportReadyAndReturnsItsStatus) {
    fake_norv::reset();
    EXPECT_EQ(KSHostInit(), 0U);
    fake_norv::fail(fake_norv::Op::setInterface);
    EXPECT_EQ(KSHostInit(), NVSTATUS_ERROR);
    EXPECT_THAT(fake_norv::texts(), ElementsAre("nvDrvSetInterface(0, 0)", "nvDrvSetInterface(0, 0)"));
}

TEST(KSHost, ShutDownCallsNothing) {
    fake_norv::reset();
    KSHostCleanup();
    EXPECT_THAT(fake_norv::texts(), ElementsAre());
}

}  // namespace
