// The transport's calls, as a program makes them.
#include <gtest/gtest.h>

#include <thread>

#include "softboard/softboard.h"
#include "tests/softboard/host.h"

namespace softboard {
namespace {

constexpr uint32_t oneU8 = 0x200000;
constexpr uint32_t oneU16 = 0x280000;
constexpr uint32_t oneU32 = 0x380000;

NvMsg32Bit* allocate(uint32_t size) {
    NvMsg32Bit* msg = nullptr;
    EXPECT_EQ(nvMsgAllocate(size, &msg), NVSTATUS_OK);
    return msg;
}

Octets bodyOf(const NvMsg32Bit* msg) { return messageOf(*msg).body; }

class TransportTest : public testing::Test {
  protected:
    TransportTest() { reset(oneChannel({})); }
    ~TransportTest() override { EXPECT_EQ(balance(), "buffers outstanding 0, queues open 0"); }
};

TEST_F(TransportTest, ANewMessageHasAnEmptyHeaderAndItsBodySize) {
    NvMsg32Bit* msg = allocate(5);
    EXPECT_EQ(msg->transaction, 0U);
    EXPECT_EQ(msg->type, 0U);
    EXPECT_EQ(msg->size, 5U);
    EXPECT_EQ(bodyOf(msg), Octets(5, 0));
    EXPECT_EQ(outstanding(), 1U);
    EXPECT_EQ(nvMsgFree(msg), NVSTATUS_OK);
}

TEST_F(TransportTest, AnEmptyMessageStillHas48Octets) {
    NvMsg32Bit* msg = allocate(0);
    std::memset(msg, 0x5a, 48);
    nvMsgFree(msg);
}

TEST_F(TransportTest, AMessageThatCannotBeHadLeavesThePointerAsItWas) {
    NvMsg32Bit* msg = nullptr;
    EXPECT_EQ(nvMsgAllocate(0xffffffff, &msg), NVSTATUS_ERROR);
    EXPECT_EQ(msg, nullptr);
    msg = allocate(4);
    NvMsg32Bit* const before = msg;
    EXPECT_EQ(nvMsgReallocate(0xffffffff, &msg), NVSTATUS_ERROR);
    EXPECT_EQ(msg, before);
    nvMsgFree(msg);
}

TEST_F(TransportTest, ReallocatingKeepsHeaderAndBody) {
    NvMsg32Bit* msg = allocate(2);
    store({0x12345678, 9, {1, 2, 3, 4, 5}, {6, 7, 8, 9, 10}, {0xaa, 0xbb}}, *msg);
    EXPECT_EQ(nvMsgReallocate(4, &msg), NVSTATUS_OK);
    EXPECT_EQ(msg->transaction, 0x12345678U);
    EXPECT_EQ(msg->targetInstance, 6U);
    EXPECT_EQ(bodyOf(msg), (Octets{0xaa, 0xbb, 0, 0}));
    EXPECT_EQ(nvMsgReallocate(1, &msg), NVSTATUS_OK);
    EXPECT_EQ(bodyOf(msg), (Octets{0xaa}));
    nvMsgFree(msg);
}

TEST_F(TransportTest, FieldsStandLittleEndianAndPackedAndTheOffsetAdvancesFromTheFirstCallOn) {
    NvMsg32Bit* msg = allocate(7);
    uint32_t offset = 0;
    uint8_t u8 = 0x01;
    uint16_t u16 = 0x0302;
    uint32_t u32 = 0x07060504;
    EXPECT_EQ(nvMsgVarFieldPut(msg, 1, &offset, oneU8, &u8), NVSTATUS_OK);
    EXPECT_EQ(offset, 1U);
    EXPECT_EQ(nvMsgVarFieldPut(msg, 2, &offset, oneU16, &u16, oneU32, &u32), NVSTATUS_OK);
    EXPECT_EQ(offset, 7U);
    EXPECT_EQ(bodyOf(msg), (Octets{1, 2, 3, 4, 5, 6, 7}));

    offset = u8 = u16 = u32 = 0;
    EXPECT_EQ(nvMsgVarFieldGet(msg, 3, &offset, oneU8, &u8, oneU16, &u16, oneU32, &u32), NVSTATUS_OK);
    EXPECT_EQ(offset, 7U);
    EXPECT_EQ(u8, 0x01);
    EXPECT_EQ(u16, 0x0302);
    EXPECT_EQ(u32, 0x07060504U);
    nvMsgFree(msg);
}

TEST_F(TransportTest, ADescriptorSaysHowManyElementsOfWhichSize) {
    struct {
        const char* says;
        uint32_t descriptor;
        uint32_t octets;
    } const cases[] = {
        {"a signed octet", 0x000000, 1},
        {"a signed 16-bit number", 0x080000, 2},
        {"a 32-bit number", 0x100000, 4},
        {"a signed 32-bit number", 0x180000, 4},
        {"an octet", 0x200000, 1},
        {"a 16-bit number", 0x280000, 2},
        {"code 6", 0x300000, 4},
        {"an unsigned 32-bit number", 0x380000, 4},
        {"code 10", 0x500000, 1},
        {"code 17", 0x880000, 4},
        {"a code without a meaning", 0xf80000, 4},
        {"255 octets", 0x27f000, 255},
        {"255 16-bit numbers", 0x2ff000, 510},
        {"255 32-bit numbers", 0x3ff000, 1020},
        {"32 octets", 0x20f800, 32},
        {"eight signed octets", 0x003800, 8},
    };
    for (const auto& c : cases) {
        NvMsg32Bit* msg = allocate(2000);
        Octets storage(2000, 0xee);
        uint32_t offset = 3;
        EXPECT_EQ(nvMsgVarFieldPut(msg, 1, &offset, c.descriptor, storage.data()), NVSTATUS_OK);
        EXPECT_EQ(offset, 3 + c.octets) << c.says;
        const Octets body = bodyOf(msg);
        EXPECT_EQ(std::count(body.begin(), body.end(), 0xee), c.octets) << c.says;
        nvMsgFree(msg);
    }
}

TEST_F(TransportTest, AFieldThatEndsOutsideTheBodyIsNotMovedAndTheNextOnesAreNotEither) {
    NvMsg32Bit* msg = allocate(5);
    store({0, 0, {}, {}, {1, 2, 3, 4, 5}}, *msg);
    uint32_t offset = 2;
    uint32_t u32 = 1001;
    uint8_t u8 = 102;
    EXPECT_EQ(nvMsgVarFieldGet(msg, 2, &offset, oneU32, &u32, oneU8, &u8), NVSTATUS_ERROR);
    EXPECT_EQ(u32, 1001U);
    EXPECT_EQ(u8, 102U);
    EXPECT_EQ(nvMsgVarFieldGet(msg, 1, &offset, oneU8, &u8), NVSTATUS_ERROR);
    EXPECT_EQ(u8, 102U);
    offset = 2;
    EXPECT_EQ(nvMsgVarFieldPut(msg, 2, &offset, oneU32, &u32, oneU8, &u8), NVSTATUS_ERROR);
    EXPECT_EQ(bodyOf(msg), (Octets{1, 2, 3, 4, 5}));
    nvMsgFree(msg);
}

TEST_F(TransportTest, AFixedFieldIsA32BitWordOfTheBody) {
    NvMsg32Bit* msg = allocate(9);
    uint32_t value = 0x04030201;
    EXPECT_EQ(nvMsgFieldPut(msg, 1, &value), NVSTATUS_OK);
    EXPECT_EQ(nvMsgFieldPut(msg, 2, &value), NVSTATUS_ERROR);
    EXPECT_EQ(bodyOf(msg), (Octets{0, 0, 0, 0, 1, 2, 3, 4, 0}));
    value = 0;
    EXPECT_EQ(nvMsgFieldGet(msg, 1, &value), NVSTATUS_OK);
    EXPECT_EQ(value, 0x04030201U);
    EXPECT_EQ(nvMsgFieldGet(msg, 2, &value), NVSTATUS_ERROR);
    nvMsgFree(msg);
}

TEST_F(TransportTest, EachQueueHasAnAddressOfItsOwnThatIsNoBoards) {
    const Host first;
    const Host second;
    EXPECT_NE(first.queue(), NVSTATUS_ERROR);
    EXPECT_NE(first.queue(), second.queue());
    EXPECT_NE(first.address(), second.address());
    EXPECT_EQ(first.address().node, 1);
    EXPECT_EQ(openQueues(), 2U);
}

TEST_F(TransportTest, AMessageToABoundAddressReachesThatQueueUntouched) {
    Host first;
    Host second;
    first.send(1234, second.address(), {1, 2, 3}, 77);
    const Message message = second.read();
    EXPECT_EQ(message.type, 1234U);
    EXPECT_EQ(message.transaction, 77U << 8);
    EXPECT_EQ(message.source, first.address());
    EXPECT_EQ(message.body, (Octets{1, 2, 3}));
}

TEST_F(TransportTest, AQueueMayWriteToItself) {
    Host host;
    host.send(1, host.address());
    EXPECT_EQ(host.read().type, 1U);
}

TEST_F(TransportTest, AReplyKeepsTheLibrarysOctetOfTheTransactionWord) {
    Host host;
    NvMsg32Bit* msg = allocate(0);
    store({0x00271142, 2, host.address(), {1, 1, 1, 0x15, 0}, {}}, *msg);
    nvMsgWrite(host.queue(), msg, 0);
    const Message reply = host.read();
    EXPECT_EQ(reply.type, 3U);
    EXPECT_EQ(reply.transaction, 0x00271142U);
}

TEST_F(TransportTest, AReaderWaitsForAMessage) {
    Host reader;
    Host writer;
    std::thread waiting([&] { EXPECT_EQ(reader.read().type, 42U); });
    writer.send(42, reader.address());
    waiting.join();
}

TEST_F(TransportTest, ClosingAQueueWakesItsReaderAndFreesWhatWasNotRead) {
    const uint32_t queue = nvQueueOpen();
    NvCompDesc address{};
    nvQueueBind(queue, &address);
    std::thread waiting([queue] {
        NvMsg32Bit* msg = nullptr;
        while (nvMsgRead(queue, 0, &msg) == NVSTATUS_OK) {
            nvMsgFree(msg);
        }
    });
    for (int i = 0; i < 3; ++i) {
        send(42, address, address, {1});
    }
    EXPECT_EQ(nvQueueUnbind(queue, address), NVSTATUS_OK);
    EXPECT_FALSE(send(42, address, address, {1}));
    EXPECT_EQ(nvQueueClose(queue), NVSTATUS_OK);
    waiting.join();
}

TEST_F(TransportTest, AReaderThatComesAfterTheCloseIsToldSo) {
    uint32_t queue = 0;
    {
        Host host;
        queue = host.queue();
        host.send(1, host.address());
    }
    NvMsg32Bit* msg = nullptr;
    EXPECT_EQ(nvMsgRead(queue, 0, &msg), NVSTATUS_ERROR);
    EXPECT_EQ(msg, nullptr);
}

TEST_F(TransportTest, ManyThreadsMayUseManyQueues) {
    std::vector<std::thread> threads;
    threads.reserve(4);
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([] {
            Host host;
            for (uint32_t n = 1; n <= 50; ++n) {
                EXPECT_EQ(host.ask(2, {1, 1, 1, 0x15, 0}, {}, n).transaction, n << 8);
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
}

// Misuse ends the process; the report names the call and what is wrong.
class MisuseDeathTest : public testing::Test {
  protected:
    MisuseDeathTest() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }
};

TEST_F(MisuseDeathTest, AMessageIsFreedTwice) {
    EXPECT_DEATH(
        {
            NvMsg32Bit* msg = allocate(4);
            nvMsgFree(msg);
            nvMsgFree(msg);
        },
        "softboard: nvMsgFree: the message buffer was freed before");
}

TEST_F(MisuseDeathTest, AFreedMessageIsUsed) {
    uint32_t value = 0;
    EXPECT_DEATH(
        {
            NvMsg32Bit* msg = allocate(4);
            nvMsgFree(msg);
            nvMsgFieldGet(msg, 0, &value);
        },
        "softboard: nvMsgFieldGet: the message buffer was freed before");
}

TEST_F(MisuseDeathTest, APointerIsNoMessage) {
    NvMsg32Bit foreign{};
    EXPECT_DEATH(nvMsgFree(&foreign), "softboard: nvMsgFree: the pointer is not a message buffer");
    EXPECT_DEATH(nvMsgFree(nullptr), "softboard: nvMsgFree: a null pointer instead of a message buffer");
}

TEST_F(MisuseDeathTest, AMessageIsUsedAfterItWasWritten) {
    EXPECT_DEATH(
        {
            Host host;
            NvMsg32Bit* msg = allocate(0);
            store({0, 1, host.address(), host.address(), {}}, *msg);
            nvMsgWrite(host.queue(), msg, 0);
            nvMsgFree(msg);
        },
        "softboard: nvMsgFree: the message buffer was handed over with nvMsgWrite");
}

TEST_F(MisuseDeathTest, TheHeaderPromisesMoreThanTheBufferHolds) {
    EXPECT_DEATH(
        {
            Host host;
            NvMsg32Bit* msg = allocate(4);
            msg->size = 500;
            nvMsgWrite(host.queue(), msg, 0);
        },
        "softboard: nvMsgWrite: the header says 500 octets of body, the buffer holds 4");
}

TEST_F(MisuseDeathTest, AQueueIsUnknown) {
    NvMsg32Bit* msg = nullptr;
    NvCompDesc address{};
    EXPECT_DEATH(nvMsgRead(2, 0, &msg), "softboard: nvMsgRead: there is no queue 2");
    EXPECT_DEATH(nvQueueBind(99999, &address), "softboard: nvQueueBind: there is no queue 99999");
}

TEST_F(MisuseDeathTest, AQueueIsClosedTwice) {
    EXPECT_DEATH(
        {
            const uint32_t queue = nvQueueOpen();
            nvQueueClose(queue);
            nvQueueClose(queue);
        },
        "softboard: nvQueueClose: queue [0-9]+ was closed before");
}

TEST_F(MisuseDeathTest, AQueueIsNotBound) {
    NvMsg32Bit* msg = nullptr;
    EXPECT_DEATH(nvMsgRead(nvQueueOpen(), 0, &msg), "softboard: nvMsgRead: queue [0-9]+ was never bound");
    EXPECT_DEATH(nvMsgWrite(nvQueueOpen(), allocate(0), 0),
                 "softboard: nvMsgWrite: queue [0-9]+ is not bound");
    EXPECT_DEATH(nvQueueUnbind(nvQueueOpen(), {}),
                 "softboard: nvQueueUnbind: queue [0-9]+ is not bound to 0/0/0/0/0");
}

TEST_F(MisuseDeathTest, AQueueIsBoundTwice) {
    NvCompDesc address{};
    EXPECT_DEATH(
        {
            const Host host;
            nvQueueBind(host.queue(), &address);
        },
        "softboard: nvQueueBind: queue [0-9]+ is bound already");
}

TEST_F(MisuseDeathTest, AnOffsetIsBeyondAnyMessage) {
    uint32_t value = 0;
    uint32_t offset = 5;
    EXPECT_DEATH(nvMsgVarFieldPut(allocate(4), 1, &offset, oneU32, &value),
                 "softboard: nvMsgVarFieldPut: offset 5 is past the message");
    offset = 0xfffffff0;
    EXPECT_DEATH(nvMsgVarFieldGet(allocate(4), 1, &offset, oneU32, &value),
                 "softboard: nvMsgVarFieldGet: offset 4294967280 is past the message");
    EXPECT_DEATH(nvMsgVarFieldGet(allocate(4), 1, nullptr, oneU32, &value),
                 "softboard: nvMsgVarFieldGet: a null pointer instead of an offset");
}

}  // namespace
}  // namespace softboard
