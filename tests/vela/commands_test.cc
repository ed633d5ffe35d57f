// The commands of resources, of the telephony service component and of the D channel: what each sends, whose
// reply it takes, how long it waits.
#include "tests/vela/commands.h"

namespace {

using namespace vela::test;

TEST_F(CommandTest, AStandardCommandSendsItsPreparedBody) {
    using S = StdResource;
    prepared<S::MsgInit_t>([&](auto& c, auto* r) { resource_.Init(c, r); });
    prepared<S::MsgExit_t>([&](auto& c, auto* r) { resource_.Exit(c, r); });
    prepared<S::MsgComtest_t>([&](auto& c, auto* r) { resource_.ComTest(c, r); });
    prepared<S::MsgSetParm_t>([&](auto& c, auto* r) { resource_.SetParm(c, r); });
    prepared<S::MsgGetParm_t>([&](auto& c, auto* r) { resource_.GetParm(c, r); });
    prepared<S::MsgSetxParms_t>([&](auto& c, auto* r) { resource_.SetxParms(c, r); });
    prepared<S::MsgGetxParms_t>([&](auto& c, auto* r) { resource_.GetxParms(c, r); });
    prepared<S::MsgSetVParm_t>([&](auto& c, auto* r) { resource_.SetVParm(c, r); });
    prepared<S::MsgGetVParm_t>([&](auto& c, auto* r) { resource_.GetVParm(c, r); });
    prepared<S::MsgSetParmDef_t>([&](auto& c, auto* r) { resource_.SetParmDef(c, r); });
    prepared<S::MsgSetxParmsDef_t>([&](auto& c, auto* r) { resource_.SetxParmsDef(c, r); });
    prepared<S::MsgSetAllParmsDef_t>([&](auto& c, auto* r) { resource_.SetAllParmsDef(c, r); });
    prepared<S::MsgDetectEvt_t>([&](auto& c, auto* r) { resource_.DetectEvt(c, r); });
    prepared<S::MsgDetectxEvts_t>([&](auto& c, auto* r) { resource_.DetectxEvts(c, r); });
    prepared<S::MsgCancelEvt_t>([&](auto& c, auto* r) { resource_.CancelEvt(c, r); });
    prepared<S::MsgCancelxEvts_t>([&](auto& c, auto* r) { resource_.CancelxEvts(c, r); });
    prepared<S::MsgArmRTC_t>([&](auto& c, auto* r) { resource_.ArmRTC(c, r); });
    prepared<S::MsgArmxRTCs_t>([&](auto& c, auto* r) { resource_.ArmxRTCs(c, r); });
    prepared<S::MsgDisarmRTC_t>([&](auto& c, auto* r) { resource_.DisArmRTC(c, r); });
    prepared<S::MsgDisarmxRTCs_t>([&](auto& c, auto* r) { resource_.DisarmxRTCs(c, r); });
    prepared<S::MsgDisarmAllRTCs_t>([&](auto& c, auto* r) { resource_.DisarmAllRTCs(c, r); });
    preparedWithoutReply<S::MsgAck_t>([&](auto& c) { resource_.Ack(c); });
    preparedWithoutReply<S::MsgError_t>([&](auto& c) { resource_.Error(c); });
    preparedWithoutReply<S::MsgCancelAllEvts_t>([&](auto& c) { resource_.CancelAllEvts(c); });
}

TEST_F(CommandTest, AStandardCommandSendsItsFields) {
    using S = StdResource;
    sends(4, 5, {}, [&] { resource_.Init(nullptr); });
    sends(6, 7, {}, [&] { resource_.Exit(nullptr); });
    sends(2, 3, {}, [&] { resource_.ComTest(nullptr); });
    sends(1, noReply, {}, [&] { resource_.Ack(); });
    sends(0, noReply, words({4, 1002}), [&] { resource_.Error(4, 1002); });
    S::Data_ErrorMsg_0x8_t data;
    Filler().fill(data);
    sends(0, noReply, words({8, 1002, 1001, 1002}), [&] { resource_.Error(8, 1002, data); });

    sends(8, 9, words({10, 1001}), [&] { resource_.SetParm(10, 1001, nullptr); });
    sends(18, 19, words({7}), [&] { resource_.GetParm(7, nullptr); });
    auto parms = listOf<staticList<S::MsgSetxParms_t::Parms_t>>(2);
    sends(10, 11, words({2, 1001, 1002, 1003, 1004}), [&] { resource_.SetxParms(parms, nullptr); });
    sends(20, 21, words({2, 1001, 1002, 1003, 1004}), [&] { resource_.GetxParms(parms, nullptr); });
    sends(47, 48, words({1, 1001, 1002}), [&] { resource_.SetVParm(1, parms, nullptr); });
    sends(47, 48, words({2, 1001, 1002, 1003, 1004}), [&] { resource_.SetVParm(3, parms, nullptr); });
    auto numbers = listOf<staticList<S::MsgGetVParm_t::Parms_t>>(2);
    sends(45, 46, words({1, 1001}), [&] { resource_.GetVParm(1, numbers, nullptr); });
    sends(45, 46, words({0}), [&] { resource_.GetVParm(0, numbers, nullptr); });
    sends(12, 13, words({1001}), [&] { resource_.SetParmDef(1001, nullptr); });
    sends(14, 15, words({2, 1001, 1002}), [&] { resource_.SetxParmsDef(numbers, nullptr); });
    sends(16, 17, {}, [&] { resource_.SetAllParmsDef(nullptr); });

    const Octets host{1, 0x10, 9, 8, 7, 6};
    auto events = listOf<staticList<S::MsgDetectxEvts_t::List_t>>(1);
    sends(22, 23, host + words({2, 3}), [&] { resource_.DetectEvt(2, 3, nullptr); });
    sends(24, 25, host + words({1, 1001, 1002}), [&] { resource_.DetectxEvts(events, nullptr); });
    sends(24, 25, Octets{2, 0, 1, 1, 0x15, 0} + words({1, 1001, 1002}),
          [&] { resource_.DetectxEvts(events, &ccs_); });
    staticList<unsigned int> types{1001, 1002};
    sends(26, 27, words({2}), [&] { resource_.CancelEvt(2, nullptr); });
    sends(28, 29, words({2, 1001, 1002}), [&] { resource_.CancelxEvts(types, nullptr); });
    sends(30, noReply, {}, [&] { resource_.CancelAllEvts(nullptr); });

    auto controls = listOf<staticList<S::MsgArmxRTCs_t::EventGroupList_t>>(1);
    sends(33, 34, words({2, 1001}), [&] { resource_.ArmRTC(2, 1001, nullptr); });
    sends(35, 36, words({1, 1001, 1002}), [&] { resource_.ArmxRTCs(controls, nullptr); });
    sends(37, 38, words({2}), [&] { resource_.DisArmRTC(2, nullptr); });
    sends(39, 40, words({2, 1001, 1002}), [&] { resource_.DisarmxRTCs(types, nullptr); });
    sends(41, 42, {}, [&] { resource_.DisarmAllRTCs(nullptr); });
}

TEST_F(CommandTest, AWaitOfItsOwnTakesThePlaceOfTheObjects) {
    try {
        resource_.SetParm(10, 1, nullptr, 20);
        FAIL() << "nothing was thrown";
    } catch (const vela::Addressable::Timeout& timeout) {
        EXPECT_EQ(timeout.timeoutMs(), 20U);
    }
    resource_.setErrorWaitTime(vela::Addressable::DefaultErrorWaitTime);
    board_.answers(30, 0, words({30, 1}));
    EXPECT_THROW(resource_.CancelAllEvts(nullptr), vela::Addressable::UnexpectedMsg);
    CapturedErrors errors;  // the answer is nobody's
    EXPECT_NO_THROW(resource_.CancelAllEvts(nullptr, 0)) << "not waited for";
    EXPECT_TRUE(fake_norv::waitForIdleReader());
}

// ---- The telephony service component.

TEST_F(CommandTest, ATscCommandSendsItsPreparedBody) {
    using T = TSCComponent;
    prepared<T::Std_MsgSetxParms_t>([&](auto& c, auto* r) { tsc_.SetxParms(c, r); });
    prepared<T::Std_MsgGetxParms_t>([&](auto& c, auto* r) { tsc_.GetxParms(c, r); });
    prepared<T::MsgDefineBSet_t>([&](auto& c, auto* r) { tsc_.DefineBSet(c, r); });
    prepared<T::MsgSetAlarmMask_t>([&](auto& c, auto* r) { tsc_.SetAlarmMask(c, r); });
    prepared<T::MsgGetAlarmMask_t>([&](auto& c, auto* r) { tsc_.GetAlarmMask(c, r); });
    prepared<T::MsgTxRxSignalingGetAll_t>([&](auto& c, auto* r) { tsc_.GetSignalBitsAll(c, r); });
}

TEST_F(CommandTest, ATscCommandSendsItsFields) {
    using T = TSCComponent;
    auto values = listOf<staticList<T::Std_MsgGetxParms_t::Parms_t>>(1);
    sends(20, 21, words({1, 1001, 1002}), [&] { tsc_.GetxParms(values, nullptr); });
    staticList<T::Std_MsgSetxParms_t::Parms_t> parms(1);
    parms[0].Parm = 1001;
    parms[0].FieldDef = 0x2800'00;  // one number of 16 bits
    parms[0].Val = staticList<unsigned int>{0x10203};
    sends(10, 11, words({1, 1001, 0x280000}) + Octets{3, 2}, [&] { tsc_.SetxParms(parms, nullptr); });
    auto channels = listOf<staticList<T::MsgDefineBSet_t::List_t>>(1);
    sends(4616, 4617,
          Octets{1, 2, 3, 4, 0xED, 3, 0, 0, 6, 7, 1, 0, 1, 1, 0x15, 0, 0xEE, 3, 0, 0, 1, 101, 102, 103, 104},
          [&] {
              tsc_.DefineBSet(1, 2, 3, 4, 1005, 6, 7, CompDesc_t(1, 1, 1, 0x15, 0), 1006, channels, nullptr);
          });
    sends(4674, 4675, Octets{1, 0xE9, 3, 0, 0}, [&] { tsc_.SetAlarmMask(1, 1001, nullptr); });
    sends(4676, 4677, Octets{1}, [&] { tsc_.GetAlarmMask(1, nullptr); });
    sends(4688, 4689, Octets{1}, [&] { tsc_.GetSignalBitsAll(1, nullptr); });
}

TEST_F(CommandTest, ATscLooksItsOwnBodiesUpBeforeTheStandardOnes) {
    const auto named = [&](unsigned int code) {
        const std::unique_ptr<vela::MsgBody> body(tsc_.MsgBodyLookup(code));
        return printed(*body);
    };
    EXPECT_EQ(named(4677), "{Linenum 0 Alarm_mask 0}");
    EXPECT_EQ(named(8), "{Parm 0 Val 0}");
    const std::unique_ptr<vela::MsgBody> parms(tsc_.MsgBodyLookup(10));
    EXPECT_NE(dynamic_cast<TSCComponent::Std_MsgSetxParms_t*>(parms.get()), nullptr);
    EXPECT_THROW(tsc_.MsgBodyLookup(5376), vela::Addressable::UndefinedMsgBody);
    EXPECT_THROW(tsc_.EvtBodyLookup(2), vela::Addressable::UndefinedEvtBody);
}

// ---- The D channel.

TEST_F(CommandTest, ACallControlMessageIsSentInFiveForms) {
    preparedWithoutReply<CCS::ieMessage_t>([&](auto& c) { ccs_.SendIE(c); });
    staticList<unsigned char> priv{'x', 'y'};
    staticList<CCS::ieMessage_t::IEPubData_t> pub(2);
    pub[0].IEId = 8;
    pub[0].Value = staticList<unsigned char>{0x80, 0x90};
    pub[1].IEId = 161;
    // CallId 0x0304, CallRef 0x0102.
    const Octets empty{4, 3, 2, 1, 0, 0, 5}, full{4, 3, 2, 1, 2, 0, 5};
    const Octets elements{8, 2, 0x80, 0x90, 161};
    sends(5376, noReply, empty, [&] { ccs_.SendIE(0x0102, 0x0304, 5); });
    sends(5376, noReply, full + Octets{'x', 'y'}, [&] { ccs_.SendIE(0x0102, 0x0304, 5, priv); });
    sends(5376, noReply, empty + elements, [&] { ccs_.SendIE(0x0102, 0x0304, 5, pub); });
    sends(5376, noReply, full + Octets{'x', 'y'} + elements,
          [&] { ccs_.SendIE(0x0102, 0x0304, 5, priv, pub); });
}

TEST_F(CommandTest, ACallControlMessageThatIsRefusedIsUnexpected) {
    ccs_.setErrorWaitTime(vela::Addressable::DefaultErrorWaitTime);
    board_.answers(5376, 0, words({5376, 1}));
    EXPECT_THROW(ccs_.SendIE(1, 2, 3), vela::Addressable::UnexpectedMsg);
}

TEST_F(CommandTest, ACcsLooksCallControlMessagesUp) {
    const std::unique_ptr<vela::MsgBody> body(ccs_.MsgBodyLookup(5376));
    EXPECT_NE(dynamic_cast<CCS::ieMessage_t*>(body.get()), nullptr);
    EXPECT_THROW(ccs_.MsgBodyLookup(5377), vela::Addressable::UndefinedMsgBody);
}

}  // namespace
