// Requests with and without reply: over the queue, and over an object.
#include <set>
#include <thread>

#include "tests/vela/transport.h"
#include "vela/Addressable.h"
#include "vela/MsgQueue.h"
#include "vela/StdResource.h"
#include "vela/vela.h"

namespace {

using fake_norv::Message;
using fake_norv::replyTo;
using vela::Addressable;
using vela::CompDesc_t;
using vela::Msg;
using vela::MsgQueue;
using vela::StdResource;

constexpr unsigned int soon = 20;  // ms; long enough to be looked at, and then it is over

const CompDesc_t Ccs(1, 1, 1, 0x15, 0);
constexpr const char* objectText =
    "{TgtDesc: {Node 0 Board 1 Processor 1 Component 21 Instance 1} "
    "HostDesc: {Node 6 Board 9 Processor 8 Component 7 Instance 4097}";
constexpr const char* hexObjectText =
    "{TgtDesc: {Node 0 Board 0x1 Processor 0x1 Component 0x15 Instance 0x1} "
    "HostDesc: {Node 0x6 Board 0x9 Processor 0x8 Component 0x7 Instance 0x1001}";

class RequestTest : public TransportTest {
  protected:
    RequestTest() {
        ccs_.setErrorWaitTime(soon);
        cmd_.Parm = 10;
        cmd_.Val = 1;
    }

    // What is thrown, printed.
    template <typename Thrown, typename Action>
    static std::string thrown(Action action) {
        try {
            action();
        } catch (const Thrown& exception) {
            return printed(exception);
        }
        ADD_FAILURE() << "nothing was thrown";
        return "";
    }

