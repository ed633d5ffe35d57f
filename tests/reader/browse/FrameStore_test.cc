#include "reader/browse/FrameStore.h"

#include <gtest/gtest.h>

#include <set>

#include "reader/Tracker.h"

namespace reader::browse {
namespace {

// Frames with numbers, each with its number in its octets, and items between them.
class FrameStoreTest : public ::testing::Test {
  protected:
    // A page of so many frames; an event stands behind each whose number is in `events`.
    std::shared_ptr<const Page> page(std::size_t frames, const std::set<std::uint64_t>& events = {}) {
        auto page = std::make_shared<Page>();
        for (std::size_t i = 0; i < frames; ++i) {
            const std::uint64_t number = ++last_;
            const std::uint8_t octets[] = {0x02,
                                           0x01,
                                           0x00,
                                           0x00,
                                           static_cast<std::uint8_t>(number),
                                           static_cast<std::uint8_t>(number >> 8)};
            capture::Item item;
            item.frame.octets = octets;
            item.frame.interface = &interface_;
            Seen seen;
            seen.item = &item;
            seen.number = number;
            seen.at = static_cast<std::int64_t>(number);
            readHeaders(seen);
            page->add(seen, &interface_, "a.log");
            if (events.contains(number))
                addEvent(*page);
        }
        return page;
    }
    void addEvent(Page& page) {
        capture::Item item;
        item.kind = capture::Item::Kind::lost;
        item.count = 17;
        item.text = "why";
        Seen seen;
        seen.item = &item;
        page.add(seen, &interface_, "a.log");
    }
    static std::uint64_t numberIn(const Shown& shown) {
        return shown.seen().frame().octets[4] + std::uint64_t{256} * shown.seen().frame().octets[5];
    }

    capture::Interface interface_{"trunk", capture::Variant::net5};
    std::uint64_t last_ = 0;
    Shown shown_;
};

TEST_F(FrameStoreTest, GivesWhatWasAdded) {
    FrameStore store;
    store.add(page(3, {2}));
    ASSERT_TRUE(store.load(*store.placeOf(2), shown_));
    EXPECT_EQ(shown_.seen().number, 2U);
    EXPECT_EQ(numberIn(shown_), 2U);
    EXPECT_EQ(shown_.seen().link.type, isdn::FrameType::I);
    EXPECT_EQ(shown_.seen().frame().interface->name, "trunk");
    EXPECT_EQ(shown_.seen().frame().place.file, "a.log");
    ASSERT_TRUE(store.load(2, shown_));
    EXPECT_EQ(shown_.seen().item->kind, capture::Item::Kind::lost);
    EXPECT_EQ(shown_.seen().item->count, 17U);
    EXPECT_EQ(shown_.seen().item->text, "why");
    EXPECT_EQ(shown_.seen().number, 0U);
}

TEST_F(FrameStoreTest, FindsEveryFrameWhateverThePages) {
    FrameStore store;
    for (const std::size_t size : {1U, 2U, 600U, 1U, 1U, 511U, 3U})
        store.add(page(size, {1, 2, 3, 603, 604, 605}));
    for (std::uint64_t number = 1; number <= last_; ++number) {
        const auto place = store.placeOf(number);
        ASSERT_TRUE(place) << number;
        ASSERT_TRUE(store.load(*place, shown_));
        ASSERT_EQ(shown_.seen().number, number);
        ASSERT_EQ(numberIn(shown_), number);
    }
    EXPECT_FALSE(store.placeOf(0));
    EXPECT_FALSE(store.placeOf(last_ + 1));
}

TEST_F(FrameStoreTest, APageThatBeginsWithNoFrameHidesNone) {
    FrameStore store;
    store.add(page(600));
    auto second = std::make_shared<Page>(600);
    addEvent(*second);
    store.add(second);
    store.add(page(600));
    ASSERT_TRUE(store.placeOf(600));
    EXPECT_EQ(*store.placeOf(600), 599U);
    EXPECT_EQ(*store.placeOf(601), 601U);
}

TEST_F(FrameStoreTest, TheOldestGoAndThatIsCounted) {
    FrameStore store(1000);
    for (int i = 0; i < 10; ++i)
        store.add(page(600));
    EXPECT_EQ(store.end(), 6000U);
    EXPECT_EQ(store.gone(), 4800U);
    EXPECT_EQ(store.firstNumber(), 4801U);
    EXPECT_FALSE(store.placeOf(4800));
    EXPECT_TRUE(store.placeOf(4801));
    EXPECT_FALSE(store.load(4799, shown_));
}

TEST_F(FrameStoreTest, ManySmallPagesBecomeFew) {
    FrameStore store(100);
    for (int i = 0; i < 5000; ++i)
        store.add(page(1));
    // Whole pages go, so a little more than asked for stays.
    EXPECT_GE(store.end() - store.begin(), 100U);
    EXPECT_LE(store.end() - store.begin(), 100U + 512U);
}

TEST_F(FrameStoreTest, ACopyStaysAsItIs) {
    FrameStore store(1000);
    store.add(page(10));
    const FrameStore copy = store;
    for (int i = 0; i < 5; ++i)
        store.add(page(900));
    EXPECT_FALSE(store.placeOf(5));
    ASSERT_TRUE(copy.placeOf(5));
    ASSERT_TRUE(copy.load(*copy.placeOf(5), shown_));
    EXPECT_EQ(numberIn(shown_), 5U);
    EXPECT_EQ(copy.end(), 10U);
}

TEST_F(FrameStoreTest, KnowsWhereLinksAreToldOf) {
    FrameStore store;
    store.add(page(5, {2, 4}));
    EXPECT_EQ(store.tellingOfLinks(0, 7, 10), (std::vector<std::uint64_t>{2, 5}));
    EXPECT_EQ(store.tellingOfLinks(3, 7, 10), (std::vector<std::uint64_t>{5}));
    EXPECT_EQ(store.tellingOfLinks(0, 7, 1), (std::vector<std::uint64_t>{5}));
}

}  // namespace
}  // namespace reader::browse
