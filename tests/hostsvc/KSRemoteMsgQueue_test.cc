#include "hostsvc/KSRemoteMsgQueue.h"

#include <iostream>
#include <memory>
#include <string>
#include <thread>

#include "hostsvc/KSException.h"
#include "hostsvc/KSMsgRef.h"
#include "tests/hostsvc/remote_msg_queue.h"
#include "tests/support/test_system.h"

namespace {

using namespace remote;  // NOLINT(google-build-using-namespace): the words of these tests
using fake_norv::Op;
using testing::ElementsAre;
using testing::internal::CaptureStderr;
using testing::internal::GetCapturedStderr;

TEST_F(KSRemoteMsgQueueTest, OpeningSendsTheAddressAndTheArgumentsAndTakesTheHostAddressFromTheReply) {
    auto making = std::async(std::launch::async, [this] { return make(); });
    Connection relay = listener_.accept();
    EXPECT_EQ(withoutSendersWord(relay.read(openRequestSize)),
              words({1003, 0, 28, 0, 0}) + words({1, 2, 3, 4, 1005, 512, 50}));
    relay.write(opened);
    auto queue = making.get();
    EXPECT_TRUE(descComp(queue->getHostDesc(), given));
    close(queue, relay);
}

TEST_F(KSRemoteMsgQueueTest, ANameWithAPortLeadsToTheRelayToo) {
    const std::string host = listener_.host("localhost");
    auto making = std::async(std::launch::async,
                             [&] { return std::make_unique<KSRemoteMsgQueue>(asked, 0, 0, host.c_str()); });
    Connection relay = listener_.accept();
    relay.read(openRequestSize);
    relay.write(opened);
    auto queue = making.get();
    close(queue, relay);
}

TEST_F(KSRemoteMsgQueueTest, WithoutARelayOpeningThrowsAndSaysWhy) {
    CaptureStderr();
    EXPECT_THROW(KSRemoteMsgQueue(asked, 0, 0, "127.0.0.1:1"), KSResource_CreationError);
    EXPECT_THROW(KSRemoteMsgQueue(asked, 0, 0, "no such name"), KSResource_CreationError);
    EXPECT_EQ(GetCapturedStderr(),
              "Cannot open a remote message queue on 127.0.0.1:1: Connection refused\n"
              "Cannot open a remote message queue on no such name: the name is unknown\n");
}

TEST_F(KSRemoteMsgQueueTest, ARelayThatRefusesMakesOpeningThrowAndIsNamed) {
    const std::string refused =
        "Cannot open a remote message queue on " + listener_.host() + ": refused by the relay\n";
    for (const Octets& answer : {words({1001, 0, 20, 0, 0}) + words({11, 12, 13, 14, 15}), closeRequest,
                                 closed, words({1002, 0, 16, 0, 0}) + words({11, 12, 13, 14}),
                                 words({1002, 0, 102401, 0, 0}) + Octets(102401), words({0, 0, 0, 0, 0}),
                                 words({1002, 0, 0xFFFFFFFF, 0, 0})}) {
        CaptureStderr();
        auto making = std::async(std::launch::async, [this] { return make(); });
        Connection relay = listener_.accept();
        relay.read(openRequestSize);
        relay.write(answer);
        EXPECT_THROW(making.get(), KSResource_CreationError);
        EXPECT_TRUE(relay.ends());
        EXPECT_TRUE(GetCapturedStderr().ends_with(refused));
    }
}

TEST_F(KSRemoteMsgQueueTest, ARelayThatClosesAfterAnyOctetOfItsAnswerMakesOpeningThrow) {
    for (std::size_t n = 0; n < opened.size(); ++n) {
        auto making = std::async(std::launch::async, [this] { return make(); });
        Connection relay = listener_.accept();
        relay.read(openRequestSize);
        relay.write({opened.begin(), opened.begin() + static_cast<long>(n)});
        relay.close();
        EXPECT_THROW(making.get(), KSResource_CreationError) << n;
    }
}

TEST_F(KSRemoteMsgQueueTest, ARelayThatDoesNotAnswerIsGivenUpAfterFiveSeconds) {
    CaptureStderr();
    SleeplessSystem system;
    std::promise<void> read;
    system.insteadOfNapping = [&, wait = read.get_future().share()] { wait.wait(); };
    auto making = std::async(std::launch::async, [this] { return make(); });
    Connection relay = listener_.accept();
    relay.read(openRequestSize);
    relay.write({opened.begin(), opened.end() - 1});
    read.set_value();
    EXPECT_THROW(making.get(), KSResource_CreationError);
    EXPECT_EQ(system.naps(), std::vector<long>(500, 10000));
    EXPECT_TRUE(GetCapturedStderr().ends_with("Cannot open a remote message queue on " + listener_.host() +
                                              ": the relay does not answer\n"));
}

TEST_F(KSRemoteMsgQueueTest, AMessageIsWrittenAsItsHeaderBlockAndItsBody) {
    auto [queue, relay] = open();
    KSMsgRef msg(3U);
    msg.setMsgType(9);
    msg.setTrans(10000);
    msg.setSrcAddr({2, 1, 0, 1, 21, 0, 0});
    msg.setTgtAddr(given);
    std::memcpy(msg.getMsgRef() + 1, body.data(), body.size());
    EXPECT_EQ(queue->msgWrite(msg.getMsgRef()), 0U);
    EXPECT_EQ(withoutSendersWord(relay.read(messageFrame.size())), messageFrame);
    EXPECT_EQ(fake_norv::outstanding(), 0U);
    EXPECT_EQ(fake_norv::count(Op::free), 1U);
    close(queue, relay);
}

TEST_F(KSRemoteMsgQueueTest, AMessageThatCannotBeSentStaysTheCallers) {
    auto [queue, relay] = open();
    KSMsgRef tooLarge(102401U);
    EXPECT_EQ(queue->msgWrite(tooLarge.getMsgRef()), NVSTATUS_ERROR);
    EXPECT_EQ(fake_norv::outstanding(), 1U);
    tooLarge.free();
    KSMsgRef other(0U);
    EXPECT_EQ(queue->msgWrite(other.getMsgRef()), 0U);  // the connection is as it was
    EXPECT_EQ(relay.read(4), words({1001}));
    relay.read(headerSize - 4 + 56);
    close(queue, relay);
}

TEST_F(KSRemoteMsgQueueTest, AMessageIsReadIntoABufferOfItsOwn) {
    auto [queue, relay] = open();
    relay.write(messageFrame);
    NvMsg32Bit* read = nullptr;
    ASSERT_EQ(queue->msgRead(&read), 0U);
    KSMsgRef msg(read);
    EXPECT_EQ(msg.getTrans(), 10000U);
    EXPECT_EQ(read->transaction & 0xFFU, 0x5AU);
    EXPECT_EQ(msg.getMsgType(), 9U);
    EXPECT_TRUE(descComp(msg.getSrcAddr(), {2, 1, 0, 1, 21, 0, 0}));
    EXPECT_TRUE(descComp(msg.getTgtAddr(), given));
    EXPECT_EQ(msg.getSize(), 3U);
    EXPECT_EQ(std::memcmp(read + 1, body.data(), 3), 0);
    msg.free();
    close(queue, relay);
}

TEST_F(KSRemoteMsgQueueTest, AnyOtherTypeIsAMessageAndItsSizeIsThatOfItsBody) {
    auto [queue, relay] = open();
    const Octets lying = words({0x5A, 10000, 9, 0, 1, 1, 11, 12, 13, 2, 21, 0x1234, 14, 0xFFFFFFFF});
    relay.write(words({77, 0, 56, 2, 0}) + lying + Octets{8, 9});
    relay.write(words({1001, 0, 8, 0, 0}) + words({0x5A, 10000}));  // no whole block: the rest is 0
    relay.write(words({1001, 0, 0, 0, 0}));
    for (const unsigned size : {2U, 0U, 0U}) {
        NvMsg32Bit* read = nullptr;
        ASSERT_EQ(queue->msgRead(&read), 0U);
        KSMsgRef msg(read);
        EXPECT_EQ(msg.getSize(), size);
        EXPECT_EQ(octetsOf(msg).size(), NVMSG_HEADER_SIZE + size);
        msg.free();
    }
    close(queue, relay);
}

TEST_F(KSRemoteMsgQueueTest, WithoutMemoryForAMessageItIsLostAndTheNextIsRead) {
    auto [queue, relay] = open();
    relay.write(messageFrame + messageFrame);
    fake_norv::fail(Op::allocate);
    NvMsg32Bit* read = nullptr;
    EXPECT_EQ(queue->msgRead(&read), NVSTATUS_ERROR);
    EXPECT_EQ(read, nullptr);
    ASSERT_EQ(queue->msgRead(&read), 0U);
    KSMsgRef(read).free();
    close(queue, relay);
}

TEST_F(KSRemoteMsgQueueTest, ACloseRequestFromTheRelayIsAnErrorAndAGoodFrameStartsTheCountAgain) {
    auto [queue, relay] = open();
    SleeplessSystem system;
    NvMsg32Bit* read = nullptr;
    CaptureStderr();
    for (int round = 0; round < 3; ++round) {
        for (int i = 0; i < 9; ++i) {
            relay.write(closeRequest);
            EXPECT_EQ(queue->msgRead(&read), NVSTATUS_ERROR);
        }
        relay.write(messageFrame);
        ASSERT_EQ(queue->msgRead(&read), 0U);
        KSMsgRef(read).free();
    }
    EXPECT_EQ(GetCapturedStderr(), errorLines(27));
    EXPECT_THAT(system.sleeps(), ElementsAre());
    relay.close();
}

TEST_F(KSRemoteMsgQueueTest, TenFailuresInARowAreReportedAndThrow) {
    auto [queue, relay] = open();
    relay.close();
    NvMsg32Bit* read = nullptr;
    CaptureStderr();
    for (int i = 0; i < 9; ++i)
        EXPECT_EQ(queue->msgRead(&read), NVSTATUS_ERROR);
    try {
        queue->msgRead(&read);
        FAIL() << "it did not throw";
    } catch (const KSRemoteService_ComFailure& failure) {
        EXPECT_EQ(failure.hostName(), listener_.host());
        EXPECT_EQ(failure.port(), 6554);
    }
    EXPECT_EQ(GetCapturedStderr(), errorLines(10));
}

TEST_F(KSRemoteMsgQueueTest, ARelayThatClosesAfterAnyOctetOfAFrameIsAFailureAndWithinItsPartsAPause) {
    for (std::size_t n = 0; n < messageFrame.size(); ++n) {
        auto [queue, relay] = open();
        relay.write({messageFrame.begin(), messageFrame.begin() + static_cast<long>(n)});
        relay.close();
        SleeplessSystem system;
        NvMsg32Bit other{};
        NvMsg32Bit* read = &other;
        CaptureStderr();
        EXPECT_EQ(queue->msgRead(&read), NVSTATUS_ERROR) << n;
        EXPECT_EQ(GetCapturedStderr(), errorLine());
        EXPECT_EQ(read, n < headerSize ? &other : nullptr) << n;
        EXPECT_EQ(system.sleeps(), std::vector<unsigned>(n < headerSize ? 0 : 1, 6)) << n;
        for (int i = 0; i < 8; ++i)
            queue->msgRead(&read);
        EXPECT_THROW(queue->msgRead(&read), KSRemoteService_ComFailure);
        queue.reset();
    }
}

TEST_F(KSRemoteMsgQueueTest, FramesBeyondTheLimitAreErrors) {
    auto [queue, relay] = open();
    SleeplessSystem system;
    std::thread sender([&relay = relay] {
        relay.write(words({1001, 0, 102401, 0, 0}) + Octets(102401));
        relay.write(words({1001, 0, 0x7FFFFFFF, 0, 0}));
    });
    NvMsg32Bit other{};
    NvMsg32Bit* read = &other;
    CaptureStderr();
    EXPECT_EQ(queue->msgRead(&read), NVSTATUS_ERROR);
    EXPECT_EQ(queue->msgRead(&read), NVSTATUS_ERROR);
    EXPECT_EQ(read, &other);
    EXPECT_THAT(system.sleeps(), ElementsAre());  // the peer has closed neither within
    EXPECT_EQ(GetCapturedStderr(), errorLine() + "Unable to allocate memory in get_msg\n" + errorLine());
    sender.join();
}

TEST_F(KSRemoteMsgQueueTest, AFrameOfNegativeSizeIsAnErrorAndTheNextOneIsRead) {
    auto [queue, relay] = open();
    SleeplessSystem system;
    relay.write(words({1001, 0, 56, 0xFFFFFFFF, 0}) + messageFrame);
    NvMsg32Bit* read = nullptr;
    CaptureStderr();
    EXPECT_EQ(queue->msgRead(&read), NVSTATUS_ERROR);
    EXPECT_EQ(GetCapturedStderr(), "Unable to allocate memory in get_msg\n" + errorLine());
    EXPECT_THAT(system.sleeps(), ElementsAre());
    ASSERT_EQ(queue->msgRead(&read), 0U);
    KSMsgRef(read).free();
    close(queue, relay);
}

TEST_F(KSRemoteMsgQueueTest, OneOctetAtATimeIsAFrameToo) {
    auto [queue, relay] = open();
    std::thread sender([&relay = relay] {
        for (const std::uint8_t octet : messageFrame)
            relay.write({octet});
    });
    NvMsg32Bit* read = nullptr;
    ASSERT_EQ(queue->msgRead(&read), 0U);
    KSMsgRef(read).free();
    sender.join();
    close(queue, relay);
}

TEST_F(KSRemoteMsgQueueTest, DestructionAsksTheRelayToCloseAndWaitsForItsAcknowledgement) {
    auto [queue, relay] = open();
    std::atomic<bool> gone{false};
    std::thread destroyer([&, doomed = std::move(queue)]() mutable {
        doomed.reset();
        gone = true;
    });
    EXPECT_EQ(withoutSendersWord(relay.read(headerSize)), closeRequest);
    EXPECT_FALSE(gone);
    relay.write(closed);
    destroyer.join();
    EXPECT_TRUE(relay.ends());
}

TEST_F(KSRemoteMsgQueueTest, ARelayThatNeverAcknowledgesTheCloseDelaysItByFiveSeconds) {
    auto [queue, relay] = open();
    SleeplessSystem system;
    queue.reset();
    EXPECT_EQ(system.naps(), std::vector<long>(500, 10000));
    EXPECT_EQ(withoutSendersWord(relay.read(headerSize)), closeRequest);
    EXPECT_TRUE(relay.ends());
}

TEST_F(KSRemoteMsgQueueTest, MessagesBeforeTheAcknowledgementAreDropped) {
    auto [queue, relay] = open();
    relay.write(messageFrame + closeRequest + messageFrame);
    close(queue, relay);
}

TEST_F(KSRemoteMsgQueueTest, AnAcknowledgementThatNobodyAskedForIsAnError) {
    auto [queue, relay] = open();
    relay.write(closed);
    NvMsg32Bit* read = nullptr;
    EXPECT_EQ(queue->msgRead(&read), NVSTATUS_ERROR);
    relay.write(messageFrame);
    ASSERT_EQ(queue->msgRead(&read), 0U);
    KSMsgRef(read).free();
    close(queue, relay);
}

TEST(KSRemoteServiceComFailure, ItKeepsTheFirst99CharactersOfTheHost) {
    const std::string longName(150, 'h');
    const KSRemoteService_ComFailure failure(longName.c_str(), 6554);
    EXPECT_EQ(failure.hostName(), std::string(99, 'h'));
    EXPECT_EQ(failure.port(), 6554);
}

}  // namespace
