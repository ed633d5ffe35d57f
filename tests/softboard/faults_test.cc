// What each fault does, seen from the host through the transport's own functions.
#include "softboard/faults.h"

#include <gtest/gtest.h>

#include <fstream>
#include <sstream>
#include <stdexcept>

#include "softboard/codes.h"
#include "softboard/softboard.h"
#include "softboard/wire.h"
#include "tests/softboard/host.h"

namespace softboard {
namespace {

const Address ccs{1, 1, 1, ccsType, 0};
const Frame frame{true, 7, {0x00, 0x01, 0x7f}};
const Octets frameEvent{2, 0, 0, 0, 1, 0, 0, 0, 7, 0, 0, 0, 3, 0, 0, 0, 0x00, 0x01, 0x7f};
const Octets traceOn{10, 0, 0, 0, 1, 0, 0, 0};
const Octets traceOff{10, 0, 0, 0, 0, 0, 0, 0};

std::string complaint(const std::string& text) {
    try {
        parseFault(text);
    } catch (const std::invalid_argument& error) {
        return error.what();
    }
    return "";
}

TEST(FaultTest, IsANameWithOrWithoutItsNumber) {
    EXPECT_EQ(parseFault("reply-lost=3"), (Fault{FaultKind::replyLost, 3}));
    EXPECT_EQ(parseFault("burst"), (Fault{FaultKind::burst, 101}));
    EXPECT_EQ(parseFault("offset-stays-0"), (Fault{FaultKind::offsetStays0, 0}));
    for (const FaultName& row : faultNames()) {
        const Fault fault{row.kind, row.takesNumber ? row.most : 0};
        EXPECT_EQ(parseFault(toText(fault)), fault) << row.name;
    }
}

TEST(FaultTest, IsRefusedWithASentenceWhenItMakesNoSense) {
    const struct {
        const char* text;
        const char* sentence;
    } cases[] = {
        {"", "there is no fault \"\" (softboard --help lists them)"},
        {"reply", "there is no fault \"reply\" (softboard --help lists them)"},
        {"Burst=3", "there is no fault \"Burst\" (softboard --help lists them)"},
        {"burst=", "the fault burst: \"\" is no number from 1 to 4294967295"},
        {"burst=0", "the fault burst: \"0\" is no number from 1 to 4294967295"},
        {"burst=4294967296", "the fault burst: \"4294967296\" is no number from 1 to 4294967295"},
        {"event-source=65536", "the fault event-source: \"65536\" is no number from 0 to 65535"},
        {"event-label= 3", "the fault event-label: \" 3\" is no number from 0 to 4294967295"},
        {"never-waits=1", "the fault never-waits takes no number"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(complaint(c.text), c.sentence) << c.text;
    }
}

TEST(FaultTest, StandsInTheDocument) {
    std::ostringstream document;
    document << std::ifstream(LAPDMON_SOURCE_DIR "/docs/user/softboard.md").rdbuf();
    for (const FaultName& row : faultNames()) {
        const std::string form = std::string("| `") + row.name + (row.takesNumber ? "=N` |" : "` |");
        EXPECT_NE(document.str().find(form), std::string::npos) << form;
    }
}

// A host on a board with faults.
class FaultyBoard : public testing::Test {
  protected:
    ~FaultyBoard() override { reset(oneChannel({frame})); }

    void has(const std::vector<const char*>& faults, size_t frames = 1) {
        Scenario scenario = oneChannel(Frames(frames, frame));
        for (const char* fault : faults) {
            scenario.faults.push_back(parseFault(fault));
        }
        reset(scenario);
    }

    void traces(Host& host) {
        host.ask(msgDetectEvt, ccs, BodyWriter().address(host.address()).u32(2).u32(0).take());
        EXPECT_EQ(host.ask(msgSetParm, ccs, traceOn).type, msgSetParmCmplt);
    }
};

TEST_F(FaultyBoard, FailsTheCallsThatItIsToldTo) {
    has({"allocate-fails=2", "open-fails=1", "open-fails=3", "bind-fails=1"});
    NvMsg32Bit* first = nullptr;
    EXPECT_EQ(nvMsgAllocate(4, &first), uint32_t{NVSTATUS_OK});
    NvMsg32Bit* second = nullptr;
    EXPECT_EQ(nvMsgAllocate(4, &second), uint32_t{NVSTATUS_ERROR});
    EXPECT_EQ(second, nullptr);
    nvMsgFree(first);
    EXPECT_EQ(nvQueueOpen(), uint32_t{NVSTATUS_ERROR});
    const uint32_t queue = nvQueueOpen();
    EXPECT_NE(queue, uint32_t{NVSTATUS_ERROR});
    EXPECT_EQ(nvQueueOpen(), uint32_t{NVSTATUS_ERROR});
    NvCompDesc host{};
    EXPECT_EQ(nvQueueBind(queue, &host), uint32_t{NVSTATUS_ERROR});
    EXPECT_EQ(nvQueueBind(queue, &host), uint32_t{NVSTATUS_OK});
    nvQueueUnbind(queue, host);
    nvQueueClose(queue);
}

TEST_F(FaultyBoard, ChangesTheReplyThatItIsToldTo) {
    const struct {
        const char* fault;
        uint32_t type;
        Octets body;
        uint16_t instance;
        uint32_t transaction;
    } cases[] = {
        {"reply-type-0=2", 0, {}, 1, 10001},
        {"reply-general=2", 8388609, {}, 1, 10001},
        {"reply-error=2", 0, {8, 0, 0, 0, 3, 0, 0, 0}, 1, 10001},
        {"reply-other-source=2", 9, {}, 0x4001, 10001},
        {"reply-wrong-transaction=2", 9, {}, 1, 10001 | 0x800000},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.fault);
        has({c.fault});
        Host host;
        EXPECT_EQ(host.ask(msgComtest, ccs).type, msgComtestCmplt);
        const Message reply = host.ask(msgSetParm, ccs, traceOff, 10001);
        EXPECT_EQ(reply.type, c.type);
        EXPECT_EQ(reply.body, c.body);
        EXPECT_EQ(reply.source.instance, c.instance);
        EXPECT_EQ(reply.transaction >> 8, c.transaction);
        EXPECT_EQ(host.ask(msgComtest, ccs).type, msgComtestCmplt);
    }
}

TEST_F(FaultyBoard, LosesDelaysAndDoublesReplies) {
    has({"reply-lost=1", "reply-twice=2", "reply-late=3"});
    Host host;
    for (const uint32_t transaction : {1, 2, 3, 4}) {
        host.send(msgComtest, ccs, {}, transaction);
    }
    for (const uint32_t transaction : {2, 2, 3, 4}) {
        EXPECT_EQ(host.read().transaction >> 8, transaction);
    }
}

TEST_F(FaultyBoard, PutsWrongEventsBesideTheRightOnes) {
    Octets overlong = frameEvent;
    overlong.insert(overlong.end(), {0x55, 0x55});
    Octets length = frameEvent;
    std::fill_n(length.begin() + 12, 4, 0xff);
    Octets label = frameEvent;
    label[0] = 3;
    const struct {
        const char* fault;
        uint32_t type;
        uint16_t instance;
        Octets body;
    } cases[] = {
        {"event-truncated=5", 32, 1, {2, 0, 0, 0, 1}},
        {"event-truncated=0", 32, 1, {}},
        {"event-truncated=99", 32, 1, frameEvent},
        {"event-overlong=2", 32, 1, overlong},
        {"event-length", 32, 1, length},
        {"event-label", 32, 1, label},
        {"event-type", 999, 1, frameEvent},
        {"event-source", 32, 99, frameEvent},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.fault);
        has({c.fault}, 101);
        Host host;
        traces(host);
        for (int i = 0; i <= 100; ++i) {
            if (i % 100 == 0) {
                const Message wrong = host.read();
                EXPECT_EQ(wrong.type, c.type);
                EXPECT_EQ(wrong.source.instance, c.instance);
                EXPECT_EQ(wrong.body, c.body);
            }
            const Message right = host.read();
            EXPECT_EQ(right.type, msgEvtDetected);
            EXPECT_EQ(right.source, ccs);
            EXPECT_EQ(right.body, frameEvent);
        }
    }
}

TEST_F(FaultyBoard, SendsABurstWithoutWaitingForItsReader) {
    has({"burst=500"}, 600);
    Host host;
    traces(host);
    EXPECT_TRUE(waitForMessages(msgEvtDetected, 500));  // nobody reads: more than that must not come
    EXPECT_EQ(outstanding(), 500U);
}

TEST_F(FaultyBoard, NeverWaitsForItsReader) {
    has({"never-waits"}, 600);
    Host host;
    traces(host);
    EXPECT_TRUE(waitForMessages(msgEvtDetected, 600));
}

TEST_F(FaultyBoard, SendsEventsAroundTheRepliesThatEndTheTrace) {
    has({"events-while-stopping=2"});
    Host host;
    traces(host);
    EXPECT_EQ(host.read().body, frameEvent);
    host.send(msgCancelEvt, ccs, {2, 0, 0, 0});
    host.send(msgSetParm, ccs, traceOff);
    for (const uint32_t type : {32, 32, 27, 32, 32, 32, 32, 9, 32, 32}) {
        EXPECT_EQ(host.read().type, type);
    }
}

TEST_F(FaultyBoard, GoesSilent) {
    has({"silent=1"}, 2);
    Host host;
    traces(host);
    EXPECT_EQ(host.read().body, frameEvent);
    host.send(msgComtest, ccs);
    setFaults({});
    EXPECT_EQ(host.read().type, msgEvtDetected);  // the other frame
    EXPECT_EQ(host.ask(msgSetParm, ccs, traceOff).type, msgSetParmCmplt);
}

TEST_F(FaultyBoard, LeavesTheOffsetAt0) {
    has({"offset-stays-0"});
    NvMsg32Bit* msg = nullptr;
    ASSERT_EQ(nvMsgAllocate(8, &msg), uint32_t{NVSTATUS_OK});
    constexpr uint32_t unsigned32 = 7U << 19;
    uint32_t offset = 0;
    uint32_t value = 1001;
    EXPECT_EQ(nvMsgVarFieldPut(msg, 1, &offset, unsigned32, &value), uint32_t{NVSTATUS_OK});
    EXPECT_EQ(offset, 0U);
    offset = 4;
    EXPECT_EQ(nvMsgVarFieldPut(msg, 1, &offset, unsigned32, &value), uint32_t{NVSTATUS_OK});
    EXPECT_EQ(offset, 8U);
    offset = 0;
    EXPECT_EQ(nvMsgVarFieldGet(msg, 1, &offset, unsigned32, &value), uint32_t{NVSTATUS_OK});
    EXPECT_EQ(offset, 0U);
    nvMsgFree(msg);
}

}  // namespace
}  // namespace softboard
