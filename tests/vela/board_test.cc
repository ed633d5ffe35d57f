// Boards, what is found on them, and the handles on it.
#include "vela/Board.h"

#include "tests/vela/transport.h"
#include "vela/CCS.h"
#include "vela/TSCComponent.h"

namespace {

using fake_norv::Message;
using vela::CompDesc_t;
using vela::Instance;
using vela::TmpInstance;

constexpr std::uint32_t compFind = 8388669, componentResult = 8388615, resultComplete = 8388608;
constexpr std::uint32_t compUse = 8388697, compUnuse = 8388698, compInstFree = 8388673;

const CompDesc_t Managers(0, 3, 0, 0, 0);
const CompDesc_t Found(2, 3, 1, 0x15, 0);

class BoardTest : public TransportTest {
  protected:
    BoardTest() {
        script_.answers(compFind, componentResult, {2, 0, 3, 1, 0x15, 0});
        script_.answers(compUse, resultComplete);
        script_.answers(compUnuse, resultComplete);
        script_.answers(compInstFree, resultComplete);
    }

    // Types of what was sent to the managers since the last look, and the bodies' octets.
    std::vector<Message> sent() {
        std::vector<Message> all = fake_norv::written();
        all.erase(all.begin(), all.begin() + static_cast<std::ptrdiff_t>(seen_));
        seen_ += all.size();
        for (const Message& message : all)
            EXPECT_EQ(CompDesc_t(message.target), Managers);
        return all;
    }
    std::vector<std::uint32_t> sentTypes() {
        std::vector<std::uint32_t> types;
        for (const Message& message : sent())
            types.push_back(message.type);
        return types;
    }

