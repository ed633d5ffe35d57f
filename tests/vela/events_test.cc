// Who gets what an object sends unasked, in which form and on which thread.
#include "tests/vela/events.h"
#include "tests/support/test_system.h"

namespace {

using testing::ElementsAre;
using vela::Addressable;
using vela::CCS;
using vela::EvtCallback;
using vela::Handler;
using vela::Msg;
using vela::MsgBody;

constexpr const char* ReplyBody = "body 19 {Num 7 Val 1001 TextSize 0 Text {}}";
constexpr const char* ReplyMessage = "message 19 12 octets";
constexpr const char* TraceBody = "body 32 {Label 2 Direction 1 Timestamp 1003 Length 1 List {x}}";
constexpr const char* TraceMessage = "message 32 17 octets";

class EvtCallbackTest : public EventTest {};

TEST_F(EvtCallbackTest, AMessageTypeReachesEachFormOfCallback) {
    for (const unsigned int threadParam : {0U, 1U << 20, Inline}) {
        recorder_.clear();
        Recorder::functions().clear();
        ccs_->asyncRegisterMsgType(Reply, &Recorder::bodyFunction, threadParam);
        ccs_->asyncRegisterMsgType(Reply, &Recorder::msgFunction, threadParam);
        ASSERT_TRUE(sendReply());
        EXPECT_THAT(Recorder::functions().texts(2), testing::UnorderedElementsAre(ReplyBody, ReplyMessage));
        ccs_->asyncCancelMsgType(Reply);
        ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onBody, threadParam);
        ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, threadParam);
        ASSERT_TRUE(sendReply());
        EXPECT_THAT(recorder_.texts(2), testing::UnorderedElementsAre(ReplyBody, ReplyMessage));
        ccs_->asyncCancelMsgType(Reply);
    }
}

TEST_F(EvtCallbackTest, AnEventGroupReachesEachFormOfCallback) {
    for (const unsigned int threadParam : {0U, 1U << 20, Inline}) {
        recorder_.clear();
        Recorder::functions().clear();
        ccs_->asyncRegisterEvtGroup(2, &Recorder::bodyFunction, threadParam);
        ccs_->asyncRegisterEvtGroup(2, &Recorder::msgFunction, threadParam);
        ASSERT_TRUE(sendTrace());
        EXPECT_THAT(Recorder::functions().texts(2), testing::UnorderedElementsAre(TraceBody, TraceMessage));
        ccs_->asyncCancelEvtGroup(2);
        ccs_->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onBody, threadParam);
        ccs_->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onMsg, threadParam);
        ASSERT_TRUE(sendTrace());
        EXPECT_THAT(recorder_.texts(2), testing::UnorderedElementsAre(TraceBody, TraceMessage));
        ccs_->asyncCancelEvtGroup(2);
    }
}

TEST_F(EvtCallbackTest, TheCallbackIsGivenItsObject) {
    ccs_->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onBody, 0);
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, Inline);
    ASSERT_TRUE(sendReply());
    ASSERT_TRUE(sendTrace());
    for (const Recorder::Entry& entry : recorder_.entries(2))
        EXPECT_EQ(entry.owner, ccs_.get());
}

void onTrace(CCS* ccs, unsigned int type, CCS::EvtL2Trace_t* trace) {
    const std::unique_ptr<CCS::EvtL2Trace_t> owned(trace);
    Recorder::functions().add(std::to_string(type) + " " + std::to_string(owned->Timestamp), ccs);
}

TEST_F(EvtCallbackTest, AFunctionMayNameItsOwnKindsOfObjectAndBody) {
    ccs_->asyncRegisterEvtGroup(2, Handler::of<&onTrace>(), 0);
    ASSERT_TRUE(sendTrace());
    EXPECT_THAT(Recorder::functions().texts(1), ElementsAre("32 1003"));
    ccs_->asyncCancelEvtGroup(2, Handler::of<&onTrace>(), 0);
}

TEST_F(EvtCallbackTest, InlineCallbacksRunInOrderOnTheQueuesThreadOthersOnTheirOwn) {
    Recorder second;
    for (Recorder* recorder : {&recorder_, &second, &recorder_})
        ccs_->asyncRegisterMsgType(Reply, recorder, &Recorder::onMsg, Inline);
    ASSERT_TRUE(sendReply());
    ASSERT_TRUE(sendReply());
    const std::thread::id queue = recorder_.entries(4).at(0).thread;
    for (Recorder* recorder : {&recorder_, &second}) {
        for (const Recorder::Entry& entry : recorder->entries(2))
            EXPECT_EQ(entry.thread, queue);
    }
    EXPECT_NE(queue, std::this_thread::get_id());
    Recorder own;
    ccs_->asyncRegisterEvtGroup(2, &own, &Recorder::onMsg, 0);
    ASSERT_TRUE(sendTrace());
    const std::thread::id thread = own.entries(1).at(0).thread;
    EXPECT_NE(thread, queue);
    EXPECT_NE(thread, std::this_thread::get_id());
}

