// Receivers of unsolicited messages, by their source.
#include "tests/vela/transport.h"
#include "vela/AsyncMsgReceiver.h"
#include "vela/MsgQueue.h"

namespace {

using vela::Addressable;
using vela::CompDesc_t;
using vela::Msg;
using vela::MsgQueue;

const CompDesc_t Ccs(1, 1, 1, 0x15, 0);

class Listener : public vela::AsyncMsgReceiver {
  public:
    using AsyncMsgReceiver::AsyncMsgReceiver;

    void receive(Msg* msg) override {
        const std::unique_ptr<Msg> owned(msg);
        type = owned->getMsgType();
        if (fails)
            throw vela::Exception("a receiver that fails");
    }

    std::atomic<unsigned int> type{0};
    bool fails = false;
};
using Receiver = vela::Enrolled<Listener>;

class ReceiverTest : public TransportTest {
  protected:
    // Sent, received and done with.
    bool send(std::uint32_t type, const CompDesc_t& source, Octets body = {}) {
        return fake_norv::deliver({1001, type, source.getNvCompDesc(),
                                   object_.getMsgQueue()->getHostDesc().getNvCompDesc(), std::move(body)}) &&
               fake_norv::waitForIdleReader();
    }

    Addressable object_{Ccs, nullptr};
};

TEST_F(ReceiverTest, GetsWhatItsSourceSends) {
    Receiver receiver(&object_);
    ASSERT_TRUE(send(32, Ccs));
    EXPECT_EQ(receiver.type, 32U);
}

TEST_F(ReceiverTest, ASecondOneForASourceIsRefusedUntilTheFirstHasGone) {
    auto first = std::make_unique<Receiver>(&object_);
    Addressable same(object_);
    try {
        const Receiver second(&same);
        FAIL() << "nothing was thrown";
    } catch (const vela::Exception& exception) {
        EXPECT_EQ(
            printed(exception),
            "Only One AsyncMsgReceiver can be registered for each source address on a particular MsgQueue");
    }
    first.reset();
    EXPECT_NO_THROW(Receiver{&same});
}

TEST_F(ReceiverTest, ReceiversOfDifferentSourcesShareAQueue) {
    Addressable other(CompDesc_t(2, 1, 1, 0x15, 0), object_.getMsgQueue());
    Receiver first(&object_), second(&other);
    ASSERT_TRUE(send(1002, other.getTgtDesc()));
    ASSERT_TRUE(send(1001, Ccs));
    EXPECT_EQ(first.type, 1001U);
    EXPECT_EQ(second.type, 1002U);
}

TEST_F(ReceiverTest, DeregisteringASourceThatIsNotThereIsOutOfBounds) {
    try {
        object_.getMsgQueue()->DeregisterAsyncMsgReceiver(Ccs);
        FAIL() << "nothing was thrown";
    } catch (const vela::Exception& exception) {
        EXPECT_EQ(printed(exception), "list::OutOfBoundsError(Index: 4294967295)");
    }
}

TEST_F(ReceiverTest, ASourceWithoutReceiverIsReportedAndItsMessageFreed) {
    CapturedErrors errors;
    ASSERT_TRUE(send(1001, CompDesc_t(2, 1, 1, 0x15, 0), {0, 10}));
    EXPECT_EQ(fake_norv::outstanding(), 0U);
    EXPECT_EQ(
        errors.text(),
        "\n********************************************\n"
        "Unregisterd Source sent to MsgQueue {HostDesc: {Node 6 Board 9 Processor 8 Component 7 Instance "
        "4097}}\n"
        "MsgType 1001\n"
        "{MsgType: 0x3e9 Source: {Node 0 Board 0x1 Processor 0x1 Component 0x15 Instance 0x2} "
        "Target: {Node 0x6 Board 0x9 Processor 0x8 Component 0x7 Instance 0x1001} Size: 2 Trans: 1001 "
        "Body: {ByteData {0 0xa }}}\n"
        "You may specify your own handler for messages from unregistered sources using\n"
        "MsgQueue::unregisteredSource\n"
        "********************************************\n\n");
}

TEST_F(ReceiverTest, AnotherHandlerForUnregisteredSourcesOwnsTheMessage) {
    static std::atomic<MsgQueue*> from{nullptr};
    static std::atomic<unsigned int> type{0};
    object_.getMsgQueue()->unregisteredSource([](MsgQueue* queue, Msg* msg) {
        from = queue;
        type = std::unique_ptr<Msg>(msg)->getMsgType();
    });
    CapturedErrors errors;
    ASSERT_TRUE(send(1001, Ccs));
    EXPECT_EQ(from, object_.getMsgQueue());
    EXPECT_EQ(type, 1001U);
    EXPECT_EQ(errors.text(), "");
}

TEST_F(ReceiverTest, NullAsksForTheReportOfUnregisteredSourcesAgain) {
    object_.getMsgQueue()->unregisteredSource([](MsgQueue*, Msg* msg) { delete msg; });
    object_.getMsgQueue()->unregisteredSource(nullptr);
    CapturedErrors errors;
    ASSERT_TRUE(send(1001, Ccs));
    EXPECT_NE(errors.text().find("Unregisterd Source sent to MsgQueue"), std::string::npos);
}

TEST_F(ReceiverTest, WhatADispatcherCannotDeliverIsPassedOnToItsCaller) {
    CapturedErrors errors;
    vela::EvtCallback dispatcher(&object_);
    const vela::Handler ignoreBody([](Addressable*, unsigned int, vela::MsgBody* body) { delete body; });
    const vela::Handler ignore([](Addressable*, Msg* msg) { delete msg; });
    dispatcher.registerMsgType(0, ignoreBody, vela::EvtCallback::onDispatchingThread);
    EXPECT_THROW(dispatcher.receive(messageOf({}).release()), Addressable::UndefinedMsgBody);
    dispatcher.cancelMsgType(0);
    dispatcher.registerMsgType(0, ignore, vela::EvtCallback::onDispatchingThread);
    dispatcher.registerMsgType(0, ignore, vela::EvtCallback::onDispatchingThread);
    Msg* const twice = messageOf({}).release();
    fake_norv::fail(fake_norv::Op::allocate);
    EXPECT_THROW(dispatcher.receive(twice), KSMsgRef::AllocationError);
    EXPECT_EQ(errors.text(),
              "(EvtCallback_Class214) vela internal error\nvela::Addressable::UndefinedMsgBody\n"
              "(EvtCallback_Class219) vela internal error\n");
}

TEST_F(ReceiverTest, TheQueueGoesOnAfterAReceiverOrAHandlerThatThrows) {
    CapturedErrors errors;
    object_.getMsgQueue()->unregisteredSource([](MsgQueue*, Msg* msg) {
        delete msg;
        throw vela::Exception("a handler that fails");
    });
    ASSERT_TRUE(send(1001, Ccs));
    Receiver receiver(&object_);
    receiver.fails = true;
    ASSERT_TRUE(send(1002, Ccs));
    ASSERT_TRUE(send(1003, Ccs));
    EXPECT_EQ(receiver.type, 1003U);
    EXPECT_EQ(errors.text(), "exception from the handler for unregistered sources\na handler that fails\n");
}

}  // namespace
