// The commands of the managers and of clusters: what each sends, and whose reply it takes.
#include "tests/vela/commands.h"

namespace {

using namespace vela::test;

// ---- The resource manager.

TEST_F(CommandTest, AResourceManagerCommandSendsItsPreparedBody) {
    sendsEachPrepared(resources_);
    EXPECT_EQ(CompDesc_t(fake_norv::written().back().target), CompDesc_t(0, 1, 0, 0, 0));
}

TEST_F(CommandTest, AResourceManagerCommandSendsItsFields) {
    const CompDesc_t instance(0x0102, 1, 2, 3, 4);
    const Octets address{2, 1, 1, 2, 3, 4};
    sends(8388669, 8388615, Octets{5, 0, 1, 2, 255, 0} + oneAttribute,
          [&] { resources_.find(0, 2, 5, attributes_); });
    sends(8388669, 8388615, Octets{5, 0, 1, 2, 255, 0} + words({2, 1001, 0xFFFFFFFF, 0, 0x15}),
          [&] { resources_.find(0x15, 2, 5, attributes_); });
    sends(8388670, 8388615, Octets{0, 0, 1, 2, 255, 0} + address + words({2, 1001, 0xFFFFFFFF, 0, 0x15}),
          [&] { resources_.allocate(0x15, 2, instance, attributes_); });
    sends(8388673, 8388608, address, [&] { resources_.free(instance); });
    sends(8388697, 8388608, words({1}) + address + words({1001}), [&] { resources_.use(instance, 1001); });
    sends(8388698, 8388608, words({1}) + address, [&] { resources_.unuse(instance); });
    sends(8388666, 8388614, address + words({3, 4}), [&] { resources_.attributes(instance, 3, 4); });
    sends(8388706, 8388707, Octets{2, 1, 1, 2, 3, 4, 5, 0, 6, 7, 8, 9} + oneAttribute,
          [&] { resources_.findAll(instance, CompDesc_t(5, 6, 7, 8, 9), attributes_); });
    sends(8388706, 8388707, Octets{0, 0, 1, 0, 0, 0, 0xFF, 0xFF, 1, 0xFF, 0xFF, 0} + words({1, 0, 0x15}),
          [&] { resources_.findAll(0x15); });
    sends(8388706, 8388707, Octets{0, 0, 1, 0, 0, 0, 0xFF, 0xFF, 1, 0xFF, 0xFF, 0} + words({0}),
          [&] { resources_.findAll(); });
}

TEST_F(CommandTest, AttributesAndFoundInstancesComeBackAsValues) {
    board_.answers(8388666, 8388614, Octets{1, 0, 1, 1, 0x15, 0} + oneAttribute);
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
    sends(8388691, 8388652, address + oneAttribute, [&] { clusters_.find(start, attributes_); });
    sends(8388689, 8388652, address + oneAttribute, [&] { clusters_.allocate(start, attributes_); });
    sends(8388640, 8388652, address + oneAttribute, [&] { clusters_.create(start, attributes_); });
    sends(8388690, 8388608, address, [&] { clusters_.free(start); });
    sends(8388644, 8388608, address, [&] { clusters_.destroy(start); });
    sends(8388637, 8388652, address, [&] { clusters_.byComponent(start); });
    sends(8388638, 8388615, address + words({0x15}) + oneAttribute,
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
    sends(8388692, 8388608, oneAttribute, [&] { cluster_.addAttributes(attributes_); });
    sends(8388693, 8388608, oneAttribute, [&] { cluster_.removeAttributes(attributes_); });
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