class Sequence : public EvtCallback::Callback {
  public:
    explicit Sequence(std::string& text, char name) : text_(text), name_(name) {}
    virtual ~Sequence() = default;
    virtual void onMsg(Addressable*, Msg* msg) {
        delete msg;
        text_ += name_;
    }
    void onBody(Addressable*, unsigned int, MsgBody* body) {
        delete body;
        text_ += name_;
    }

  protected:
    std::string& text_;
    char name_;
};

TEST_F(EvtCallbackTest, InlineCallbacksRunInTheOrderOfTheirRegistration) {
    std::string order;
    Sequence a(order, 'a'), b(order, 'b'), c(order, 'c');
    ccs_->asyncRegisterMsgType(Reply, &b, &Sequence::onMsg, Inline);
    ccs_->asyncRegisterMsgType(Reply, &a, &Sequence::onBody, Inline);
    ccs_->asyncRegisterMsgType(Reply, &c, &Sequence::onMsg, Inline);
    ccs_->asyncRegisterMsgType(Reply, &b, &Sequence::onMsg, Inline);
    ASSERT_TRUE(sendReply());
    end();
    EXPECT_EQ(order, "bacb");
}

class Louder : public Sequence {
  public:
    using Sequence::Sequence;
    void onMsg(Addressable* owner, Msg* msg) override {
        Sequence::onMsg(owner, msg);
        text_ += '!';
    }
};

TEST_F(EvtCallbackTest, AVirtualMemberIsTheObjectsOwn) {
    std::string order;
    Louder louder(order, 'a');
    ccs_->asyncRegisterMsgType(Reply, static_cast<Sequence*>(&louder), &Sequence::onMsg, Inline);
    ASSERT_TRUE(sendReply());
    end();
    EXPECT_EQ(order, "a!");
}

TEST_F(EvtCallbackTest, ASingleCallbackGetsTheReceivedMessageItself) {
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, 0);
    ASSERT_TRUE(sendReply());
    end();
    EXPECT_EQ(fake_norv::count(fake_norv::Op::Free), 2U) << "the message, and the one that woke the reader";
    EXPECT_EQ(fake_norv::count(fake_norv::Op::Allocate), 1U) << "the one that woke the reader";
}

TEST_F(EvtCallbackTest, SeveralCallbacksGetACopyEachAndTheReceivedMessageIsFreed) {
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, 0);
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, Inline);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(2), ElementsAre(ReplyMessage, ReplyMessage));
    end();
    EXPECT_EQ(fake_norv::count(fake_norv::Op::Allocate), 2U + 1U);
    EXPECT_EQ(fake_norv::count(fake_norv::Op::Free), 3U + 1U);
}

TEST_F(EvtCallbackTest, ABodyCallbackLeavesNoMessageBehind) {
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onBody, Inline);
    ASSERT_TRUE(sendReply());
    EXPECT_EQ(fake_norv::outstanding(), 0U);
    EXPECT_EQ(fake_norv::count(fake_norv::Op::Allocate), 0U);
}

TEST_F(EvtCallbackTest, RegisteredTwiceItRunsTwiceUntilOneIsCancelled) {
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, Inline);
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, Inline);
    ASSERT_TRUE(sendReply());
    EXPECT_EQ(recorder_.entries(2).size(), 2U);
    ccs_->asyncCancelMsgType(Reply, &recorder_, &Recorder::onMsg, Inline);
    ASSERT_TRUE(sendReply());
    EXPECT_EQ(recorder_.entries(3).size(), 3U);
}

TEST_F(EvtCallbackTest, CancellingTakesTheMatchingEntryAlone) {
    std::string order;
    Sequence a(order, 'a'), b(order, 'b');
    ccs_->asyncRegisterMsgType(Reply, &a, &Sequence::onMsg, Inline);
    ccs_->asyncRegisterMsgType(Reply, &a, &Sequence::onBody, Inline);
    ccs_->asyncRegisterMsgType(Reply, &b, &Sequence::onMsg, Inline);
    ccs_->asyncRegisterMsgType(Reply, &Recorder::msgFunction, Inline);
    ccs_->asyncRegisterMsgType(Reply, &Recorder::bodyFunction, Inline);
    ccs_->asyncCancelMsgType(Reply, &a, &Sequence::onMsg, Inline);
    ccs_->asyncCancelMsgType(Reply, &Recorder::msgFunction, Inline);
    ASSERT_TRUE(sendReply());
    end();
    EXPECT_EQ(order, "ab");
    EXPECT_THAT(Recorder::functions().texts(1), ElementsAre(ReplyBody));
}

