#include "calls/Cells.h"

#include <gtest/gtest.h>

#include "tests/calls/CallScript.h"

namespace calls {
namespace {

namespace type = isdn::message;
using test::CallScript;

class Cells : public ::testing::Test, private Listener {
  protected:
    Cells() : analysis_({}, *this) { script_.linkUp(); }

    void setUp(std::uint16_t reference, std::uint8_t on) {
        script_.message(Side::us, type::setup, reference, false, {test::bearerSpeech(), test::channel(on)});
        script_.message(Side::peer, type::callProceeding, reference, true, {test::channel(on)});
    }
    void connect(std::uint16_t reference) {
        script_.message(Side::peer, type::connect, reference, true);
        script_.message(Side::us, type::connectAcknowledge, reference, false);
    }
    void release(std::uint16_t reference) {
        script_.message(Side::us, type::disconnect, reference, false, {test::cause(16)});
        script_.message(Side::peer, type::release, reference, true);
        script_.message(Side::us, type::releaseComplete, reference, false);
    }
    // "1 talking, 2 set-up": of the row, the channels that are used for something.
    std::string used(TrunkSize size = TrunkSize::unknown) {
        for (; done_ < script_.frames().size(); ++done_)
            analysis_.take(script_.frames()[done_].frame, script_.frames()[done_].number);
        rows_ = cellRows(analysis_, occupancy_, size);
        std::string words;
        for (const ChannelCell& cell : rows_.empty() ? std::vector<ChannelCell>() : rows_[0].cells) {
            if (cell.use == Use::idle || cell.use == Use::neverSeen || cell.use == Use::dChannel)
                continue;
            words +=
                (words.empty() ? "" : ", ") + toString(cell.channel) + " " + std::string(nameOf(cell.use));
            if (cell.by)
                words += *cell.by == Side::us ? " by us" : " by the peer";
        }
        return words;
    }
    Use useOf(std::uint32_t number) const {
        for (const ChannelCell& cell : rows_.at(0).cells) {
            if (cell.channel.number == number)
                return cell.use;
        }
        ADD_FAILURE() << "no channel " << number;
        return Use::idle;
    }

    CallScript script_;
    std::vector<CellRow> rows_;

  private:
    void heard(const Message& message, const Call* call) override {
        if (call != nullptr)
            occupancy_.heard(message, *call);
    }
    void ended(const Call& call) override { occupancy_.ended(call); }

    Occupancy occupancy_;
    Analysis analysis_;
    std::size_t done_ = 0;
};

TEST_F(Cells, ACallTakesItsChannelThroughItsPhases) {
    setUp(1, 3);
    EXPECT_EQ(used(), "3 set-up");
    connect(1);
    EXPECT_EQ(used(), "3 talking");
    script_.message(Side::us, type::disconnect, 1, false, {test::cause(16)});
    EXPECT_EQ(used(), "3 clearing");
    script_.message(Side::peer, type::release, 1, true);
    script_.message(Side::us, type::releaseComplete, 1, false);
    EXPECT_EQ(used(), "");
    EXPECT_EQ(useOf(3), Use::idle);
}

TEST_F(Cells, TheSizeIsLearntAndTheRestWasNeverSeen) {
    setUp(1, 3);
    connect(1);
    used();
    ASSERT_EQ(rows_.size(), 1U);
    EXPECT_EQ(rows_[0].size, TrunkSize::e1);
    EXPECT_TRUE(rows_[0].isLearnt);
    EXPECT_EQ(rows_[0].cells.size(), 31U);
    EXPECT_EQ(useOf(16), Use::dChannel);
    EXPECT_EQ(useOf(31), Use::neverSeen);
    used(TrunkSize::t1);
    EXPECT_FALSE(rows_[0].isLearnt);
    EXPECT_EQ(rows_[0].cells.size(), 24U);
    EXPECT_EQ(useOf(24), Use::dChannel);
}

TEST_F(Cells, ACallOnHoldLeavesItsChannelToAnother) {
    setUp(1, 3);
    connect(1);
    script_.message(Side::us, type::hold, 1, false);
    script_.message(Side::peer, type::holdAcknowledge, 1, true);
    EXPECT_EQ(used(), "3 held");
    setUp(2, 3);
    connect(2);
    EXPECT_EQ(used(), "3 talking");
}

TEST_F(Cells, ARestartIsSeenUntilItIsAnswered) {
    setUp(1, 3);
    connect(1);
    release(1);
    script_.message(Side::peer, type::restart, 0, false, {test::channel(3), test::restartIndicator(0)});
    EXPECT_EQ(used(), "3 restarting");
    script_.message(Side::us, type::restartAcknowledge, 0, true,
                    {test::channel(3), test::restartIndicator(0)});
    EXPECT_EQ(used(), "");
}

TEST_F(Cells, ARestartOfAChannelIsSeenOnItsInterfaceAlone) {
    const auto on = [](std::uint8_t interface) {
        return test::Bytes{0x18, 0x04, 0xE9, static_cast<std::uint8_t>(0x80 | interface), 0x83, 0x83};
    };
    for (const std::uint8_t interface : {0, 1}) {
        const auto reference = static_cast<std::uint16_t>(interface + 1);
        script_.message(Side::us, type::setup, reference, false, {test::bearerSpeech(), on(interface)});
        script_.message(Side::peer, type::callProceeding, reference, true, {on(interface)});
        connect(reference);
        release(reference);
    }
    const auto restarting = [&] {
        used();
        std::vector<std::string> channels;
        for (const CellRow& row : rows_) {
            for (const ChannelCell& cell : row.cells)
                if (cell.use == Use::restarting && cell.channel.number == 3)
                    channels.push_back(toString(cell.channel));
        }
        return channels;
    };
    constexpr std::uint8_t namedChannels = 0, oneInterface = 6;
    const test::Bytes wholeInterface{0x18, 0x02, 0xE8, 0x81};  // 1, and no channel
    script_.message(Side::peer, type::restart, 0, false, {on(1), test::restartIndicator(namedChannels)});
    EXPECT_EQ(restarting(), std::vector<std::string>{"1/3"});
    script_.message(Side::us, type::restartAcknowledge, 0, true,
                    {on(1), test::restartIndicator(namedChannels)});
    EXPECT_EQ(restarting(), std::vector<std::string>());
    script_.message(Side::peer, type::restart, 0, false,
                    {wholeInterface, test::restartIndicator(oneInterface)});
    EXPECT_EQ(restarting(), std::vector<std::string>{"1/3"});
}

}  // namespace
}  // namespace calls
