#include "calls/LinkHistory.h"

#include <gtest/gtest.h>

#include "calls/DChannel.h"
#include "isdn/Layer2.h"

namespace calls {

namespace {

// A D channel whose frames are written as octets, and what is told of its links.
class Told {
  public:
    // We are the user side.
    void frame(bool sent, std::vector<std::uint8_t> octets, std::int64_t milliseconds) {
        capture::Frame frame;
        frame.octets = octets;
        frame.transmitted = sent;
        frame.interface = &interface_;
        const Marks& marks = channel_.take(frame, ++number_, milliseconds * millisecond);
        history.take(interface_.name, isdn::parseLayer2(octets), sent ? Side::us : Side::peer, marks,
                     moment(milliseconds));
    }
    Moment moment(std::int64_t milliseconds) const {
        return {.frame = number_, .clock = capture::Clock::absolute, .time = milliseconds * millisecond};
    }
    void sabme(std::int64_t at) { frame(true, {0x00, 0x01, 0x7F}, at); }
    void ua(std::int64_t at) { frame(false, {0x00, 0x01, 0x73}, at); }
    void poll(std::int64_t at) { frame(true, {0x00, 0x01, 0x01, 0x01}, at); }
    void answer(std::int64_t at) { frame(false, {0x00, 0x01, 0x01, 0x01}, at); }

    std::string news() const {
        std::string text;
        for (const LinkHistory::Entry& entry : history.entries()) {
            text += entry.from ? *entry.from == Side::us ? "us " : "peer " : "";
            text += std::string(nameOf(entry.news)) + ", ";
        }
        return text;
    }
    const LinkHistory::Standing& standing() const { return history.links().at({"d", 0}); }

    LinkHistory history;

  private:
    capture::Interface interface_{"d", capture::Variant::net5};
    DChannel channel_{Timers(), capture::Role::user};
    std::uint64_t number_ = 0;
};

TEST(LinkHistory, TellsSetUpAndRelease) {
    Told told;
    told.sabme(100);
    told.ua(108);
    EXPECT_EQ(told.standing().state, LinkState::up);
    EXPECT_TRUE(told.standing().sawSetUp);
    EXPECT_EQ(told.standing().since.time, 108 * millisecond);
    EXPECT_EQ(told.standing().ups, 1U);
    told.frame(false, {0x02, 0x01, 0x53}, 5'000);  // DISC
    told.frame(true, {0x02, 0x01, 0x73}, 5'010);   // UA
    EXPECT_EQ(told.standing().state, LinkState::down);
    EXPECT_EQ(told.standing().downs, 1U);
    EXPECT_EQ(told.news(), "us SABME, peer up, peer DISC, us down, ");
}

TEST(LinkHistory, SaysUpAtLeastSinceWhenTheSetUpIsNotInTheTrace) {
    Told told;
    told.poll(1'000);
    told.answer(1'010);
    EXPECT_EQ(told.standing().state, LinkState::up);
    EXPECT_FALSE(told.standing().sawSetUp);
    EXPECT_EQ(told.standing().ups, 0U);
    EXPECT_EQ(told.news(), "");
}

TEST(LinkHistory, CountsAReestablishmentAsOneEnd) {
    Told told;
    told.sabme(100);
    told.ua(108);
    told.sabme(10'000);
    told.ua(10'008);
    EXPECT_EQ(told.standing().downs, 1U);
    EXPECT_EQ(told.standing().ups, 2U);
    EXPECT_EQ(told.standing().since.time, 10'008 * millisecond);
}

TEST(LinkHistory, LeavesOutGroupsManagementAndOtherSapis) {
    Told told;
    told.frame(true, {0xFC, 0xFF, 0x03, 0x0F, 0x00, 0x01, 0x01, 0xFF}, 0);  // TEI request
    told.frame(false, {0x02, 0xFF, 0x03, 0x08, 0x00, 0x00}, 1);             // UI to all
    told.frame(true, {0x40, 0x01, 0x7F}, 2);                                // SABME, SAPI 16
    EXPECT_TRUE(told.history.links().empty());
    EXPECT_TRUE(told.history.entries().empty());
}

TEST(LinkHistory, KeepsTheNewestEntriesAndCountsTheOthers) {
    LinkHistory history;
    for (std::size_t i = 0; i < LinkHistory::mostEntries + 3; ++i)
        history.note("d", LinkNews::lost, {.frame = i});
    EXPECT_EQ(history.entries().size(), LinkHistory::mostEntries);
    EXPECT_EQ(history.entries().front().moment.frame, 3U);
    EXPECT_EQ(history.gone(), 3U);
    EXPECT_EQ(history.losses(), LinkHistory::mostEntries + 3);
    history.note("d", LinkNews::started, {});
    EXPECT_EQ(history.losses(), LinkHistory::mostEntries + 3);
}

TEST(LinkHistory, KeepsSoManyLinksAndNoMore) {
    LinkHistory history;
    const std::vector<std::uint8_t> sabme{0x00, 0x01, 0x7F};
    for (std::size_t i = 0; i < LinkHistory::mostLinks + 5; ++i)
        history.take("d" + std::to_string(i), isdn::parseLayer2(sabme), Side::us, Marks(), Moment());
    EXPECT_EQ(history.links().size(), LinkHistory::mostLinks);
}

}  // namespace

}  // namespace calls
