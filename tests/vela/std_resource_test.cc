// The standard commands as they stand on the wire.
#include "vela/StdResource.h"

#include "tests/vela/transport.h"

namespace {

using vela::Addressable;
using vela::CompDesc_t;
using vela::StdResource;

class StdResourceTest : public TransportTest {
  protected:
    // The one command sent, as its type and words.
    void expectSent(std::uint32_t type, const Octets& body) {
        const std::vector<fake_norv::Message> sent = fake_norv::written();
        ASSERT_EQ(sent.size(), 1U);
        EXPECT_EQ(sent[0].type, type);
        EXPECT_EQ(sent[0].body, body);
        EXPECT_EQ(CompDesc_t(sent[0].target), resource_.getTgtDesc());
    }

    ScriptedBoard board_;
    StdResource resource_{CompDesc_t(1, 1, 1, 0x15, 0), nullptr};
};

TEST_F(StdResourceTest, SetsAParameter) {
    board_.answers(8, 9);
    StdResource::MsgSetParmCmplt_t reply;
    resource_.SetParm(10, 1001, &reply);
    expectSent(8, fake_norv::words({10, 1001}));
}

TEST_F(StdResourceTest, GetsAParameter) {
    board_.answers(18, 19, fake_norv::words({7, 1001, 0}));
    StdResource::MsgGetParmCmplt_t reply;
    resource_.GetParm(7, &reply);
    expectSent(18, fake_norv::words({7}));
    EXPECT_EQ(printed(reply), "{Num 7 Val 1001 TextSize 0 Text {}}");
}

TEST_F(StdResourceTest, GetsAParameterThatIsAText) {
    Octets body = fake_norv::words({7, 0, 3});
    for (const char c : {'a', 'b', 'c'})
        body.push_back(static_cast<std::uint8_t>(c));
    board_.answers(18, 19, body);
    StdResource::MsgGetParmCmplt_t reply;
    resource_.GetParm(7, &reply);
    EXPECT_EQ(printed(reply), "{Num 7 Val 0 TextSize 3 Text {a b c}}");
    EXPECT_EQ(fieldCalls(fake_norv::Op::varFieldGet), "@0 0x380000\n@4 0x380000 0x380000\n@12 0x501000\n");
}

TEST_F(StdResourceTest, SubscribesForItsOwnQueueOrForAnotherObject) {
    board_.answers(22, 23);
    resource_.DetectEvt(2, 3, nullptr);
    expectSent(22, {1, 0x10, 9, 8, 7, 6, 2, 0, 0, 0, 3, 0, 0, 0});
    Addressable other(CompDesc_t(0x0201, 3, 4, 5, 6), resource_.getMsgQueue());
    resource_.DetectEvt(2, 3, &other);
    EXPECT_EQ(fake_norv::written().at(1).body, (Octets{1, 2, 3, 4, 5, 6, 2, 0, 0, 0, 3, 0, 0, 0}));
}

TEST_F(StdResourceTest, EndsASubscription) {
    board_.answers(26, 27);
    resource_.CancelEvt(2, nullptr);
    expectSent(26, fake_norv::words({2}));
}

TEST_F(StdResourceTest, ACommandThatIsRefusedIsUnexpected) {
    board_.answers(8, 0, fake_norv::words({8, 3, 10, 1001}));
    EXPECT_THROW(resource_.SetParm(10, 1001, nullptr), Addressable::UnexpectedMsg);
}

}  // namespace
