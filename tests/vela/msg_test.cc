// One transport message as an object.
#include "vela/Msg.h"

#include "tests/vela/transport.h"
#include "vela/StdResource.h"

namespace {

using vela::CompDesc_t;
using vela::Msg;

class MsgTest : public TransportTest {};

void address(Msg& msg) {
    msg.setMsgType(32);
    msg.setTrans(10001);
    msg.setSrcAddr(CompDesc_t(1, 1, 1, 0x15, 0));
    msg.setTgtAddr(CompDesc_t(0x1001, 9, 8, 7, 6));
}

TEST_F(MsgTest, ANewMessageHasTheSizeAskedForAndNoBody) {
    const Msg msg(20);
    EXPECT_EQ(msg.getSize(), 20U);
    EXPECT_THAT(fake_norv::texts(), testing::ElementsAre("nvMsgAllocate(20)"));
}

TEST_F(MsgTest, ItsHeaderIsSetAndRead) {
    Msg msg(0U);
    address(msg);
    EXPECT_EQ(msg.getMsgType(), 32U);
    EXPECT_EQ(msg.getTrans(), 10001U);
    EXPECT_EQ(msg.getSrcAddr(), CompDesc_t(1, 1, 1, 0x15, 0));
    EXPECT_EQ(msg.getTgtAddr(), CompDesc_t(0x1001, 9, 8, 7, 6));
    unsigned int in = 1001, out = 0;
    EXPECT_EQ(msg.fieldPut(3, &in), 0U);
    EXPECT_EQ(msg.fieldGet(3, &out), 0U);
    EXPECT_EQ(out, 1001U);
    msg.realloc(30);
    EXPECT_EQ(msg.getSize(), 30U);
}

TEST_F(MsgTest, TakesOverTheMessageOfAHandle) {
    KSMsgRef handle(4U);
    {
        const Msg msg(&handle);
        EXPECT_EQ(handle.getMsgRef(), nullptr);
        EXPECT_EQ(fake_norv::outstanding(), 1U);
    }
    EXPECT_EQ(fake_norv::outstanding(), 0U);
}

TEST_F(MsgTest, AMessageWhoseBufferHasGoneFreesNothing) {
    Msg msg(4);
    const KSMsgRef buffer(*msg.getMsgRef());
    *msg.getMsgRef() = KSMsgRef();
    KSMsgRef(buffer).free();
}

TEST_F(MsgTest, ACopyHasTheWholeBufferButNoBody) {
    const auto original = messageOf({1, 2, 3, 4, 5, 6, 7, 8});
    address(*original);
    auto body = std::make_unique<vela::StdResource::MsgSetParm_t>();
    original->setBodyDef(body.release());
    const Msg copy(*original);
    EXPECT_EQ(std::memcmp(copy.getNvMsgRef(), original->getNvMsgRef(), 8 + NVMSG_OVERHEAD), 0);
    EXPECT_NE(copy.getNvMsgRef(), original->getNvMsgRef());
    EXPECT_THAT(printed(copy), testing::HasSubstr("ByteData"));
    EXPECT_THAT(printed(*original), testing::HasSubstr("Parm"));
}

constexpr const char* head =
    "{MsgType: 0x20 Source: {Node 0 Board 0x1 Processor 0x1 Component 0x15 Instance 0x1} "
    "Target: {Node 0x6 Board 0x9 Processor 0x8 Component 0x7 Instance 0x1001} ";

TEST_F(MsgTest, WithoutABodyItPrintsItsOctetsInHexadecimal) {
    const auto msg = messageOf({0, 9, 10, 255});
    address(*msg);
    EXPECT_EQ(printed(*msg), std::string(head) + "Size: 4 Trans: 10001 Body: {ByteData {0 0x9 0xa 0xff }}}");
}

TEST_F(MsgTest, WithABodyItPrintsThePayloadDecodedInHexadecimal) {
    const auto msg = messageOf(fake_norv::words({10, 1001}));
    address(*msg);
    msg->setBodyDef(std::make_unique<vela::StdResource::MsgInit_t>().release());
    msg->setBodyDef(std::make_unique<vela::StdResource::MsgSetParm_t>().release());
    EXPECT_EQ(printed(*msg), std::string(head) + "Size: 8 Trans: 10001 Body: {Parm 0xa Val 0x3e9}}");
}

TEST_F(MsgTest, TakesTheBodyThatItHasAgain) {
    const auto msg = messageOf(fake_norv::words({10, 1001}));
    auto body = std::make_unique<vela::StdResource::MsgSetParm_t>();
    vela::MsgBody* const same = body.release();
    msg->setBodyDef(same);
    msg->setBodyDef(same);
    EXPECT_THAT(printed(*msg), testing::HasSubstr("{Parm 0xa Val 0x3e9}"));
}

TEST_F(MsgTest, GivesTheStreamItsFlagsBack) {
    const auto msg = messageOf({10});
    std::ostringstream out;
    out << std::oct << std::uppercase << *msg;
    out.str("");
    out << 8;
    EXPECT_EQ(out.str(), "10");
    EXPECT_TRUE(out.flags() & std::ios_base::uppercase);
    EXPECT_FALSE(out.flags() & std::ios_base::showbase);
}

TEST_F(MsgTest, SaysWhichSizeTheTransportHasNoMemoryFor) {
    fake_norv::fail(fake_norv::Op::allocate);
    try {
        const Msg msg(1001);
        FAIL() << "nothing was thrown";
    } catch (const KSMsgRef::AllocationError& error) {
        EXPECT_EQ(error.size(), 1001U);
    }
}

}  // namespace