TEST_F(EvtCallbackTest, CancellingWhatIsNotRegisteredIsOutOfBounds) {
    const auto outOfBounds = [](auto action) {
        try {
            action();
            ADD_FAILURE() << "nothing was thrown";
        } catch (const vela::Exception& exception) {
            EXPECT_EQ(printed(exception), "list::OutOfBoundsError(Index: 4294967295)");
        }
    };
    outOfBounds([&] { ccs_->asyncCancelMsgType(Reply); });
    outOfBounds([&] { ccs_->asyncCancelEvtGroup(2); });
    outOfBounds([&] { ccs_->asyncCancelMsgType(Reply, &Recorder::msgFunction, 0); });
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, Inline);
    outOfBounds([&] { ccs_->asyncCancelMsgType(Reply, &recorder_, &Recorder::onMsg, 0); });
    outOfBounds([&] { ccs_->asyncCancelMsgType(Reply, &recorder_, &Recorder::onBody, Inline); });
    outOfBounds([&] { ccs_->asyncCancelEvtGroup(Reply, &recorder_, &Recorder::onMsg, Inline); });
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(ReplyMessage)) << "the lock is free and the entry is there";
}

TEST_F(EvtCallbackTest, AnEntryWithoutTargetIsPassedOverAndItsMessageFreed) {
    ccs_->asyncRegisterMsgType(Reply, Handler(Handler::MsgFunction(nullptr)), Inline);
    ASSERT_TRUE(sendReply());
    EXPECT_EQ(fake_norv::outstanding(), 0U);
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, Inline);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(ReplyMessage));
}

// ---- What nobody registered for.

constexpr const char* Stars = "********************************************\n";
constexpr const char* For =
    "For {TgtDesc: {Node 0 Board 1 Processor 1 Component 21 Instance 1} "
    "HostDesc: {Node 6 Board 9 Processor 8 Component 7 Instance 4097}\n";
constexpr const char* Addresses =
    " Source: {Node 0 Board 0x1 Processor 0x1 Component 0x15 Instance 0x1} "
    "Target: {Node 0x6 Board 0x9 Processor 0x8 Component 0x7 Instance 0x1001} ";

std::string messageBanner(const std::string& type, const std::string& message) {
    return std::string("\n") + Stars + "Unregisterd MsgType " + type + "\n" + For + message +
           "You may specify your own handler for unregisted messages using\n"
           "Addressable::asyncUnregisteredMsgType\n" +
           Stars + "\n";
}

std::string eventBanner(const std::string& group, const std::string& message) {
    return std::string("\n") + Stars + "Unregisterd EventGroup " + group + "\n" + For + message +
           "You may specify your own handler for unregisted events using\n"
           "Addressable::asyncUnregisteredEvtGroup\n" +
           Stars + "\n";
}

// A dispatcher with nothing in its tables.
void makeDispatcher(Addressable& object) {
    object.asyncRegisterMsgType(1001, &Recorder::msgFunction, 0);
    object.asyncCancelMsgType(1001);
}

TEST_F(EvtCallbackTest, AnUnregisteredMessageIsReportedDecodedAndFreed) {
    makeDispatcher(*ccs_);
    ASSERT_TRUE(sendReply());
    end();
    EXPECT_EQ(fake_norv::outstanding(), 0U);
    EXPECT_EQ(
        errors_.text(),
        messageBanner("19", std::string("{MsgType: 0x13") + Addresses +
                                "Size: 12 Trans: 1001 Body: {Num 0x7 Val 0x3e9 TextSize 0 Text {}}}\n"));
}

TEST_F(EvtCallbackTest, AnUnregisteredEventGoesToTheEventDefault) {
    makeDispatcher(*ccs_);
    ASSERT_TRUE(sendTrace());
    end();
    EXPECT_EQ(errors_.text(),
              eventBanner("2", std::string("{MsgType: 0x20") + Addresses +
                                   "Size: 17 Trans: 1001 Body: {Label 0x2 Direction 0x1 Timestamp 0x3eb "
                                   "Length 0x1 List {x}}}\n"));
}