    ScriptedBoard script_;
    vela::Board board_{3, nullptr};
    std::size_t seen_ = 0;
};

TEST_F(BoardTest, IsAddressedByItsNumberAlone) {
    EXPECT_EQ(board_.getTgtDesc(), Managers);
    EXPECT_EQ(fake_norv::openQueues(), 1U) << "its managers share its queue";
}

TEST_F(BoardTest, FindsAComponentByItsTypeOnAProcessor) {
    const vela::Component component = board_.findComp(0x15, 1);
    EXPECT_EQ(component.getTgtDesc(), Found);
    EXPECT_EQ(component.getMsgQueue(), board_.getMsgQueue());
    const std::vector<Message> messages = sent();
    ASSERT_EQ(messages.size(), 1U);
    EXPECT_EQ(messages[0].type, compFind);
    // Instance 0, board 3, processor 1, any component, node 0; one attribute: key 0, value 0x15.
    EXPECT_EQ(messages[0].body, (Octets{0, 0, 3, 1, 255, 0, 1, 0, 0, 0, 0, 0, 0, 0, 0x15, 0, 0, 0}));
}

TEST_F(BoardTest, FindsAnInstanceByItsNumber) {
    const Instance instance = board_.findInst(0x15, 0xFF, 0x0102);
    EXPECT_EQ(instance.getTgtDesc(), Found);
    EXPECT_EQ(sent().at(0).body, (Octets{2, 1, 3, 0xFF, 255, 0, 1, 0, 0, 0, 0, 0, 0, 0, 0x15, 0, 0, 0}));
}

TEST_F(BoardTest, SearchesWithoutATypeWhereNoneIsGiven) {
    board_.findComp(0, 1);
    EXPECT_EQ(sent().at(0).body, (Octets{0, 0, 3, 1, 255, 0, 0, 0, 0, 0}));
}

TEST_F(BoardTest, ASearchKeepsTheCallersAttributesAsTheyAre) {
    vela::ResourceMgr manager(board_);
    vela::staticList<vela::CompAttr_t> attributes{{7, -1}};
    manager.find(0x15, 1, 0, attributes);
    EXPECT_EQ(printed(attributes), "{{key 7 value -1}}");
    EXPECT_EQ(sent().at(0).body, (Octets{0, 0,    3,    1,    255,  0, 2, 0, 0, 0,    7, 0, 0,
                                         0, 0xFF, 0xFF, 0xFF, 0xFF, 0, 0, 0, 0, 0x15, 0, 0, 0}));
}

TEST_F(BoardTest, ASearchThatFindsNothingIsAnUnexpectedReply) {
    script_.answers(compFind, 0, fake_norv::words({compFind, 4}));
    EXPECT_THROW(board_.findComp(0x15, 1), vela::Addressable::UnexpectedMsg);
    EXPECT_THROW(board_.findInst(0x15, 1, 9), vela::Addressable::UnexpectedMsg);
}

TEST_F(BoardTest, LooksBodiesUpWithBothManagers) {
    std::unique_ptr<vela::MsgBody> body(board_.MsgBodyLookup(8388691));
    EXPECT_NE(dynamic_cast<vela::ClusterMgr::ClusterFind_t*>(body.get()), nullptr);
    body.reset(board_.MsgBodyLookup(compFind));
    EXPECT_NE(dynamic_cast<vela::ResourceMgr::CompFind_t*>(body.get()), nullptr);
    EXPECT_THROW(board_.MsgBodyLookup(8), vela::Addressable::UndefinedMsgBody);
    EXPECT_THROW(board_.EvtBodyLookup(2), vela::Addressable::UndefinedEvtBody);
}

TEST_F(BoardTest, MovesToAnotherQueueWithItsManagers) {
    vela::MsgQueue* const queue = std::make_unique<vela::MsgQueue>(Managers, 512, 5).release();
    board_.MsgQueueAttach(queue);
    EXPECT_EQ(fake_norv::openQueues(), 1U);
    EXPECT_EQ(board_.findComp(0x15, 1).getMsgQueue(), queue);
}

TEST_F(BoardTest, ABoardThatCannotMoveToAQueueStaysWhereItWasWithItsManagers) {
    vela::MsgQueue* const own = board_.getMsgQueue();
    fake_norv::fail(fake_norv::Op::open, 2);
    EXPECT_THROW(board_.MsgQueueAttach(nullptr), KSResource_CreationError);
    EXPECT_EQ(board_.getMsgQueue(), own);
    EXPECT_EQ(board_.findComp(0x15, 1).getMsgQueue(), own);
    EXPECT_EQ(board_.clusterMgr().getMsgQueue(), own);
}

TEST_F(BoardTest, ObjectsThatWereFoundKeepTheQueueWhenTheBoardIsDestroyed) {
    auto board = std::make_unique<vela::Board>(3, nullptr);
    const vela::TSCComponent tsc(board->findComp(0x12, 1));
    board.reset();
    EXPECT_EQ(fake_norv::openQueues(), 2U);
}

TEST_F(BoardTest, AnInstanceMadeForUseReservesAndGivesBackOnce) {
    {
        const Instance instance(Found, board_.getMsgQueue(), 1);
        const std::vector<Message> messages = sent();
        ASSERT_EQ(messages.size(), 1U);
        EXPECT_EQ(messages[0].type, compUse);
        // One entry: the address and a payload of 0.
        EXPECT_EQ(messages[0].body, (Octets{1, 0, 0, 0, 2, 0, 3, 1, 0x15, 0, 0, 0, 0, 0}));
        const Instance copy(instance);
    }
    const std::vector<Message> messages = sent();
    ASSERT_EQ(messages.size(), 1U) << "the copy reserved nothing";
    EXPECT_EQ(messages[0].type, compUnuse);
    EXPECT_EQ(messages[0].body, (Octets{1, 0, 0, 0, 2, 0, 3, 1, 0x15, 0}));
}

TEST_F(BoardTest, InstancesThatReservedNothingSendNothing) {
    const vela::StdResource resource(Found, board_.getMsgQueue());
    {
        const Instance found = board_.findInst(0x15, 1, 2);
        const Instance plain(Found, board_.getMsgQueue());
        const Instance unused(Found, board_.getMsgQueue(), 0);
        const Instance wrapped(resource);
        const TmpInstance temporary(Found, board_.getMsgQueue());
        const TmpInstance copied(temporary);
        const TmpInstance made(resource);
        const Instance fromTemporary(temporary, 0);
    }
    EXPECT_THAT(sentTypes(), testing::ElementsAre(compFind));
}

TEST_F(BoardTest, AnInstanceMadeOfATemporaryOneMayReserve) {
    const TmpInstance temporary(Found, board_.getMsgQueue());
    { const Instance instance(temporary, 1); }
    EXPECT_THAT(sentTypes(), testing::ElementsAre(compUse, compUnuse));
}

TEST_F(BoardTest, AnInstanceThatCannotBeReservedIsNotMade) {
    script_.answers(compUse, 0, fake_norv::words({compUse, 1}));
    EXPECT_THROW(Instance(Found, board_.getMsgQueue(), 1), vela::Addressable::UnexpectedMsg);
    EXPECT_THAT(sentTypes(), testing::ElementsAre(compUse));
}

TEST_F(BoardTest, AnInstanceThatCannotBeGivenBackSaysSo) {
    CapturedErrors errors;
    {
        const Instance instance(Found, board_.getMsgQueue(), 1);
        script_.answers(compUnuse, 0, fake_norv::words({compUnuse, 1}));
    }
    EXPECT_THAT(errors.text(), testing::HasSubstr("Addressable::UnexpectedMsg"));
}

// Each call of an instance is remembered, through whatever reference it is made.
TEST_F(BoardTest, AnInstanceGivesBackWhatItReservedAndHasNotGivenBackItself) {
    const struct {
        const char* says;
        void (*act)(vela::StdResource&);
        std::vector<std::uint32_t> sent;
    } cases[] = {
        {"reserved", [](vela::StdResource& r) { r.use(1001); }, {compUse, compUnuse}},
        {"reserved and given back",
         [](vela::StdResource& r) {
             r.use(1001);
             r.unuse();
         },
         {compUse, compUnuse}},
        {"reserved and freed",
         [](vela::StdResource& r) {
             r.use(1001);
             r.free();
         },
         {compUse, compInstFree}},
        {"reserved again",
         [](vela::StdResource& r) {
             r.use(1001);
             r.unuse();
             r.use(1002);
         },
         {compUse, compUnuse, compUse, compUnuse}},
    };
    for (const auto& c : cases) {
        {
            Instance instance(Found, board_.getMsgQueue());
            c.act(instance);
        }
        EXPECT_EQ(sentTypes(), c.sent) << c.says;
    }
}

TEST_F(BoardTest, AnInstanceThatTheBoardRefusesStaysAsItWas) {
    script_.answers(compUse, 0, fake_norv::words({compUse, 1}));
    script_.answers(compInstFree, 0, fake_norv::words({compInstFree, 1}));
    {
        Instance refused(Found, board_.getMsgQueue());
        EXPECT_THROW(refused.use(0), vela::Addressable::UnexpectedMsg);
    }
    EXPECT_THAT(sentTypes(), testing::ElementsAre(compUse)) << "nothing was reserved";
    script_.answers(compUse, resultComplete);
    {
        Instance kept(Found, board_.getMsgQueue(), 1);
        EXPECT_THROW(kept.free(), vela::Addressable::UnexpectedMsg);
    }
    EXPECT_THAT(sentTypes(), testing::ElementsAre(compUse, compInstFree, compUnuse)) << "still reserved";
}

TEST_F(BoardTest, ATemporaryInstanceGivesNothingBackWhateverWasDoneWithIt) {
    {
        TmpInstance temporary(Found, board_.getMsgQueue());
        temporary.use(1001);
        const TmpInstance copy(temporary);
    }
    EXPECT_THAT(sentTypes(), testing::ElementsAre(compUse));
}

TEST_F(BoardTest, AResourceIsUsedUnusedAndFreedThroughTheManager) {
    vela::StdResource resource(Found, board_.getMsgQueue());
    resource.use(1001);
    resource.unuse();
    resource.free();
    const std::vector<Message> messages = sent();
    ASSERT_EQ(messages.size(), 3U);
    EXPECT_EQ(messages[0].body, (Octets{1, 0, 0, 0, 2, 0, 3, 1, 0x15, 0, 0xE9, 3, 0, 0}));
    EXPECT_EQ(messages[2].type, compInstFree);
    EXPECT_EQ(messages[2].body, (Octets{2, 0, 3, 1, 0x15, 0}));
}

TEST_F(BoardTest, ACcsDecodesItsTraceRecordsAndNothingElseOfItsOwn) {
    vela::CCS ccs(Found, board_.getMsgQueue());
    const std::unique_ptr<vela::MsgBody> trace(ccs.EvtBodyLookup(2));
    EXPECT_NE(dynamic_cast<vela::CCS::EvtL2Trace_t*>(trace.get()), nullptr);
    EXPECT_THROW(ccs.EvtBodyLookup(3), vela::Addressable::UndefinedEvtBody);
    const std::unique_ptr<vela::MsgBody> standard(ccs.MsgBodyLookup(9));
    EXPECT_NE(dynamic_cast<vela::StdResource::MsgSetParmCmplt_t*>(standard.get()), nullptr);
}

}  // namespace
