// What the dispatcher reports: messages that nobody registered for, and callbacks that fail.
#include "tests/support/test_system.h"
#include "tests/vela/events.h"

namespace {

using testing::ElementsAre;
using vela::Addressable;
using vela::EvtCallback;
using vela::Handler;
using vela::Msg;

using EventReportTest = EventTest;

// ---- What nobody registered for.

constexpr const char* stars = "********************************************\n";
constexpr const char* forText =
    "For {TgtDesc: {Node 0 Board 1 Processor 1 Component 21 Instance 1} "
    "HostDesc: {Node 6 Board 9 Processor 8 Component 7 Instance 4097}\n";
constexpr const char* addressesText =
    " Source: {Node 0 Board 0x1 Processor 0x1 Component 0x15 Instance 0x1} "
    "Target: {Node 0x6 Board 0x9 Processor 0x8 Component 0x7 Instance 0x1001} ";

std::string messageBanner(const std::string& type, const std::string& message) {
    return std::string("\n") + stars + "Unregisterd MsgType " + type + "\n" + forText + message +
           "You may specify your own handler for unregisted messages using\n"
           "Addressable::asyncUnregisteredMsgType\n" +
           stars + "\n";
}

std::string eventBanner(const std::string& group, const std::string& message) {
    return std::string("\n") + stars + "Unregisterd EventGroup " + group + "\n" + forText + message +
           "You may specify your own handler for unregisted events using\n"
           "Addressable::asyncUnregisteredEvtGroup\n" +
           stars + "\n";
}

// A dispatcher with nothing in its tables.
void makeDispatcher(Addressable& object) {
    object.asyncRegisterMsgType(1001, &Recorder::msgFunction, 0);
    object.asyncCancelMsgType(1001);
}

TEST_F(EventReportTest, AnUnregisteredMessageIsReportedDecodedAndFreed) {
    makeDispatcher(*ccs_);
    ASSERT_TRUE(sendReply());
    end();
    EXPECT_EQ(fake_norv::outstanding(), 0U);
    EXPECT_EQ(
        errors_.text(),
        messageBanner("19", std::string("{MsgType: 0x13") + addressesText +
                                "Size: 12 Trans: 1001 Body: {Num 0x7 Val 0x3e9 TextSize 0 Text {}}}\n"));
}

TEST_F(EventReportTest, AnUnregisteredEventGoesToTheEventDefault) {
    makeDispatcher(*ccs_);
    ASSERT_TRUE(sendTrace());
    end();
    EXPECT_EQ(errors_.text(),
              eventBanner("2", std::string("{MsgType: 0x20") + addressesText +
                                   "Size: 17 Trans: 1001 Body: {Label 0x2 Direction 0x1 Timestamp 0x3eb "
                                   "Length 0x1 List {x}}}\n"));
}

TEST_F(EventReportTest, ATypeThatNoLookUpKnowsIsReportedAsItsOctets) {
    makeDispatcher(*ccs_);
    ASSERT_TRUE(send(0x7FFFFFFF, {0, 10}));
    end();
    EXPECT_EQ(errors_.text(),
              messageBanner("2147483647", std::string("{MsgType: 0x7fffffff") + addressesText +
                                              "Size: 2 Trans: 1001 Body: {ByteData {0 0xa }}}\n"));
}

TEST_F(EventReportTest, AGroupThatNoLookUpKnowsIsReportedAsItsOctets) {
    makeDispatcher(*ccs_);
    ASSERT_TRUE(sendEvent(1001, {7}));
    end();
    EXPECT_EQ(errors_.text(),
              eventBanner("1001", std::string("{MsgType: 0x20") + addressesText +
                                      "Size: 5 Trans: 1001 Body: {ByteData {0xe9 0x3 0 0 0x7 }}}\n"));
}

TEST_F(EventReportTest, AnEventTooShortForAGroupIsOfGroup0) {
    makeDispatcher(*ccs_);
    ASSERT_TRUE(send(32, {2}));
    end();
    EXPECT_EQ(errors_.text(), eventBanner("0", std::string("{MsgType: 0x20") + addressesText +
                                                   "Size: 1 Trans: 1001 Body: {ByteData {0x2 }}}\n"));
}

TEST_F(EventReportTest, AKeyWhoseLastCallbackWasCancelledIsUnregistered) {
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, 0);
    ccs_->asyncCancelMsgType(replyType, &recorder_, &Recorder::onMsg, 0);
    ccs_->asyncUnregisteredMsgType(&Recorder::msgFunction, onDispatcher);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(Recorder::functions().texts(1), ElementsAre(replyMessage));
}

