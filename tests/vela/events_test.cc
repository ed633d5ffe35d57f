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

class EvtCallbackTest : public EventTest {};

TEST_F(EvtCallbackTest, AMessageTypeReachesEachFormOfCallback) {
    for (const unsigned int threadParam : {0U, 1U << 20, onDispatcher}) {
        recorder_.clear();
        Recorder::functions().clear();
        ccs_->asyncRegisterMsgType(replyType, &Recorder::bodyFunction, threadParam);
        ccs_->asyncRegisterMsgType(replyType, &Recorder::msgFunction, threadParam);
        ASSERT_TRUE(sendReply());
        EXPECT_THAT(Recorder::functions().texts(2), testing::UnorderedElementsAre(replyBody, replyMessage));
        ccs_->asyncCancelMsgType(replyType);
        ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onBody, threadParam);
        ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, threadParam);
        ASSERT_TRUE(sendReply());
        EXPECT_THAT(recorder_.texts(2), testing::UnorderedElementsAre(replyBody, replyMessage));
        ccs_->asyncCancelMsgType(replyType);
    }
}

TEST_F(EvtCallbackTest, AnEventGroupReachesEachFormOfCallback) {
    for (const unsigned int threadParam : {0U, 1U << 20, onDispatcher}) {
        recorder_.clear();
        Recorder::functions().clear();
        ccs_->asyncRegisterEvtGroup(2, &Recorder::bodyFunction, threadParam);
        ccs_->asyncRegisterEvtGroup(2, &Recorder::msgFunction, threadParam);
        ASSERT_TRUE(sendTrace());
        EXPECT_THAT(Recorder::functions().texts(2), testing::UnorderedElementsAre(traceBody, traceMessage));
        ccs_->asyncCancelEvtGroup(2);
        ccs_->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onBody, threadParam);
        ccs_->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onMsg, threadParam);
        ASSERT_TRUE(sendTrace());
        EXPECT_THAT(recorder_.texts(2), testing::UnorderedElementsAre(traceBody, traceMessage));
        ccs_->asyncCancelEvtGroup(2);
    }
}

TEST_F(EvtCallbackTest, TheCallbackIsGivenItsObject) {
    ccs_->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onBody, 0);
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, onDispatcher);
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
        ccs_->asyncRegisterMsgType(replyType, recorder, &Recorder::onMsg, onDispatcher);
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
    ccs_->asyncRegisterMsgType(replyType, &b, &Sequence::onMsg, onDispatcher);
    ccs_->asyncRegisterMsgType(replyType, &a, &Sequence::onBody, onDispatcher);
    ccs_->asyncRegisterMsgType(replyType, &c, &Sequence::onMsg, onDispatcher);
    ccs_->asyncRegisterMsgType(replyType, &b, &Sequence::onMsg, onDispatcher);
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
    ccs_->asyncRegisterMsgType(replyType, static_cast<Sequence*>(&louder), &Sequence::onMsg, onDispatcher);
    ASSERT_TRUE(sendReply());
    end();
    EXPECT_EQ(order, "a!");
}

TEST_F(EvtCallbackTest, ASingleCallbackGetsTheReceivedMessageItself) {
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, 0);
    ASSERT_TRUE(sendReply());
    end();
    EXPECT_EQ(fake_norv::count(fake_norv::Op::free), 2U) << "the message, and the one that woke the reader";
    EXPECT_EQ(fake_norv::count(fake_norv::Op::allocate), 1U) << "the one that woke the reader";
}

TEST_F(EvtCallbackTest, SeveralCallbacksGetACopyEachAndTheReceivedMessageIsFreed) {
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, 0);
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, onDispatcher);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(2), ElementsAre(replyMessage, replyMessage));
    end();
    EXPECT_EQ(fake_norv::count(fake_norv::Op::allocate), 2U + 1U);
    EXPECT_EQ(fake_norv::count(fake_norv::Op::free), 3U + 1U);
}

TEST_F(EvtCallbackTest, ABodyCallbackLeavesNoMessageBehind) {
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onBody, onDispatcher);
    ASSERT_TRUE(sendReply());
    EXPECT_EQ(fake_norv::outstanding(), 0U);
    EXPECT_EQ(fake_norv::count(fake_norv::Op::allocate), 0U);
}

TEST_F(EvtCallbackTest, RegisteredTwiceItRunsTwiceUntilOneIsCancelled) {
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, onDispatcher);
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, onDispatcher);
    ASSERT_TRUE(sendReply());
    EXPECT_EQ(recorder_.entries(2).size(), 2U);
    ccs_->asyncCancelMsgType(replyType, &recorder_, &Recorder::onMsg, onDispatcher);
    ASSERT_TRUE(sendReply());
    EXPECT_EQ(recorder_.entries(3).size(), 3U);
}

