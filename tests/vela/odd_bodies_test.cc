// The bodies whose fields depend on one another.
#include "tests/vela/fill.h"
#include "tests/vela/transport.h"

namespace {

using fake_norv::Op;
using fake_norv::words;
using vela::CCS;
using vela::staticList;
using vela::TSCComponent;
using IEPubData = CCS::ieMessage_t::IEPubData_t;
using Parm = TSCComponent::Std_MsgSetxParms_t::Parms_t;

class OddBodyTest : public TransportTest {};

Octets operator+(Octets left, const Octets& right) {
    left.insert(left.end(), right.begin(), right.end());
    return left;
}

// ---- Information elements.

TEST_F(OddBodyTest, ASingleOctetElementIsOneOctet) {
    for (unsigned int id = 0; id < 256; ++id) {
        fake_norv::reset();
        IEPubData element;
        element.IEId = static_cast<unsigned char>(id);
        element.Value = staticList<unsigned char>{'x', 'y'};
        const bool single = id == 144 || id == 160 || id == 161 || id == 176 || id == 191 || id == 208;
        const auto octet = static_cast<std::uint8_t>(id);
        EXPECT_EQ(element.GetByteSize(), single ? 1U : 4U) << id;
        EXPECT_EQ(encoded(element), single ? Octets{octet} : (Octets{octet, 2, 'x', 'y'}));
        const auto msg = messageOf({octet, 2, 'x', 'y'});
        IEPubData read;
        read.Value = staticList<unsigned char>{'z'};
        EXPECT_EQ(msg->read(&read, 0), single ? 1U : 4U);
        EXPECT_EQ(printed(read), "{IEId " + std::to_string(id) +
                                     (single ? " Length 0 Value {}}" : " Length 2 Value {x y}}"));
    }
}

TEST_F(OddBodyTest, ASingleOctetElementIsWrittenAsItsOctetWhateverElseItHolds) {
    unsigned char id = 161, length = 77;
    staticList<unsigned char> value(300);
    IEPubData element(id, length, value);
    EXPECT_EQ(encoded(element), Octets{161});
    EXPECT_EQ(length, 77);
    EXPECT_EQ(value.length(), 300U);
}

TEST_F(OddBodyTest, ASingleOctetElementThatIsReadLeavesABoundLengthAlone) {
    unsigned char id = 8, length = 77;
    staticList<unsigned char> value{'x'};
    IEPubData element(id, length, value);
    EXPECT_EQ(messageOf({161, 2, 'a', 'b'})->read(&element, 0), 1U);
    EXPECT_EQ(id, 161);
    EXPECT_EQ(length, 77);
}

TEST_F(OddBodyTest, AnElementHoldsUpTo255Octets) {
    for (const unsigned int size : {0U, 1U, 254U, 255U}) {
        IEPubData element;
        element.IEId = 8;
        element.Value->realloc(size);
        EXPECT_EQ(encoded(element).size(), 2 + size);
        EXPECT_EQ(element.Length, size);
    }
    IEPubData element;
    element.Value->realloc(256);
    vela::Msg msg(element.GetByteSize());
    try {
        msg.write(&element, 0);
        FAIL() << "nothing was thrown";
    } catch (const vela::Exception& exception) {
        EXPECT_EQ(printed(exception), "a list is longer than its count can say");
    }
}

TEST_F(OddBodyTest, AnElementThatIsCutHoldsWhatIsThere) {
    IEPubData element;
    EXPECT_EQ(messageOf({8, 5, 'a', 'b'})->read(&element, 0), 4U);
    EXPECT_EQ(printed(element), "{IEId 8 Length 5 Value {a b}}");
    EXPECT_EQ(messageOf({8})->read(&element, 0), 2U);
    EXPECT_EQ(printed(element), "{IEId 8 Length 0 Value {}}");
}

TEST_F(OddBodyTest, TheElementsOfAMessageAreAsManyAsTheOctetsTheyWereReadFrom) {
    const Octets head{0xE9, 3, 0xEA, 3, 1, 0, 5, 'p'};
    CCS::ieMessage_t message;
    EXPECT_EQ(messageOf(head + Octets{8, 1, 'a', 161, 9, 0})->read(&message, 0), 14U);
    ASSERT_EQ(message.IEPubData->length(), 6U);
    EXPECT_EQ(printed(message.IEPubData.value()),
              "{{IEId 8 Length 1 Value {a}} {IEId 161 Length 0 Value {}} {IEId 9 Length 0 Value {}} "
              "{IEId 0 Length 0 Value {}} {IEId 0 Length 0 Value {}} {IEId 0 Length 0 Value {}}}");
    EXPECT_EQ(messageOf(head + Octets{161, 161})->read(&message, 0), 10U) << "into the same list again";
    EXPECT_EQ(printed(message.IEPubData.value()),
              "{{IEId 161 Length 0 Value {}} {IEId 161 Length 0 Value {}}}");
    EXPECT_EQ(messageOf(head)->read(&message, 0), 8U);
    EXPECT_EQ(message.IEPubData->length(), 0U);
}

TEST_F(OddBodyTest, TheLengthOfPrivateDataIsThatOfItsList) {
    CCS::ieMessage_t message;
    message.IEPrivBufLen = 77;
    message.IEPrivData = staticList<unsigned char>{'x', 'y'};
    EXPECT_EQ(encoded(message), (Octets{0, 0, 0, 0, 2, 0, 0, 'x', 'y'}));
    EXPECT_EQ(message.IEPrivBufLen, 2U);
    message.IEPrivData->realloc(65536);
    vela::Msg msg(message.GetByteSize());
    EXPECT_THROW(msg.write(&message, 0), vela::Exception);
}

TEST_F(OddBodyTest, PrivateDataThatIsCutHoldsWhatIsThere) {
    CCS::ieMessage_t message;
    EXPECT_EQ(messageOf({0, 0, 0, 0, 0xFF, 0xFF, 5, 'a'})->read(&message, 0), 8U);
    EXPECT_EQ(printed(message),
              "{CallId 0 CallRef 0 IEPrivBufLen 65535 MessageId 5 IEPrivData {a} IEPubData {}}");
}

// ---- Parameters that say themselves what they hold.

TEST_F(OddBodyTest, AFieldDefOf0x3800MovesEightOctets) {
    Parm parm;
    parm.Parm = 1001;
    parm.FieldDef = 0x3800;
    parm.Val = staticList<unsigned int>{1, 2, 3, 4, 5, 6, 7, 255};
    EXPECT_EQ(parm.GetByteSize(), 16U);
    const Octets octets = words({1001, 0x3800}) + Octets{1, 2, 3, 4, 5, 6, 7, 255};
    EXPECT_EQ(encoded(parm), octets);
    EXPECT_EQ(fieldCalls(Op::varFieldPut), "@0 0x380000\n@4 0x380000\n@8 0x3800\n");
    Parm read;
    EXPECT_EQ(messageOf(octets)->read(&read, 0), 16U);
    EXPECT_EQ(printed(read), "{Parm 1001 FieldDef 14336 Val {1 2 3 4 5 6 7 255}}");
    EXPECT_EQ(fieldCalls(Op::varFieldGet), fieldCalls(Op::varFieldPut));
}

TEST_F(OddBodyTest, AValueHasTheWidthOfItsType) {
    for (unsigned int type = 0; type < 32; ++type) {
        fake_norv::reset();
        const unsigned int width = type == 0 || type == 4 || type == 10 ? 1 : type == 1 || type == 5 ? 2 : 4;
        Parm parm;
        parm.FieldDef = type << 19;
        parm.Val = staticList<unsigned int>{0x04030201};
        const Octets whole{1, 2, 3, 4};
        const Octets value(whole.begin(), whole.begin() + width);
        EXPECT_EQ(parm.GetByteSize(), 8 + width) << type;
        EXPECT_EQ(encoded(parm), words({0, type << 19}) + value) << type;
        EXPECT_EQ(fake_norv::calls(Op::varFieldPut).back().descriptors[0], type << 19);
        Parm read;
        EXPECT_EQ(messageOf(words({0, type << 19}) + value)->read(&read, 0), 8 + width);
        EXPECT_EQ(read.Val->element(0), 0x04030201U & (width == 4 ? ~0U : (1U << (8 * width)) - 1)) << type;
    }
}

TEST_F(OddBodyTest, AValueOfManyElementsGoesInChunks) {
    const struct {
        unsigned int count;
        const char* calls;
    } cases[] = {
        {1, "@8 0x280000\n"},
        {254, "@8 0x2fe800\n"},
        {255, "@8 0x2ff000\n"},
        {256, "@8 0x280000\n@10 0x2ff000\n"},
    };
    for (const auto& c : cases) {
        fake_norv::reset();
        Parm parm;
        parm.FieldDef = 0x280000 | ((c.count - 1) << 11);
        parm.Val->realloc(c.count);
        for (unsigned int i = 0; i < c.count; ++i)
            parm.Val->element(i) = 1001 + i;
        const Octets octets = encoded(parm);
        EXPECT_EQ(octets.size(), 8 + 2 * c.count);
        EXPECT_EQ(fieldCalls(Op::varFieldPut), std::string("@0 0x380000\n@4 0x380000\n") + c.calls);
        Parm read;
        messageOf(octets)->read(&read, 0);
        EXPECT_EQ(printed(read), printed(parm));
        EXPECT_EQ(fieldCalls(Op::varFieldGet), fieldCalls(Op::varFieldPut));
    }
}

TEST_F(OddBodyTest, AValueListThatIsTooShortGrowsAndOneThatIsTooLongIsNotSentWhole) {
    Parm parm;
    parm.FieldDef = 0x380800;  // two numbers
    EXPECT_EQ(encoded(parm), words({0, 0x380800, 0, 0}));
    EXPECT_EQ(parm.Val->length(), 2U);
    parm.Val = staticList<unsigned int>{1, 2, 3};
    EXPECT_EQ(encoded(parm), words({0, 0x380800, 1, 2}));
    EXPECT_EQ(parm.Val->length(), 3U);
}

TEST_F(OddBodyTest, AValueListGrowsWithZerosAndNotWithWhatItHeldBeforeItShrank) {
    Parm parm;
    parm.FieldDef = 0x381000;  // three numbers
    parm.Val = staticList<unsigned int>{1, 2, 3};
    parm.Val->realloc(2);
    EXPECT_EQ(encoded(parm), words({0, 0x381000, 1, 2, 0}));
}

TEST_F(OddBodyTest, AValueListGrowsWhenItIsReadAndNeverShrinks) {
    unsigned int number = 0, fieldDef = 0;
    staticList<unsigned int> value{11, 12, 13, 14};
    Parm parm(number, fieldDef, value);
    EXPECT_EQ(messageOf(words({1001, 0x380800, 1, 2}))->read(&parm, 0), 16U);
    EXPECT_EQ(value, (staticList<unsigned int>{1, 2, 13, 14}));
    EXPECT_EQ(messageOf(words({1001, 0x382000, 1, 2, 3, 4, 5}))->read(&parm, 0), 28U);
    EXPECT_EQ(value, (staticList<unsigned int>{1, 2, 3, 4, 5}));
}

TEST_F(OddBodyTest, AListOfParametersThatIsReadAgainKeepsNothingOfTheFirstTime) {
    TSCComponent::Std_MsgGetxParmsCmplt_t list;
    messageOf(words({1, 1001, 0x380800, 7, 8}))->read(&list, 0);
    messageOf(words({1, 1002, 0x380000, 9}))->read(&list, 0);
    EXPECT_EQ(printed(list), "{Count 1 Parms {{Parm 1002 FieldDef 3670016 Val {9}}}}");
}

TEST_F(OddBodyTest, AValueThatIsCutIs0WhereNothingIsThere) {
    Parm parm;
    messageOf(words({1001, 0x380800, 7}))->read(&parm, 0);
    EXPECT_EQ(printed(parm), "{Parm 1001 FieldDef 3672064 Val {7 0}}");
    Parm other;
    messageOf(words({1001}))->read(&other, 0);
    EXPECT_EQ(printed(other), "{Parm 1001 FieldDef 0 Val {0}}");
}

TEST_F(OddBodyTest, AListOfParametersEndsWithThePayload) {
    TSCComponent::Std_MsgGetxParmsCmplt_t list;
    // Says three; the first holds 16 numbers, and then there are 7 octets.
    messageOf(words({3, 1001, 0x387800}) + Octets(64, 1) + Octets(7, 2))->read(&list, 0);
    EXPECT_EQ(list.Parms->length(), 1U);
    messageOf(words({0xFFFFFFFF}))->read(&list, 0);
    EXPECT_EQ(list.Parms->length(), 0U);
}

TEST_F(OddBodyTest, SignalBitsAre32OctetsInOneCall) {
    TSCComponent::MsgTxRxSignalingGetAllCmplt_t body;
    Filler().fill(body);
    EXPECT_EQ(encoded(body).size(), 33U);
    EXPECT_EQ(fieldCalls(Op::varFieldPut), "@0 0x200000\n@1 0x20f800\n");
    messageOf({7, 'a', 'b'})->read(&body, 0);
    EXPECT_EQ(body.signalbits.value()[1], 'b');
    EXPECT_EQ(body.signalbits.value()[2], 0) << "what is not there";
}

// ---- Bound bodies without their counts.

TEST_F(OddBodyTest, ABodyMayBeBoundToItsFieldsWithoutTheCounts) {
    staticList<unsigned int> types{1001, 1002};
    vela::StdResource::MsgCancelxEvts_t cancel(types);
    EXPECT_EQ(encoded(cancel), words({2, 1001, 1002}));
    messageOf(words({1, 7}))->read(&cancel, 0);
    EXPECT_EQ(types, (staticList<unsigned int>{7}));
    unsigned int count = 0;
    vela::StdResource::MsgCancelxEvts_t whole(count, types);
    messageOf(words({2, 8, 9}))->read(&whole, 0);
    EXPECT_EQ(count, 2U);
    EXPECT_EQ(types, (staticList<unsigned int>{8, 9}));
}

}  // namespace