TEST_F(EvtCallbackTest, ATypeThatNoLookUpKnowsIsReportedAsItsOctets) {
    makeDispatcher(*ccs_);
    ASSERT_TRUE(send(0x7FFFFFFF, {0, 10}));
    end();
    EXPECT_EQ(errors_.text(),
              messageBanner("2147483647", std::string("{MsgType: 0x7fffffff") + Addresses +
                                              "Size: 2 Trans: 1001 Body: {ByteData {0 0xa }}}\n"));
}

TEST_F(EvtCallbackTest, AGroupThatNoLookUpKnowsIsReportedAsItsOctets) {
    makeDispatcher(*ccs_);
    ASSERT_TRUE(sendEvent(1001, {7}));
    end();
    EXPECT_EQ(errors_.text(),
              eventBanner("1001", std::string("{MsgType: 0x20") + Addresses +
                                      "Size: 5 Trans: 1001 Body: {ByteData {0xe9 0x3 0 0 0x7 }}}\n"));
}

TEST_F(EvtCallbackTest, AnEventTooShortForAGroupIsOfGroup0) {
    makeDispatcher(*ccs_);
    ASSERT_TRUE(send(32, {2}));
    end();
    EXPECT_EQ(errors_.text(), eventBanner("0", std::string("{MsgType: 0x20") + Addresses +
                                                   "Size: 1 Trans: 1001 Body: {ByteData {0x2 }}}\n"));
}

TEST_F(EvtCallbackTest, AKeyWhoseLastCallbackWasCancelledIsUnregistered) {
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, 0);
    ccs_->asyncCancelMsgType(Reply, &recorder_, &Recorder::onMsg, 0);
    ccs_->asyncUnregisteredMsgType(&Recorder::msgFunction, Inline);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(Recorder::functions().texts(1), ElementsAre(ReplyMessage));
}

TEST_F(EvtCallbackTest, TheDefaultsCanBeReplacedByFunctionsOrMembers) {
    ccs_->asyncUnregisteredMsgType(&Recorder::msgFunction, 0);
    ccs_->asyncUnregisteredEvtGroup(&Recorder::msgFunction, Inline);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(Recorder::functions().texts(1), ElementsAre(ReplyMessage));
    ASSERT_TRUE(sendTrace());
    EXPECT_THAT(Recorder::functions().texts(2), ElementsAre(ReplyMessage, TraceMessage));
    ccs_->asyncUnregisteredMsgType(&recorder_, &Recorder::onMsg, Inline);
    ccs_->asyncUnregisteredEvtGroup(&recorder_, &Recorder::onMsg, 0);
    ASSERT_TRUE(sendReply());
    ASSERT_TRUE(sendTrace());
    EXPECT_THAT(recorder_.texts(2), ElementsAre(ReplyMessage, TraceMessage));
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

TEST_F(EvtCallbackTest, ACallbackThatThrowsIsReportedAndTheNextOneRuns) {
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
    for (const unsigned int threadParam : {0U, Inline}) {
        for (const auto& c : cases) {
            recorder_.clear();
            ccs_->asyncRegisterMsgType(Reply, c.callback, threadParam);
            ASSERT_TRUE(sendReply());
            ccs_->asyncCancelMsgType(Reply);
            ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, threadParam);
            ASSERT_TRUE(sendReply());
            EXPECT_THAT(recorder_.texts(1), ElementsAre(ReplyMessage));
            ccs_->asyncCancelMsgType(Reply);
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

TEST_F(EvtCallbackTest, ABodyThatNoLookUpKnowsIsAnInternalErrorAndTheQueueGoesOn) {
    ccs_->asyncRegisterMsgType(1001, &recorder_, &Recorder::onBody, 0);
    ccs_->asyncRegisterEvtGroup(1002, &recorder_, &Recorder::onBody, 0);
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onBody, 0);
    ASSERT_TRUE(send(1001, {1, 2, 3}));
    ASSERT_TRUE(sendEvent(1002));
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(ReplyBody));
    end();
    EXPECT_EQ(errors_.text(),
              "(EvtCallback_Class214) vela internal error\nvela::Addressable::UndefinedMsgBody\n"
              "(EvtCallback_Class214) vela internal error\nvela::Addressable::UndefinedEvtBody\n");
}

TEST_F(EvtCallbackTest, ADeliveryThatTheSystemRefusesAThreadIsAnInternalError) {
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, 0);
    {
        const ThreadlessSystem none;
        ASSERT_TRUE(sendReply());
    }
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(ReplyMessage));
    end();
    EXPECT_EQ(errors_.text(), "(EvtCallback_Class214) vela internal error\nvela::Thread::CreationError\n");
}

