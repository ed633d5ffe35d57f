// Every command call: what it sends, whose reply it takes, how long it waits.
#include "tests/vela/fill.h"
#include "tests/vela/transport.h"
#include "vela/Board.h"
#include "vela/CCS.h"
#include "vela/Cluster.h"
#include "vela/ClusterMgr.h"
#include "vela/ResourceMgr.h"
#include "vela/TSCComponent.h"

namespace {

using fake_norv::words;
using vela::CCS;
using vela::Cluster;
using vela::ClusterMgr;
using vela::CompAttr_t;
using vela::CompDesc_t;
using vela::ResourceMgr;
using vela::staticList;
using vela::StdResource;
using vela::TSCComponent;

class CommandTest : public TransportTest {
  protected:
    CommandTest() {
        for (vela::Addressable* object :
             {static_cast<vela::Addressable*>(&resource_), static_cast<vela::Addressable*>(&ccs_)})
            object->setErrorWaitTime(10);
    }

    // The call sends the body that it is given and reads the reply into the caller's.
    template <typename Cmd, typename Call>
    void prepared(Call call) {
        using Reply = typename Cmd::Reply;
        SCOPED_TRACE(Cmd::code);
        Cmd cmd;
        Filler().fill(cmd);
        Reply answer;
        Filler().fill(answer);
        board_.answers(Cmd::code, Reply::code, encoded(answer));
        Reply reply;
        call(cmd, &reply);
        EXPECT_EQ(fake_norv::written().back().type, Cmd::code);
        EXPECT_EQ(fake_norv::written().back().body, encoded(cmd));
        EXPECT_EQ(printed(reply), printed(answer));
        call(cmd, static_cast<Reply*>(nullptr));
    }
    template <typename Object>
    void sendsEachPrepared(Object& object) {
        Object::Bodies::forEach([&]<typename Body>() {
            if constexpr (requires { typename Body::Reply; })
                prepared<Body>([&](Body& cmd, auto* reply) { object.send(cmd, reply); });
        });
    }
    template <typename Cmd, typename Call>
    void preparedWithoutReply(Call call) {
        Cmd cmd;
        Filler().fill(cmd);
        call(cmd);
        EXPECT_EQ(fake_norv::written().back().type, Cmd::code);
        EXPECT_EQ(fake_norv::written().back().body, encoded(cmd));
    }

    // The call sends the command with this body, and takes the reply.
    template <typename Call>
    void sends(std::uint32_t command, std::uint32_t reply, const Octets& body, Call call) {
        SCOPED_TRACE(command);
        if (reply != NoReply)
            board_.answers(command, reply);
        call();
        EXPECT_EQ(fake_norv::written().back().type, command);
        EXPECT_EQ(fake_norv::written().back().body, body);
    }
    static constexpr std::uint32_t NoReply = 0xFFFFFFFF;

    // Bodies of the one field of each entry.
    template <typename List>
    static List listOf(unsigned int n) {
        List list(n);
        Filler filler;
        for (auto& element : list)
            filler.fill(element);
        return list;
    }

