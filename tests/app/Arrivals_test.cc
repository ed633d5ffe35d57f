#include "app/Arrivals.h"

#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "tests/app/records.h"

namespace app {
namespace {

using testing::Record;

std::unique_ptr<Record> numbered(std::uint64_t number, std::uint64_t missing = 0) {
    auto rec = std::make_unique<Record>();
    rec->setArrival({number, missing});
    return rec;
}

// What is queued when records with these numbers come in this order.
std::vector<std::uint64_t> queued(Arrivals& arrivals, const std::vector<std::uint64_t>& numbers) {
    std::vector<std::uint64_t> order;
    for (const std::uint64_t number : numbers) {
        arrivals.takeInTurn(numbered(number), [&](std::unique_ptr<Record> rec) {
            order.push_back(rec->arrival().number);
            rec.reset();
            arrivals.gone();
        });
    }
    return order;
}

using Numbers = std::vector<std::uint64_t>;

TEST(Arrivals, AreQueuedInTheOrderOfTheirNumbersWhateverTheirThreadsDo) {
    const struct {
        const char* says;
        Numbers come, queued;
    } cases[] = {
        {"in order", {1, 2, 3}, {1, 2, 3}},
        {"backwards", {4, 3, 2, 1}, {1, 2, 3, 4}},
        {"one is late", {2, 3, 5, 1, 4}, {1, 2, 3, 4, 5}},
        {"one does not come", {1, 3, 4}, {1}},
        {"numberless ones have their turn at once", {2, 0, 0, 1}, {0, 0, 1, 2}},
    };
    for (const auto& c : cases) {
        Arrivals arrivals;
        EXPECT_EQ(queued(arrivals, c.come), c.queued) << c.says;
    }
}

TEST(Arrivals, AsManyAsTheQueueHoldsMayComeBeforeTheirTurn) {
    Arrivals arrivals;
    for (std::uint64_t round = 0; round < 5; ++round) {
        Numbers numbers, wanted;
        for (std::uint64_t i = 1; i <= queueCapacity; ++i)
            wanted.push_back(round * queueCapacity + i);
        numbers.assign(wanted.rbegin(), wanted.rend());
        EXPECT_EQ(queued(arrivals, numbers), wanted);
    }
}

// A record that the queue refuses may be the one that tells how many were lost before it.
TEST(Arrivals, TheNextRecordTellsOfLossesThatARefusedRecordShouldHaveTold) {
    Arrivals arrivals;
    const auto refuse = [&](std::unique_ptr<Record> rec) { arrivals.refused(*rec); };
    std::vector<std::uint64_t> missing;
    const auto take = [&](std::unique_ptr<Record> rec) { missing.push_back(rec->arrival().missing); };
    arrivals.takeInTurn(numbered(1, 7), refuse);
    arrivals.takeInTurn(numbered(2, 5), refuse);
    EXPECT_EQ(arrivals.untold(), 12U);
    arrivals.takeInTurn(numbered(3, 2), take);
    arrivals.takeInTurn(numbered(4), take);
    EXPECT_EQ(missing, (std::vector<std::uint64_t>{14, 0}));
    EXPECT_EQ(arrivals.untold(), 0U);
}

TEST(Arrivals, CountAsUnwrittenUntilTheyAreGone) {
    Arrivals arrivals;
    std::vector<std::unique_ptr<Record>> queue;
    for (const std::uint64_t number : {2, 1, 4})
        arrivals.takeInTurn(numbered(number),
                            [&](std::unique_ptr<Record> rec) { queue.push_back(std::move(rec)); });
    EXPECT_EQ(queue.size(), 2U);
    EXPECT_EQ(arrivals.unwritten(), 3U);
    arrivals.gone();
    EXPECT_EQ(arrivals.unwritten(), 2U);
    arrivals.refused(*queue.back());
    EXPECT_EQ(arrivals.unwritten(), 1U);
    EXPECT_EQ(arrivals.lostForWantOfMeans(), 1U);
    int early = 0;
    arrivals.releaseEarly([&](std::unique_ptr<Record>) {
        ++early;
        arrivals.gone();
    });
    EXPECT_EQ(early, 1);
    EXPECT_EQ(arrivals.unwritten(), 0U);
}

}  // namespace
}  // namespace app