TEST_F(EventReportTest, TheDefaultsCanBeReplacedByFunctionsOrMembers) {
    ccs_->asyncUnregisteredMsgType(&Recorder::msgFunction, 0);
    ccs_->asyncUnregisteredEvtGroup(&Recorder::msgFunction, onDispatcher);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(Recorder::functions().texts(1), ElementsAre(replyMessage));
    ASSERT_TRUE(sendTrace());
    EXPECT_THAT(Recorder::functions().texts(2), ElementsAre(replyMessage, traceMessage));
    ccs_->asyncUnregisteredMsgType(&recorder_, &Recorder::onMsg, onDispatcher);
    ccs_->asyncUnregisteredEvtGroup(&recorder_, &Recorder::onMsg, 0);
    ASSERT_TRUE(sendReply());
    ASSERT_TRUE(sendTrace());
    EXPECT_THAT(recorder_.texts(2), ElementsAre(replyMessage, traceMessage));
    for (const Recorder::Entry& entry : recorder_.entries(2))
        EXPECT_EQ(entry.owner, ccs_.get());
    end();
    EXPECT_EQ(errors_.text(), "");
}

// ---- What goes wrong.

void throwsException(Addressable*, Msg* msg) {
    delete msg;
    throw vela::Exception("a callback that fails");
}
void throwsNumber(Addressable*, Msg* msg) {
    delete msg;
    throw 7;  // NOLINT(hicpp-exception-baseclass)
}
void throwsItsMessage(Addressable*, Msg* msg) { throw std::unique_ptr<Msg>(msg); }  // NOLINT

TEST_F(EventReportTest, ACallbackThatThrowsIsReportedAndTheNextOneRuns) {
    const struct {
        Handler::MsgFunction callback;
        const char* report;
    } cases[] = {
        {&throwsException,
         "(EvtCallback_Class283) VELA Exception caught from callback handler thread\na callback that "
         "fails\n"},
        {&throwsNumber, "(EvtCallback_Class287) genreal Exception caught from callback handler thread\n"},
        {&throwsItsMessage, "(EvtCallback_Class287) genreal Exception caught from callback handler thread\n"},
    };
    std::string expected;
    for (const unsigned int threadParam : {0U, onDispatcher}) {
        for (const auto& c : cases) {
            recorder_.clear();
            ccs_->asyncRegisterMsgType(replyType, c.callback, threadParam);
            ASSERT_TRUE(sendReply());
            ccs_->asyncCancelMsgType(replyType);
            ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, threadParam);
            ASSERT_TRUE(sendReply());
            EXPECT_THAT(recorder_.texts(1), ElementsAre(replyMessage));
            ccs_->asyncCancelMsgType(replyType);
            ASSERT_TRUE(fake_norv::waitForIdleReader());
            expected += c.report;
        }
    }
    end();
    const std::string reports = errors_.text();
    EXPECT_EQ(reports.size(), expected.size());
    for (const auto& c : cases)
        EXPECT_THAT(reports, testing::HasSubstr(c.report));
}

TEST_F(EventReportTest, ABodyThatNoLookUpKnowsIsAnInternalErrorAndTheQueueGoesOn) {
    ccs_->asyncRegisterMsgType(1001, &recorder_, &Recorder::onBody, 0);
    ccs_->asyncRegisterEvtGroup(1002, &recorder_, &Recorder::onBody, 0);
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onBody, 0);
    ASSERT_TRUE(send(1001, {1, 2, 3}));
    ASSERT_TRUE(sendEvent(1002));
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(replyBody));
    end();
    EXPECT_EQ(errors_.text(),
              "(EvtCallback_Class214) vela internal error\nvela::Addressable::UndefinedMsgBody\n"
              "(EvtCallback_Class214) vela internal error\nvela::Addressable::UndefinedEvtBody\n");
}

TEST_F(EventReportTest, ADeliveryThatTheSystemRefusesAThreadIsAnInternalError) {
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, 0);
    {
        const ThreadlessSystem none;
        ASSERT_TRUE(sendReply());
    }
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(replyMessage));
    end();
    EXPECT_EQ(errors_.text(), "(EvtCallback_Class214) vela internal error\nvela::Thread::CreationError\n");
}

TEST_F(EventReportTest, ACopyThatThereIsNoMemoryForIsAnInternalErrorOfAnotherKind) {
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, onDispatcher);
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, onDispatcher);
    fake_norv::fail(fake_norv::Op::allocate, 1, 1);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(replyMessage)) << "the first had its copy";
    end();
    EXPECT_EQ(errors_.text(), "(EvtCallback_Class219) vela internal error\n");
}

}  // namespace