    ScriptedBoard board_;
    CapturedErrors errors_;
    StdResource ccs_{Ccs, nullptr};
    StdResource::MsgSetParm_t cmd_;
    StdResource::MsgGetParmCmplt_t reply_;
};

TEST_F(RequestTest, TheCommandGoesToTheObjectWithItsTypeAndBodyFromTheQueue) {
    board_.answers(8, 9);
    ccs_.request(8, &cmd_, 9, nullptr);
    const Message sent = fake_norv::written().at(0);
    EXPECT_EQ(sent.type, 8U);
    EXPECT_EQ(CompDesc_t(sent.target), Ccs);
    EXPECT_EQ(CompDesc_t(sent.source), ccs_.getMsgQueue()->getHostDesc());
    EXPECT_EQ(sent.body, fake_norv::words({10, 1}));
}

TEST_F(RequestTest, TheReplyIsReadIntoTheCallersBody) {
    board_.answers(18, 19, fake_norv::words({7, 1001, 0}));
    ccs_.request(18, &cmd_, 19, &reply_);
    EXPECT_EQ(reply_.Num, 7U);
    EXPECT_EQ(reply_.Val, 1001U);
}

TEST_F(RequestTest, TransactionsCountUpwardsUnlessTheCallerNamesOne) {
    board_.answers(8, 9);
    const unsigned int next = vela::getUniqueTransId() + 1;
    ccs_.request(8, &cmd_, 9, nullptr);
    ccs_.request(8, &cmd_, 9, nullptr);
    ccs_.request(8, &cmd_, 9, nullptr, 77);
    ccs_.request(8, &cmd_, 9, nullptr);
    std::vector<unsigned int> transactions;
    for (const Message& sent : fake_norv::written())
        transactions.push_back(sent.transaction);
    EXPECT_THAT(transactions, testing::ElementsAre(next, next + 1, 77, next + 2));
}

TEST_F(RequestTest, SilenceIsATimeout) {
    ccs_.setResponseTimeout(soon);
    EXPECT_EQ(thrown<Addressable::Timeout>([&] { ccs_.request(8, &cmd_, 9, nullptr, 1001); }),
              std::string("Addressable::Timeout ObjSource: ") + objectText +
                  " CmdMsgType: 0x8 RetMsgType: 0x9 Trans: 1001 Timeout: 20ms");
}

TEST_F(RequestTest, ALostCommandIsATimeout) {
    board_.answers(8, 9);
    ccs_.setResponseTimeout(soon);
    fake_norv::fail(fake_norv::Op::write);
    EXPECT_THROW(ccs_.request(8, &cmd_, 9, nullptr), Addressable::Timeout);
    EXPECT_NO_THROW(ccs_.request(8, &cmd_, 9, nullptr));
}

TEST_F(RequestTest, AnErrorReplyIsUnexpectedAndTravelsWithTheException) {
    board_.answers(8, 0, fake_norv::words({8, 3, 10, 1}));
    try {
        ccs_.request(8, &cmd_, 9, nullptr, 1001);
        FAIL() << "nothing was thrown";
    } catch (const Addressable::UnexpectedMsg& unexpected) {
        EXPECT_EQ(unexpected.cmdMsgType(), 8U);
        StdResource::MsgError_t error;
        unexpected.msg()->read(&error, 0);
        EXPECT_EQ(printed(error), "{ErrorMsg 8 ErrorCode 3 Data {Num 10 Val 1}}");
        EXPECT_EQ(fake_norv::outstanding(), 1U);
    }
    EXPECT_EQ(fake_norv::outstanding(), 0U);
}

TEST_F(RequestTest, AnUnexpectedReplyPrintsObjectCommandAndReplyInHexadecimal) {
    board_.answers(8, 0, {8, 10});
    EXPECT_EQ(
        thrown<Addressable::UnexpectedMsg>([&] { ccs_.request(8, &cmd_, 9, nullptr, 1001); }),
        std::string("Addressable::UnexpectedMsg ObjSource: ") + hexObjectText +
            " CmdMsgType 0x8 RespMsg: {MsgType: 0 Source: {Node 0 Board 0x1 Processor 0x1 Component 0x15 "
            "Instance 0x1} Target: {Node 0x6 Board 0x9 Processor 0x8 Component 0x7 Instance 0x1001} "
            "Size: 2 Trans: 1001 Body: {ByteData {0x8 0xa }}}");
}

TEST_F(RequestTest, TheGeneralReplyIsAReplyButNotTheExpectedOne) {
    board_.answers(8, 0x800001);
    EXPECT_THAT(thrown<Addressable::UnexpectedMsg>([&] { ccs_.request(8, &cmd_, 9, nullptr); }),
                testing::HasSubstr("RespMsg: {MsgType: 0x800001"));
    board_.answers(9, 0x800001);
    EXPECT_NO_THROW(ccs_.request(9, &cmd_, 0x800001, nullptr));
}

TEST_F(RequestTest, AReplyOfType0IsAnErrorEvenWhereItIsTheExpectedOne) {
    board_.answers(8, 0);
    EXPECT_THROW(ccs_.request(8, &cmd_, 0, nullptr), Addressable::UnexpectedMsg);
}

TEST_F(RequestTest, AnotherTypeAnswersNothing) {
    board_.answers(8, 11);
    ccs_.setResponseTimeout(soon);
    EXPECT_THROW(ccs_.request(8, &cmd_, 9, nullptr), Addressable::Timeout);
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    EXPECT_THAT(errors_.text(), testing::HasSubstr("Unregisterd Source sent to MsgQueue"));
}

TEST_F(RequestTest, AnotherTransactionAnswersNothing) {
    board_.script(8, [](const Message& m) {
        Message other = replyTo(m, 9);
        ++other.transaction;
        fake_norv::deliver(other);
        fake_norv::deliver(replyTo(m, 9));
    });
    EXPECT_NO_THROW(ccs_.request(8, &cmd_, 9, nullptr));
    EXPECT_THAT(errors_.text(), testing::HasSubstr("Unregisterd Source sent to MsgQueue"));
}

TEST_F(RequestTest, AnotherSourceAnswersNothingUnlessAnyMay) {
    board_.script(8, [](const Message& m) {
        Message other = replyTo(m, 9);
        other.source.instance = 2;
        fake_norv::deliver(other);
    });
    ccs_.setResponseTimeout(soon);
    EXPECT_THROW(ccs_.request(8, &cmd_, 9, nullptr), Addressable::Timeout);
    ccs_.setResponseTimeout(Addressable::DefaultResponseTimeout);
    EXPECT_NO_THROW(ccs_.request(8, &cmd_, 9, nullptr, 0, 1));
    EXPECT_THAT(errors_.text(), testing::HasSubstr("Unregisterd Source sent to MsgQueue"));
}

TEST_F(RequestTest, ALateReplyGoesToTheHandlerForUnsolicitedMessages) {
    ccs_.setResponseTimeout(soon);
    Message late;
    board_.script(8, [&](const Message& m) { late = replyTo(m, 9); });
    EXPECT_THROW(ccs_.request(8, &cmd_, 9, nullptr), Addressable::Timeout);
    ASSERT_TRUE(fake_norv::deliver(late));
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    EXPECT_EQ(fake_norv::outstanding(), 0U);
    EXPECT_THAT(errors_.text(), testing::HasSubstr("MsgType 9\n"));
}

TEST_F(RequestTest, AReplyThatComesTwiceAnswersOnce) {
    board_.script(8, [](const Message& m) {
        fake_norv::deliver(replyTo(m, 9));
        fake_norv::deliver(replyTo(m, 9));
    });
    board_.answers(18, 19, fake_norv::words({7, 1001, 0}));
    for (int i = 0; i < 5; ++i) {
        EXPECT_NO_THROW(ccs_.request(8, &cmd_, 9, nullptr));
        EXPECT_NO_THROW(ccs_.request(18, &cmd_, 19, &reply_));
    }
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    EXPECT_EQ(fake_norv::outstanding(), 0U);
}

TEST_F(RequestTest, AShortReplyLeavesTheMissingFields0) {
    board_.answers(18, 19, {7, 0, 0, 0, 1, 2});
    reply_.Val = 1001;
    ccs_.request(18, &cmd_, 19, &reply_);
    EXPECT_EQ(reply_.Num, 7U);
    EXPECT_EQ(reply_.Val, 0U);
}

TEST_F(RequestTest, ACommandWithoutReplyIsDoneWhenNothingComesBack) {
    EXPECT_NO_THROW(ccs_.request(30, &cmd_));
    EXPECT_EQ(fake_norv::written().at(0).type, 30U);
}

TEST_F(RequestTest, ACommandWithoutReplyThatIsAnsweredInTimeHasFailed) {
    board_.answers(30, 0, fake_norv::words({30, 1}));
    ccs_.setErrorWaitTime(Addressable::DefaultErrorWaitTime);
    EXPECT_THROW(ccs_.request(30, &cmd_), Addressable::UnexpectedMsg);
}

TEST_F(RequestTest, ACommandWithoutReplyThatIsAnsweredLaterHasSucceeded) {
    Message late;
    board_.script(30, [&](const Message& m) { late = replyTo(m, 0); });
    EXPECT_NO_THROW(ccs_.request(30, &cmd_));
    ASSERT_TRUE(fake_norv::deliver(late));
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    EXPECT_THAT(errors_.text(), testing::HasSubstr("MsgType 0\n"));
}

TEST_F(RequestTest, TheFlagsOfACommandWithoutReplySayWhetherAnotherSourceMayRefuse) {
    board_.script(30, [](const Message& m) {
        Message other = replyTo(m, 0);
        other.source.instance = 2;
        fake_norv::deliver(other);
    });
    EXPECT_NO_THROW(ccs_.request(30, &cmd_));
    ccs_.setErrorWaitTime(Addressable::DefaultErrorWaitTime);
    EXPECT_THROW(ccs_.request(30, &cmd_, 0, 1), Addressable::UnexpectedMsg);
}

TEST_F(RequestTest, WithoutAWaitNothingIsWaitedFor) {
    board_.answers(30, 0);
    ccs_.setErrorWaitTime(0);
    EXPECT_NO_THROW(ccs_.request(30, &cmd_));
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    ccs_.setResponseTimeout(0);
    EXPECT_EQ(thrown<Addressable::Timeout>([&] { ccs_.request(18, &cmd_, 19, nullptr, 1001); }),
              std::string("Addressable::Timeout ObjSource: ") + objectText +
                  " CmdMsgType: 0x12 RetMsgType: 0x13 Trans: 1001 Timeout: 0ms");
    EXPECT_THAT(errors_.text(), testing::HasSubstr("MsgType 0\n"));
}

TEST_F(RequestTest, NoMemoryForTheCommandIsTheTransportsExceptionAndNothingIsSent) {
    fake_norv::fail(fake_norv::Op::allocate);
    EXPECT_THROW(ccs_.request(8, &cmd_, 9, nullptr), KSMsgRef::AllocationError);
    EXPECT_TRUE(fake_norv::written().empty());
}

TEST_F(RequestTest, FromManyThreadsEachGetsItsOwnReply) {
    board_.script(18, [](const Message& m) {
        Octets body = m.body;
        body.resize(12);
        fake_norv::deliver(replyTo(m, 19, body));
    });
    std::vector<std::thread> threads;
    std::atomic<int> right{0};
    for (unsigned int t = 0; t < 8; ++t) {
        threads.emplace_back([&, t] {
            for (unsigned int i = 0; i < 25; ++i) {
                StdResource::MsgGetParm_t cmd;
                cmd.Num = t * 1000 + i;
                StdResource::MsgGetParmCmplt_t reply;
                ccs_.request(18, &cmd, 19, &reply);
                right += reply.Num == cmd.Num ? 1 : 0;
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(right, 200);
    std::set<unsigned int> transactions;
    for (const Message& sent : fake_norv::written())
        transactions.insert(sent.transaction);
    EXPECT_EQ(transactions.size(), 200U);
}

TEST_F(RequestTest, AnObjectPrintsItsAddressesWithoutAClosingBrace) {
    EXPECT_EQ(printed(ccs_), objectText);
    EXPECT_EQ(printed(*ccs_.getMsgQueue()),
              "{HostDesc: {Node 6 Board 9 Processor 8 Component 7 Instance 4097}}");
}

TEST_F(RequestTest, ALookUpThatKnowsNothingNamesTheType) {
    Addressable plain(Ccs, ccs_.getMsgQueue());
    try {
        plain.MsgBodyLookup(1001);
        FAIL() << "nothing was thrown";
    } catch (const Addressable::UndefinedMsgBody& undefined) {
        EXPECT_EQ(undefined.type(), 1001U);
        EXPECT_EQ(printed(undefined), "vela::Addressable::UndefinedMsgBody");
    }
    try {
        plain.EvtBodyLookup(1002);
        FAIL() << "nothing was thrown";
    } catch (const Addressable::UndefinedEvtBody& undefined) {
        EXPECT_EQ(undefined.type(), 1002U);
        EXPECT_EQ(printed(undefined), "vela::Addressable::UndefinedEvtBody");
    }
}

TEST_F(RequestTest, ObjectsShareTheQueueTheyAreGivenAndTheLastOneClosesIt) {
    {
        auto first = std::make_unique<Addressable>(Ccs, nullptr);
        EXPECT_EQ(fake_norv::openQueues(), 2U);
        const Addressable copy(*first);
        const Addressable other(first.get());
        EXPECT_EQ(copy.getTgtDesc(), Ccs);
        EXPECT_EQ(copy.getMsgQueue(), first->getMsgQueue());
        EXPECT_NE(copy.getObjId(), first->getObjId());
        first.reset();
        EXPECT_EQ(fake_norv::openQueues(), 2U);
    }
    EXPECT_EQ(fake_norv::openQueues(), 1U);
}

TEST_F(RequestTest, AttachingToAnotherQueueLeavesTheOneBefore) {
    Addressable object(Ccs, nullptr);
    object.MsgQueueAttach(ccs_.getMsgQueue());
    EXPECT_EQ(object.getMsgQueue(), ccs_.getMsgQueue());
    EXPECT_EQ(fake_norv::openQueues(), 1U);
    object.MsgQueueAttach(nullptr);
    EXPECT_EQ(fake_norv::openQueues(), 2U);
    object.MsgQueueAttach(object.getMsgQueue());
    EXPECT_EQ(fake_norv::openQueues(), 2U);
}

// What a failed attachment leaves: the object where it was, and nobody attached to the other queue.
TEST_F(RequestTest, AnObjectThatCannotMoveToAQueueStaysWhereItWas) {
    MsgQueue* const own = ccs_.getMsgQueue();
    const auto ignore = [](Addressable*, Msg* msg) { delete msg; };
    ccs_.asyncRegisterMsgType(19, ignore, vela::EvtCallback::onDispatchingThread);
    {
        StdResource same(Ccs, nullptr);  // whose address is taken on its queue
        same.asyncRegisterMsgType(19, ignore, vela::EvtCallback::onDispatchingThread);
        EXPECT_EQ(fake_norv::openQueues(), 2U);
        EXPECT_THROW(ccs_.MsgQueueAttach(same.getMsgQueue()), vela::Exception);
        EXPECT_EQ(ccs_.getMsgQueue(), own);
    }
    EXPECT_EQ(fake_norv::openQueues(), 1U) << "the other queue went with its only holder";
    fake_norv::fail(fake_norv::Op::open, 2);
    EXPECT_THROW(ccs_.MsgQueueAttach(nullptr), KSResource_CreationError);
    EXPECT_EQ(ccs_.getMsgQueue(), own);
    board_.answers(8, 9);
    EXPECT_NO_THROW(ccs_.request(8, &cmd_, 9, nullptr));
    ASSERT_TRUE(fake_norv::deliver({1001, 19, Ccs.getNvCompDesc(), own->getHostDesc().getNvCompDesc(), {}}));
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    EXPECT_EQ(errors_.text(), "") << "its callbacks are registered as before";
}

}  // namespace
