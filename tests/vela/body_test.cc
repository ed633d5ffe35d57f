// Declaring, binding, copying and printing bodies.
#include "tests/vela/transport.h"
#include "vela/CCS.h"
#include "vela/CompAttr.h"
#include "vela/MsgDefault.h"
#include "vela/ResourceMgr.h"
#include "vela/StdResource.h"

namespace {

using vela::CCS;
using vela::CompDesc_t;
using vela::staticList;
using vela::StdResource;

class BodyTest : public TransportTest {};

TEST_F(BodyTest, ABoundBodyReadsIntoTheCallersVariables) {
    unsigned int label = 0, direction = 0, timestamp = 0, length = 0;
    staticList<unsigned char> list;
    CCS::EvtL2Trace_t bound(label, direction, timestamp, length, list);
    Octets payload = fake_norv::words({1001, 1002, 1003, 1004});
    payload.push_back('x');
    messageOf(payload)->read(&bound, 0);
    EXPECT_EQ(label, 1001U);
    EXPECT_EQ(direction, 1002U);
    EXPECT_EQ(timestamp, 1003U);
    EXPECT_EQ(length, 1004U);
    EXPECT_EQ(list, (staticList<unsigned char>{'x'}));
}

TEST_F(BodyTest, ABoundBodyWritesAndPrintsWhatTheVariablesAreNow) {
    unsigned int parm = 1, value = 2;
    StdResource::MsgSetParm_t bound(parm, value);
    parm = 10;
    value = 1001;
    EXPECT_EQ(encoded(bound), (Octets{10, 0, 0, 0, 0xE9, 3, 0, 0}));
    EXPECT_EQ(printed(bound), "{Parm 10 Val 1001}");
}

TEST_F(BodyTest, AssigningAFieldOfABoundBodySetsTheVariable) {
    unsigned int parm = 1, value = 2;
    StdResource::MsgSetParm_t bound(parm, value);
    bound.Val = 1002;
    EXPECT_EQ(value, 1002U);
    StdResource::MsgSetParm_t own;
    own.Parm = 7;
    bound = own;
    EXPECT_EQ(parm, 7U);
}

TEST_F(BodyTest, ACopyOfABoundBodyHasStorageOfItsOwn) {
    unsigned int parm = 1001, value = 1002;
    const StdResource::MsgSetParm_t bound(parm, value);
    StdResource::MsgSetParm_t copy(bound);
    parm = 0;
    EXPECT_EQ(printed(copy), "{Parm 1001 Val 1002}");
    copy.Val = 7;
    EXPECT_EQ(value, 1002U);
}

TEST_F(BodyTest, ACopyOfAnOwningBodyIsIndependentOfIt) {
    auto original = std::make_unique<StdResource::MsgSetxParms_t>();
    original->Parms->realloc(1);
    original->Parms->element(0).Parm = 1001;
    StdResource::MsgSetxParms_t copy(*original);
    original.reset();
    EXPECT_EQ(printed(copy), "{Count 0 Parms {{Parm 1001 Val 0}}}");
}

TEST_F(BodyTest, TheDefaultBodyBindsToTheCallersList) {
    staticList<unsigned char> list{1, 2};
    vela::MsgDefault_t bound(list);
    vela::MsgDefault_t copy(bound);
    messageOf({7, 8, 9})->read(&bound, 0);
    EXPECT_EQ(list, (staticList<unsigned char>{7, 8, 9}));
    EXPECT_EQ(printed(copy), "{ByteData {1 2 }}");
}

TEST_F(BodyTest, BodiesPrintTheirLabelsAndValues) {
    CCS::EvtL2Trace_t trace;
    trace.Label = 2;
    trace.Direction = 1;
    trace.Timestamp = 1003;
    trace.Length = 2;
    trace.List = staticList<unsigned char>{'a', 'b'};
    EXPECT_EQ(printed(trace), "{Label 2 Direction 1 Timestamp 1003 Length 2 List {a b}}");
    EXPECT_EQ(printed(StdResource::MsgInit_t()), "{}");
    EXPECT_EQ(printed(vela::MsgDefault_t()), "{ByteData {}}");
    EXPECT_EQ(printed(vela::CompAttr_t(0, -18)), "{key 0 value -18}");
}

TEST_F(BodyTest, ADefaultBodyPrintsItsOctetsInTheStreamsBase) {
    staticList<unsigned char> list{0, 10, 255};
    std::ostringstream out;
    out << std::hex << std::showbase << vela::MsgDefault_t(list);
    EXPECT_EQ(out.str(), "{ByteData {0 0xa 0xff }}");
}

TEST_F(BodyTest, AnAddressPrintsInItsOwnOrder) {
    EXPECT_EQ(printed(CompDesc_t(5, 1, 2, 3, 4)), "{Node 4 Board 1 Processor 2 Component 3 Instance 5}");
    std::ostringstream out;
    out << std::hex << std::showbase << CompDesc_t(0x105, 1, 2, 255, 4);
    EXPECT_EQ(out.str(), "{Node 0x4 Board 0x1 Processor 0x2 Component 0xff Instance 0x105}");
}

TEST_F(BodyTest, AnAddressIs6Octets) {
    CompDesc_t address(0x0102, 3, 4, 5, 6);
    EXPECT_EQ(address.GetByteSize(), 6U);
    EXPECT_EQ(encoded(address), (Octets{2, 1, 3, 4, 5, 6}));
    EXPECT_EQ(fieldCalls(fake_norv::Op::varFieldPut),
              "@0 0x280000\n@2 0x200000 0x200000 0x200000 0x200000\n");
    CompDesc_t read;
    EXPECT_EQ(messageOf({2, 1, 3, 4, 5, 6})->read(&read, 0), 6U);
    EXPECT_EQ(read, address);
}

TEST_F(BodyTest, AddressesDifferInAnyOneField) {
    const CompDesc_t address(5, 1, 2, 3, 4);
    EXPECT_EQ(address, CompDesc_t(5, 1, 2, 3, 4));
    for (const CompDesc_t& other :
         {CompDesc_t(6, 1, 2, 3, 4), CompDesc_t(5, 2, 2, 3, 4), CompDesc_t(5, 1, 3, 3, 4),
          CompDesc_t(5, 1, 2, 4, 4), CompDesc_t(5, 1, 2, 3, 5)})
        EXPECT_NE(address, other);
}

TEST_F(BodyTest, AnAddressConvertsToTheTransportsAndBack) {
    const NvCompDesc raw = CompDesc_t(5, 1, 2, 3, 4).getNvCompDesc();
    EXPECT_EQ(raw.instance, 5U);
    EXPECT_EQ(raw.board, 1U);
    EXPECT_EQ(raw.processor, 2U);
    EXPECT_EQ(raw.component, 3U);
    EXPECT_EQ(raw.node, 4U);
    EXPECT_EQ(CompDesc_t(raw), CompDesc_t(5, 1, 2, 3, 4));
}

TEST_F(BodyTest, AnAttributeIsAnUnsignedKeyAndASignedValue) {
    vela::CompAttr_t attribute(0x01020304, -2);
    EXPECT_EQ(encoded(attribute), (Octets{4, 3, 2, 1, 0xFE, 0xFF, 0xFF, 0xFF}));
    EXPECT_EQ(fieldCalls(fake_norv::Op::varFieldPut), "@0 0x380000\n@4 0x180000\n");
}

TEST_F(BodyTest, AnErrorCarriesDataForTheParameterCommandsAlone) {
    for (unsigned int command = 0; command < 60; ++command) {
        const auto msg = messageOf(fake_norv::words({command, 1002, 1003, 1004}));
        StdResource::MsgError_t error;
        const unsigned int end = msg->read(&error, 0);
        const bool parameter =
            command == 8 || command == 10 || command == 18 || command == 20 || command == 45 || command == 47;
        EXPECT_EQ(end, parameter ? 16U : 8U) << command;
        EXPECT_EQ(error.GetByteSize(), end) << command;
        EXPECT_EQ(printed(error), "{ErrorMsg " + std::to_string(command) + " ErrorCode 1002 Data " +
                                      (parameter ? "{Num 1003 Val 1004}" : "NULL") + "}");
    }
}

TEST_F(BodyTest, AnErrorIsWrittenWithItsDataAndBindsToVariables) {
    unsigned int command = 8, code = 1002;
    StdResource::Data_ErrorMsg_0x8_t data;
    data.Num = 1003;
    data.Val = 1004;
    StdResource::MsgError_t error(command, code, data);
    EXPECT_EQ(encoded(error), fake_norv::words({8, 1002, 1003, 1004}));
    command = 4;
    EXPECT_EQ(encoded(error), fake_norv::words({4, 1002}));
    messageOf(fake_norv::words({18, 2002, 2003, 2004}))->read(&error, 0);
    EXPECT_EQ(code, 2002U);
    EXPECT_EQ(data.Val, 2004U);
    const StdResource::MsgError_t copy(error);
    data.Val = 0;
    EXPECT_EQ(printed(copy), "{ErrorMsg 18 ErrorCode 2002 Data {Num 2003 Val 2004}}");
}

TEST_F(BodyTest, AFamilyMakesItsBodiesByCodeAndNoOthers) {
    const std::unique_ptr<vela::MsgBody> made(StdResource::Bodies::make(8));
    EXPECT_NE(dynamic_cast<StdResource::MsgSetParm_t*>(made.get()), nullptr);
    for (const unsigned int code : {31U, 43U, 44U, 49U, 8388608U, 0xFFFFFFFFU})
        EXPECT_EQ(StdResource::Bodies::make(code), nullptr) << code;
}

}  // namespace