TEST_F(EvtCallbackTest, ACopyThatThereIsNoMemoryForIsAnInternalErrorOfAnotherKind) {
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, Inline);
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, Inline);
    fake_norv::fail(fake_norv::Op::Allocate, 1, 1);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(ReplyMessage)) << "the first had its copy";
    end();
    EXPECT_EQ(errors_.text(), "(EvtCallback_Class219) vela internal error\n");
}

// ---- While other things happen.

TEST_F(EvtCallbackTest, EventsArriveWhileARequestWaits) {
    ccs_->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onBody, 0);
    board_.script(8, [&](const fake_norv::Message& m) {
        Octets trace = fake_norv::words({2, 1, 1003, 1});
        trace.push_back('x');
        fake_norv::deliver({0, 32, m.target, m.source, trace});
        fake_norv::deliver(fake_norv::replyTo(m, 9));
        fake_norv::deliver({0, 32, m.target, m.source, trace});
    });
    ccs_->SetParm(10, 1, nullptr);
    EXPECT_THAT(recorder_.texts(2), ElementsAre(TraceBody, TraceBody));
}

struct Busy : EvtCallback::Callback {
    void onMsg(Addressable* owner, Msg* msg) {
        delete msg;
        begun.raise();
        mayEnd.wait();
        if (act)
            act(owner);
        done = true;
        ended.raise();
    }
    Signal begun, mayEnd, ended;
    std::function<void(Addressable*)> act;
    std::atomic<bool> done{false};
};

TEST_F(EvtCallbackTest, DestroyingTheObjectWaitsForItsCallbacks) {
    Busy busy;
    ccs_->asyncRegisterMsgType(Reply, &busy, &Busy::onMsg, 0);
    ASSERT_TRUE(sendReply());
    ASSERT_TRUE(busy.begun.wait());
    const Addressable keepsTheQueue(*ccs_);
    CCS next(ccs_->getTgtDesc(), ccs_->getMsgQueue());
    std::thread destroyer([&] {
        end();
        EXPECT_TRUE(busy.done);
    });
    // The address is free once the object has left its queue, which comes before it waits.
    for (bool left = false; !left;) {
        try {
            next.asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, 0);
            left = true;
        } catch (const vela::Exception&) {
            std::this_thread::yield();
        }
    }
    busy.mayEnd.raise();
    destroyer.join();
}

TEST_F(EvtCallbackTest, ACallbackMayCancelAndRegisterWhileTheObjectIsBeingDestroyed) {
    Busy busy;
    busy.act = [&](Addressable* owner) {
        owner->asyncCancelMsgType(Reply);
        owner->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onBody, 0);
    };
    ccs_->asyncRegisterMsgType(Reply, &busy, &Busy::onMsg, 0);
    ASSERT_TRUE(sendReply());
    ASSERT_TRUE(busy.begun.wait());
    std::thread destroyer([&] { end(); });
    busy.mayEnd.raise();
    destroyer.join();
    EXPECT_TRUE(busy.done);
}

TEST_F(EvtCallbackTest, ACallbackOnItsOwnThreadMayDestroyTheObject) {
    Busy busy;
    busy.act = [&](Addressable*) { end(); };
    ccs_->asyncRegisterMsgType(Reply, &busy, &Busy::onMsg, 0);
    ASSERT_TRUE(sendReply());
    busy.mayEnd.raise();
    EXPECT_TRUE(busy.ended.wait());
}

TEST_F(EvtCallbackTest, ACallbackOnItsOwnThreadMayRegisterCancelAndRequest) {
    board_.answers(8, 9);
    Busy busy;
    busy.act = [&](Addressable* owner) {
        owner->asyncCancelMsgType(Reply);
        owner->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onBody, 0);
        dynamic_cast<CCS*>(owner)->SetParm(10, 1, nullptr);
    };
    ccs_->asyncRegisterMsgType(Reply, &busy, &Busy::onMsg, 0);
    ASSERT_TRUE(sendReply());
    busy.mayEnd.raise();
    ASSERT_TRUE(busy.ended.wait());
    ASSERT_TRUE(sendTrace());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(TraceBody));
}

TEST_F(EvtCallbackTest, RegistrationsMoveWithTheObjectToAnotherQueue) {
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, 0);
    Addressable keepsTheFormerQueue(*ccs_);
    ccs_->MsgQueueAttach(nullptr);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(ReplyMessage));
}

TEST_F(EvtCallbackTest, ASecondDispatcherForTheAddressIsRefusedOnTheSameQueue) {
    ccs_->asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, 0);
    CCS same(ccs_->getTgtDesc(), ccs_->getMsgQueue());
    EXPECT_THROW(same.asyncRegisterMsgType(Reply, &recorder_, &Recorder::onMsg, 0), vela::Exception);
}

}  // namespace
