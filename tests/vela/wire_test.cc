// How bodies move their fields: descriptors, calls, chunks, and what a payload that is too short gives.
#include "tests/vela/transport.h"
#include "vela/CCS.h"
#include "vela/MsgDefault.h"
#include "vela/StdResource.h"

namespace {

using fake_norv::Op;
using vela::CCS;
using vela::staticList;
using vela::StdResource;

class WireTest : public TransportTest {};

staticList<unsigned char> listOf(const Octets& octets) {
    staticList<unsigned char> list(static_cast<unsigned int>(octets.size()));
    std::copy(octets.begin(), octets.end(), list.begin());
    return list;
}

const struct ByteChunks {
    unsigned int size;
    const char* calls;
} byteChunks[] = {
    {0, ""},
    {1, "@0 0x200000\n"},
    {254, "@0 0x27e800\n"},
    {255, "@0 0x27f000\n"},
    {256, "@0 0x200000\n@1 0x27f000\n"},
    {509, "@0 0x27e800\n@254 0x27f000\n"},
    {510, "@0 0x27f000\n@255 0x27f000\n"},
    {511, "@0 0x200000\n@1 0x27f000\n@256 0x27f000\n"},
};

TEST_F(WireTest, AByteListIsWrittenInChunksOfAtMost255TheOddOneFirst) {
    for (const bool stuck : {false, true}) {
        for (const ByteChunks& c : byteChunks) {
            fake_norv::reset();
            fake_norv::leaveFirstOffsetAtZero(stuck);
            staticList<unsigned char> list = listOf(counted(c.size));
            vela::MsgDefault_t body(list);
            EXPECT_EQ(encoded(body), counted(c.size)) << c.size;
            EXPECT_EQ(fieldCalls(Op::varFieldPut), c.calls) << c.size;
        }
    }
}

TEST_F(WireTest, AByteListIsReadInTheSameChunks) {
    for (const bool stuck : {false, true}) {
        for (const ByteChunks& c : byteChunks) {
            fake_norv::reset();
            fake_norv::leaveFirstOffsetAtZero(stuck);
            const auto msg = messageOf(counted(c.size));
            vela::MsgDefault_t body;
            EXPECT_EQ(msg->read(&body, 0), c.size);
            EXPECT_EQ(body.bytes(), listOf(counted(c.size))) << c.size;
            EXPECT_EQ(fieldCalls(Op::varFieldGet), c.calls) << c.size;
        }
    }
}

struct Shorts {
    vela::Array<unsigned short, vela::WireType::unsigned16, "Shorts"> values;
};

TEST_F(WireTest, WiderElementsGoInChunksOf255Too) {
    vela::Body<vela::noCode, Shorts> shorts;
    shorts.values->realloc(256);
    EXPECT_EQ(encoded(shorts).size(), 512U);
    EXPECT_EQ(fieldCalls(Op::varFieldPut), "@0 0x280000\n@2 0x2ff000\n");

    fake_norv::reset();
    StdResource::MsgCancelxEvts_t words;
    words.EvtTypeList->realloc(510);
    EXPECT_EQ(encoded(words).size(), 4U + 2040U);
    EXPECT_EQ(fieldCalls(Op::varFieldPut), "@0 0x380000\n@4 0x3ff000\n@1024 0x3ff000\n");
}

CCS::EvtL2Trace_t traceOf(unsigned int length) {
    CCS::EvtL2Trace_t trace;
    trace.Label = 1001;
    trace.Direction = 1002;
    trace.Timestamp = 1003;
    trace.Length = 1004;
    trace.List = listOf(counted(length));
    return trace;
}

TEST_F(WireTest, ATraceRecordOf300OctetsIs16OctetsOfFieldsAChunkOf45AndOneOf255) {
    CCS::EvtL2Trace_t trace = traceOf(300);
    Octets expected{0xE9, 3, 0, 0, 0xEA, 3, 0, 0, 0xEB, 3, 0, 0, 0xEC, 3, 0, 0};
    for (const std::uint8_t octet : counted(300))
        expected.push_back(octet);
    EXPECT_EQ(trace.GetByteSize(), 316U);
    EXPECT_EQ(encoded(trace), expected);
    EXPECT_EQ(fieldCalls(Op::varFieldPut),
              "@0 0x380000\n@4 0x380000 0x380000 0x380000\n@16 0x216000\n@61 0x27f000\n");
}

TEST_F(WireTest, ABodyEndsAfterItsLastFieldWhetherOrNotTheLibraryMovesTheFirstOffset) {
    for (const bool stuck : {false, true}) {
        fake_norv::reset();
        fake_norv::leaveFirstOffsetAtZero(stuck);
        CCS::EvtL2Trace_t trace = traceOf(300);
        const auto msg = messageOf(encoded(trace));
        CCS::EvtL2Trace_t read;
        EXPECT_EQ(msg->read(&read, 0), 316U);
        EXPECT_EQ(read.Timestamp, 1003U);
        EXPECT_EQ(read.List.value(), trace.List.value());
        EXPECT_EQ(fieldCalls(Op::varFieldGet), fieldCalls(Op::varFieldPut));
    }
}

TEST_F(WireTest, AnAddressThatBeginsABodyIsCorrectedByItsOwnFirstField) {
    fake_norv::leaveFirstOffsetAtZero();
    StdResource::MsgDetectEvt_t body;
    body.RetAddr = vela::CompDesc_t(0x0102, 3, 4, 5, 6);
    body.EvtType = 1001;
    body.EvtGroup = 1002;
    EXPECT_EQ(encoded(body), (Octets{2, 1, 3, 4, 5, 6, 0xE9, 3, 0, 0, 0xEA, 3, 0, 0}));
    EXPECT_EQ(fieldCalls(Op::varFieldPut),
              "@0 0x280000\n@2 0x200000 0x200000 0x200000 0x200000\n@6 0x380000 0x380000\n");
}

TEST_F(WireTest, OnlyTheFirstCallOfABodyIsCorrected) {
    using Both = std::pair<unsigned int, unsigned int>;
    const auto ends = [](vela::MsgBody& body) {
        vela::Msg msg(body.GetByteSize());
        const unsigned int written = msg.write(&body, 0);
        return Both(written, msg.read(&body, 0));
    };
    fake_norv::leaveOffsetsAtZero();
    StdResource::MsgGetParm_t one;
    EXPECT_EQ(ends(one), Both(4, 4)) << "one call";
    StdResource::MsgSetParm_t two;
    EXPECT_EQ(ends(two), Both(0, 0)) << "a second call";
    vela::CompDesc_t address;
    EXPECT_EQ(ends(address), Both(0, 0)) << "a second call";
    StdResource::MsgDetectEvt_t nested;
    EXPECT_EQ(ends(nested), Both(0, 0)) << "a field behind a body";
    staticList<unsigned char> octets = listOf(counted(256));
    vela::MsgDefault_t chunks(octets);
    EXPECT_EQ(ends(chunks), Both(0, 0)) << "a second chunk";
}

TEST_F(WireTest, ABodyWithinAPayloadStartsAtItsOffsetAndNeedsNoCorrection) {
    for (const bool stuck : {false, true}) {
        fake_norv::reset();
        fake_norv::leaveFirstOffsetAtZero(stuck);
        vela::Msg msg(12);
        StdResource::MsgSetParm_t body;
        body.Parm = 10;
        body.Val = 1;
        EXPECT_EQ(msg.write(&body, 4), 12U);
        EXPECT_EQ(octetsOf(msg), (Octets{0, 0, 0, 0, 10, 0, 0, 0, 1, 0, 0, 0}));
        EXPECT_EQ(fieldCalls(Op::varFieldPut), "@4 0x380000\n@8 0x380000\n");
    }
}

TEST_F(WireTest, TheListOfATraceRecordIsTheWholeRestOfThePayload) {
    const struct { unsigned int payload, list; } cases[] = {{16, 0}, {17, 1}, {20, 4}, {316, 300}};
    for (const auto& c : cases) {
        const auto msg = messageOf(Octets(c.payload, 7));
        CCS::EvtL2Trace_t trace;
        EXPECT_EQ(msg->read(&trace, 0), c.payload);
        EXPECT_EQ(trace.List->length(), c.list);
        EXPECT_EQ(trace.Length, 0x07070707U);
    }
}

TEST_F(WireTest, APayloadShorterThanTheFieldsLeavesTheMissingOnes0) {
    for (const bool stuck : {false, true}) {
        for (unsigned int size = 0; size < 16; ++size) {
            fake_norv::reset();
            fake_norv::leaveFirstOffsetAtZero(stuck);
            const auto msg = messageOf(Octets(size, 0xFF));
            CCS::EvtL2Trace_t trace = traceOf(3);
            EXPECT_EQ(msg->read(&trace, 0), 16U) << size;
            EXPECT_EQ(trace.Label, size < 4 ? 0U : 0xFFFFFFFFU) << size;
            EXPECT_EQ(trace.Direction, size < 8 ? 0U : 0xFFFFFFFFU) << size;
            EXPECT_EQ(trace.Timestamp, size < 12 ? 0U : 0xFFFFFFFFU) << size;
            EXPECT_EQ(trace.Length, 0U) << size;
            EXPECT_EQ(trace.List->length(), 0U) << size;
            for (const fake_norv::Call& call : fake_norv::calls(Op::varFieldGet))
                EXPECT_EQ(call.status, 0U) << "a read outside the payload";
        }
    }
}

TEST_F(WireTest, AnOffsetBeyondThePayloadReadsAnEmptyList) {
    const auto msg = messageOf(counted(8));
    vela::MsgDefault_t body;
    EXPECT_EQ(msg->read(&body, 9), 9U);
    EXPECT_EQ(body.bytes().length(), 0U);
    EXPECT_EQ(fake_norv::count(Op::varFieldGet), 0U);
}

TEST_F(WireTest, ACountThatSaysMoreThanIsThereReadsWhatIsThere) {
    const struct {
        std::uint32_t count;
        unsigned int entries, read;
    } cases[] = {{2, 2, 2}, {3, 2, 2}, {0xFFFFFFFF, 2, 2}, {0xFFFFFFFF, 0, 0}, {1, 2, 1}, {0, 2, 0}};
    for (const auto& c : cases) {
        Octets payload = fake_norv::words({c.count});
        payload.resize(4 + c.entries * 8, 7);
        const auto msg = messageOf(payload);
        StdResource::MsgSetxParms_t list;
        EXPECT_EQ(msg->read(&list, 0), 4 + c.read * 8);
        EXPECT_EQ(list.Parms->length(), c.read) << c.count;
        EXPECT_EQ(list.Count, c.count) << "as it was sent";

        const auto numbers = messageOf(payload);
        StdResource::MsgCancelxEvts_t types;
        numbers->read(&types, 0);
        EXPECT_EQ(types.EvtTypeList->length(), std::min<std::uint64_t>(c.count, c.entries * 2ULL)) << c.count;
    }
}

TEST_F(WireTest, HalfAnEntryAtTheEndOfAListIsDropped) {
    Octets payload = fake_norv::words({2, 1001, 1002});
    payload.resize(payload.size() + 7, 7);
    const auto msg = messageOf(payload);
    StdResource::MsgSetxParms_t list;
    msg->read(&list, 0);
    ASSERT_EQ(list.Parms->length(), 1U);
    EXPECT_EQ(list.Parms->element(0).Val, 1002U);
}

TEST_F(WireTest, TheCountIsWrittenFromTheListWhateverItWas) {
    StdResource::MsgSetxParms_t list;
    list.Count = 77;
    list.Parms->realloc(2);
    EXPECT_EQ(encoded(list).size(), 20U);
    EXPECT_EQ(list.Count, 2U);
}

TEST(Descriptor, HoldsCountAndTypeAndNothingElse) {
    using vela::WireType;
    EXPECT_EQ(vela::descriptor(WireType::signed8), 0U);
    EXPECT_EQ(vela::descriptor(WireType::signed16), 0x080000U);
    EXPECT_EQ(vela::descriptor(WireType::word32), 0x100000U);
    EXPECT_EQ(vela::descriptor(WireType::signed32), 0x180000U);
    EXPECT_EQ(vela::descriptor(WireType::unsigned8), 0x200000U);
    EXPECT_EQ(vela::descriptor(WireType::unsigned16), 0x280000U);
    EXPECT_EQ(vela::descriptor(WireType::value32), 0x300000U);
    EXPECT_EQ(vela::descriptor(WireType::unsigned32), 0x380000U);
    EXPECT_EQ(vela::descriptor(WireType::text8), 0x500000U);
    EXPECT_EQ(vela::descriptor(WireType::field32), 0x880000U);
    EXPECT_EQ(vela::descriptor(WireType::unsigned8, 255), 0x27F000U);
    EXPECT_EQ(vela::descriptorCount(0x3800), 8U);
    EXPECT_EQ(vela::descriptorType(0x3800), WireType::signed8);
}

TEST(Descriptor, NamesTheElementSizeOfEachType) {
    for (const unsigned int type : {0U, 4U, 10U})
        EXPECT_EQ(vela::elementSize(static_cast<vela::WireType>(type)), 1U) << type;
    for (const unsigned int type : {1U, 5U})
        EXPECT_EQ(vela::elementSize(static_cast<vela::WireType>(type)), 2U) << type;
    for (const unsigned int type : {2U, 3U, 6U, 7U, 8U, 9U, 11U, 16U, 17U, 31U})
        EXPECT_EQ(vela::elementSize(static_cast<vela::WireType>(type)), 4U) << type;
}

}  // namespace