    ScriptedBoard board_;
    StdResource resource_{CompDesc_t(1, 1, 1, 0x15, 0), nullptr};
    CCS ccs_{CompDesc_t(2, 1, 1, 0x15, 0), resource_.getMsgQueue()};
    TSCComponent tsc_{vela::Component(CompDesc_t(0, 1, 1, 0x12, 0), resource_.getMsgQueue())};
    ResourceMgr resources_{resource_};
    ClusterMgr clusters_{resource_};
    Cluster cluster_{CompDesc_t(7, 1, 2, 3, 0), resource_.getMsgQueue()};
    staticList<CompAttr_t> attributes_{{1001, -1}};
};

const Octets OneAttribute{1, 0, 0, 0, 0xE9, 3, 0, 0, 0xFF, 0xFF, 0xFF, 0xFF};

Octets operator+(Octets left, const Octets& right) {
    left.insert(left.end(), right.begin(), right.end());
    return left;
}

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
    sends(1, NoReply, {}, [&] { resource_.Ack(); });
    sends(0, NoReply, words({4, 1002}), [&] { resource_.Error(4, 1002); });
    S::Data_ErrorMsg_0x8_t data;
    Filler().fill(data);
    sends(0, NoReply, words({8, 1002, 1001, 1002}), [&] { resource_.Error(8, 1002, data); });

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
    sends(30, NoReply, {}, [&] { resource_.CancelAllEvts(nullptr); });

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
    sends(5376, NoReply, empty, [&] { ccs_.SendIE(0x0102, 0x0304, 5); });
    sends(5376, NoReply, full + Octets{'x', 'y'}, [&] { ccs_.SendIE(0x0102, 0x0304, 5, priv); });
    sends(5376, NoReply, empty + elements, [&] { ccs_.SendIE(0x0102, 0x0304, 5, pub); });
    sends(5376, NoReply, full + Octets{'x', 'y'} + elements,
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

// ---- The resource manager.

TEST_F(CommandTest, AResourceManagerCommandSendsItsPreparedBody) {
    sendsEachPrepared(resources_);
    EXPECT_EQ(CompDesc_t(fake_norv::written().back().target), CompDesc_t(0, 1, 0, 0, 0));
}

TEST_F(CommandTest, AResourceManagerCommandSendsItsFields) {
    const CompDesc_t instance(0x0102, 1, 2, 3, 4);
    const Octets address{2, 1, 1, 2, 3, 4};
    sends(8388669, 8388615, Octets{5, 0, 1, 2, 255, 0} + OneAttribute,
          [&] { resources_.find(0, 2, 5, attributes_); });
    sends(8388669, 8388615, Octets{5, 0, 1, 2, 255, 0} + words({2, 1001, 0xFFFFFFFF, 0, 0x15}),
          [&] { resources_.find(0x15, 2, 5, attributes_); });
    sends(8388670, 8388615, Octets{0, 0, 1, 2, 255, 0} + address + words({2, 1001, 0xFFFFFFFF, 0, 0x15}),
          [&] { resources_.allocate(0x15, 2, instance, attributes_); });
    sends(8388673, 8388608, address, [&] { resources_.free(instance); });
    sends(8388697, 8388608, words({1}) + address + words({1001}), [&] { resources_.use(instance, 1001); });
    sends(8388698, 8388608, words({1}) + address, [&] { resources_.unuse(instance); });
    sends(8388666, 8388614, address + words({3, 4}), [&] { resources_.attributes(instance, 3, 4); });
    sends(8388706, 8388707, Octets{2, 1, 1, 2, 3, 4, 5, 0, 6, 7, 8, 9} + OneAttribute,
          [&] { resources_.findAll(instance, CompDesc_t(5, 6, 7, 8, 9), attributes_); });
    sends(8388706, 8388707, Octets{0, 0, 1, 0, 0, 0, 0xFF, 0xFF, 1, 0xFF, 0xFF, 0} + words({1, 0, 0x15}),
          [&] { resources_.findAll(0x15); });
    sends(8388706, 8388707, Octets{0, 0, 1, 0, 0, 0, 0xFF, 0xFF, 1, 0xFF, 0xFF, 0} + words({0}),
          [&] { resources_.findAll(); });
}

TEST_F(CommandTest, AttributesAndFoundInstancesComeBackAsValues) {
    board_.answers(8388666, 8388614, Octets{1, 0, 1, 1, 0x15, 0} + OneAttribute);
    EXPECT_EQ(printed(resources_.attributes(CompDesc_t(1, 1, 1, 0x15, 0), 1, 0)), "{{key 1001 value -1}}");
    board_.answers(8388670, 8388615, {3, 0, 1, 1, 0x16, 0});
    const StdResource allocated = resources_.allocate(0x16, 1, cluster_.getTgtDesc(), {});
    EXPECT_EQ(allocated.getTgtDesc(), CompDesc_t(3, 1, 1, 0x16, 0));
    EXPECT_EQ(allocated.getMsgQueue(), resource_.getMsgQueue());
}

// A reply to "find all": the next address, and components of one attribute each.
Octets foundAll(std::uint8_t next, const std::vector<std::uint8_t>& instances) {
    Octets body = words({static_cast<std::uint32_t>(instances.size())}) +
                  (next == 0 ? Octets(6, 0) : Octets{next, 0, 1, 1, 0x15, 0});
    for (const std::uint8_t instance : instances)
        body = body + Octets{instance, 0, 1, 1, 0x15, 0} + words({0, 0x15});
    return body;
}

TEST_F(CommandTest, FindingAllGoesOnWhereTheReplySays) {
    board_.script(8388706, [](const fake_norv::Message& m) {
        const bool first = m.body[0] == 0;
        fake_norv::deliver(fake_norv::replyTo(m, 8388707, first ? foundAll(3, {1, 2}) : foundAll(0, {3})));
    });
    const ResourceMgr::Found found = resources_.findAll();
    ASSERT_EQ(found.length(), 3U);
    EXPECT_EQ(found[2].compDesc.value(), CompDesc_t(3, 1, 1, 0x15, 0));
    EXPECT_EQ(printed(found[2].attrs.value()), "{key 0 value 21}");
    EXPECT_EQ(fake_norv::written().size(), 2U);
}

TEST_F(CommandTest, FindingAllEndsWhereTheRepliesGoRoundInCircles) {
    board_.answers(8388706, 8388707, foundAll(3, {1}));
    EXPECT_EQ(resources_.findAll().length(), 2U);
    board_.answers(8388706, 8388707, foundAll(3, {}));
    EXPECT_EQ(resources_.findAll().length(), 0U);
}

// ---- Clusters.

TEST_F(CommandTest, AClusterManagerCommandSendsItsPreparedBody) {
    sendsEachPrepared(clusters_);
    EXPECT_EQ(CompDesc_t(fake_norv::written().back().target), CompDesc_t(0, 1, 0, 0, 0));
}

TEST_F(CommandTest, AClusterManagerCommandSendsItsFields) {
    const CompDesc_t start(0x0102, 1, 2, 3, 4);
    const Octets address{2, 1, 1, 2, 3, 4};
    sends(8388691, 8388652, address + OneAttribute, [&] { clusters_.find(start, attributes_); });
    sends(8388689, 8388652, address + OneAttribute, [&] { clusters_.allocate(start, attributes_); });
    sends(8388640, 8388652, address + OneAttribute, [&] { clusters_.create(start, attributes_); });
    sends(8388690, 8388608, address, [&] { clusters_.free(start); });
    sends(8388644, 8388608, address, [&] { clusters_.destroy(start); });
    sends(8388637, 8388652, address, [&] { clusters_.byComponent(start); });
    sends(8388638, 8388615, address + words({0x15}) + OneAttribute,
          [&] { clusters_.componentByAttr(start, 0x15, attributes_); });
}

TEST_F(CommandTest, AClusterIsAtTheAddressThatTheManagerNames) {
    board_.answers(8388691, 8388652, {7, 0, 1, 2, 3, 0});
    const Cluster found = clusters_.find(CompDesc_t(), attributes_);
    EXPECT_EQ(found.getTgtDesc(), cluster_.getTgtDesc());
    EXPECT_EQ(found.getMsgQueue(), resource_.getMsgQueue());
}

TEST_F(CommandTest, AClusterCommandSendsItsPreparedBody) {
    sendsEachPrepared(cluster_);
    EXPECT_EQ(CompDesc_t(fake_norv::written().back().target), cluster_.getTgtDesc());
}

TEST_F(CommandTest, AClusterCommandSendsItsFields) {
    const CompDesc_t first(0x0102, 1, 2, 3, 4), second(5, 6, 7, 8, 9);
    const Octets own{7, 0, 1, 2, 3, 0}, one{2, 1, 1, 2, 3, 4}, two{5, 0, 6, 7, 8, 9};
    staticList<unsigned int> slots{1001, 1002};
    sends(8388639, 8388608, one + words({3}) + two + words({4}),
          [&] { cluster_.connect(first, 3, second, 4); });
    sends(8388645, 8388608, one + words({3}) + two + words({4}),
          [&] { cluster_.disconnect(first, 3, second, 4); });
    sends(8388635, 8388608, own + words({3, 4}) + one, [&] { cluster_.activate(3, 4, first); });
    sends(8388643, 8388608, own + words({3}), [&] { cluster_.deactivate(3); });
    sends(8388656, 8388608, own + words({3, 2, 4, 5, 1001, 1002}),
          [&] { cluster_.assignSlots(3, 4, 5, slots); });
    sends(8388662, 8388608, own + words({3}), [&] { cluster_.unassignSlots(3); });
    sends(8388658, 8388659, own + words({3}), [&] { cluster_.slots(3, nullptr); });
    sends(8388692, 8388608, OneAttribute, [&] { cluster_.addAttributes(attributes_); });
    sends(8388693, 8388608, OneAttribute, [&] { cluster_.removeAttributes(attributes_); });
    sends(8388694, 8388608, own, [&] { cluster_.lock(); });
    sends(8388695, 8388696, own, [&] { cluster_.unlock(nullptr); });
    board_.answers(8388647, 8388648, own + words({2}) + one + two);
    const staticList<CompDesc_t> members = cluster_.components();
    EXPECT_EQ(fake_norv::written().back().body, own);
    ASSERT_EQ(members.length(), 2U);
    EXPECT_EQ(members[1], second);
}

TEST_F(CommandTest, TheFamiliesKnowTheirOwnCodesAlone) {
    const auto knows = [](vela::Addressable& object, unsigned int code) {
        try {
            delete object.MsgBodyLookup(code);
            return true;
        } catch (const vela::Addressable::UndefinedMsgBody& undefined) {
            EXPECT_EQ(undefined.type(), code);
            return false;
        }
    };
    unsigned int known[3] = {0, 0, 0};
    vela::Addressable* const families[3] = {&resources_, &clusters_, &cluster_};
    for (unsigned int code = 8388600; code < 8388720; ++code) {
        for (int f = 0; f < 3; ++f)
            known[f] += knows(*families[f], code) ? 1 : 0;
    }
    EXPECT_EQ(known[0], 11U);
    EXPECT_EQ(known[1], 9U);
    EXPECT_EQ(known[2], 16U);
    EXPECT_FALSE(knows(clusters_, 8388608)) << "below its first code";
    EXPECT_FALSE(knows(cluster_, 8388615));
    EXPECT_FALSE(knows(resources_, 8));
}

}  // namespace