TEST_F(EvtCallbackTest, CancellingTakesTheMatchingEntryAlone) {
    std::string order;
    Sequence a(order, 'a'), b(order, 'b');
    ccs_->asyncRegisterMsgType(replyType, &a, &Sequence::onMsg, onDispatcher);
    ccs_->asyncRegisterMsgType(replyType, &a, &Sequence::onBody, onDispatcher);
    ccs_->asyncRegisterMsgType(replyType, &b, &Sequence::onMsg, onDispatcher);
    ccs_->asyncRegisterMsgType(replyType, &Recorder::msgFunction, onDispatcher);
    ccs_->asyncRegisterMsgType(replyType, &Recorder::bodyFunction, onDispatcher);
    ccs_->asyncCancelMsgType(replyType, &a, &Sequence::onMsg, onDispatcher);
    ccs_->asyncCancelMsgType(replyType, &Recorder::msgFunction, onDispatcher);
    ASSERT_TRUE(sendReply());
    end();
    EXPECT_EQ(order, "ab");
    EXPECT_THAT(Recorder::functions().texts(1), ElementsAre(replyBody));
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
    outOfBounds([&] { ccs_->asyncCancelMsgType(replyType); });
    outOfBounds([&] { ccs_->asyncCancelEvtGroup(2); });
    outOfBounds([&] { ccs_->asyncCancelMsgType(replyType, &Recorder::msgFunction, 0); });
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, onDispatcher);
    outOfBounds([&] { ccs_->asyncCancelMsgType(replyType, &recorder_, &Recorder::onMsg, 0); });
    outOfBounds([&] { ccs_->asyncCancelMsgType(replyType, &recorder_, &Recorder::onBody, onDispatcher); });
    outOfBounds([&] { ccs_->asyncCancelEvtGroup(replyType, &recorder_, &Recorder::onMsg, onDispatcher); });
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(replyMessage)) << "the lock is free and the entry is there";
}

TEST_F(EvtCallbackTest, AnEntryWithoutTargetIsPassedOverAndItsMessageFreed) {
    ccs_->asyncRegisterMsgType(replyType, Handler(Handler::MsgFunction(nullptr)), onDispatcher);
    ASSERT_TRUE(sendReply());
    EXPECT_EQ(fake_norv::outstanding(), 0U);
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, onDispatcher);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(replyMessage));
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
    EXPECT_THAT(recorder_.texts(2), ElementsAre(traceBody, traceBody));
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
    ccs_->asyncRegisterMsgType(replyType, &busy, &Busy::onMsg, 0);
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
            next.asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, 0);
            left = true;
        } catch (const vela::Exception&) {
            std::this_thread::yield();
        }
    }
    busy.mayEnd.raise();
    destroyer.join();
}

// Its destructor does not wait for the callbacks, and so a callback could find half an object.
class Forgetful : public CCS {
  public:
    using CCS::CCS;
};

using ForgetfulDeathTest = TransportTest;

TEST_F(ForgetfulDeathTest, AClassWhoseDestructorDoesNotEndTheCallbacksEndsTheProcess) {
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    const vela::CompDesc_t address(1, 1, 1, 0x15, 0);
    { const Forgetful withoutCallbacks(address, nullptr); }
    EXPECT_DEATH(
        {
            Forgetful object(address, nullptr);
            object.asyncRegisterMsgType(19, &Recorder::bodyFunction, 0);
        },
        "Forgetful.*'s destructor calls endCallbacks\\(\\)");
}

TEST_F(EvtCallbackTest, ACallbackMayCancelAndRegisterWhileTheObjectIsBeingDestroyed) {
    Busy busy;
    busy.act = [&](Addressable* owner) {
        owner->asyncCancelMsgType(replyType);
        owner->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onBody, 0);
    };
    ccs_->asyncRegisterMsgType(replyType, &busy, &Busy::onMsg, 0);
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
    ccs_->asyncRegisterMsgType(replyType, &busy, &Busy::onMsg, 0);
    ASSERT_TRUE(sendReply());
    busy.mayEnd.raise();
    EXPECT_TRUE(busy.ended.wait());
}

TEST_F(EvtCallbackTest, ACallbackOnItsOwnThreadMayRegisterCancelAndRequest) {
    board_.answers(8, 9);
    Busy busy;
    busy.act = [&](Addressable* owner) {
        owner->asyncCancelMsgType(replyType);
        owner->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onBody, 0);
        dynamic_cast<CCS*>(owner)->SetParm(10, 1, nullptr);
    };
    ccs_->asyncRegisterMsgType(replyType, &busy, &Busy::onMsg, 0);
    ASSERT_TRUE(sendReply());
    busy.mayEnd.raise();
    ASSERT_TRUE(busy.ended.wait());
    ASSERT_TRUE(sendTrace());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(traceBody));
}

TEST_F(EvtCallbackTest, RegistrationsMoveWithTheObjectToAnotherQueue) {
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, 0);
    Addressable keepsTheFormerQueue(*ccs_);
    ccs_->MsgQueueAttach(nullptr);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre(replyMessage));
}

TEST_F(EvtCallbackTest, ASecondDispatcherForTheAddressIsRefusedOnTheSameQueue) {
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, 0);
    CCS same(ccs_->getTgtDesc(), ccs_->getMsgQueue());
    EXPECT_THROW(same.asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, 0), vela::Exception);
}

}  // namespace
