#include "reader/Crew.h"

#include <gtest/gtest.h>

#include <latch>
#include <stdexcept>

namespace reader {
namespace {

std::unique_ptr<Chunk> chunk(const std::string& text) {
    auto made = std::make_unique<Chunk>();
    made->text = text;
    return made;
}

void addMark(Chunk& chunk) { chunk.text += "!"; }

TEST(Crew, GivesChunksBackInTheOrderInWhichTheyCame) {
    // The second thread cannot begin before the owner has begun the first chunk, and the first chunk is done
    // last.
    std::latch secondIsDone(1);
    const auto job = [&](Chunk& chunk) {
        if (chunk.text == "0")
            secondIsDone.wait();
        else if (chunk.text == "1")
            secondIsDone.count_down();
        addMark(chunk);
    };
    Crew crew({job, job});
    crew.handIn(chunk("0"));
    crew.handIn(chunk("1"));
    EXPECT_EQ(crew.takeBack()->text, "0!");
    EXPECT_EQ(crew.takeBack()->text, "1!");
    EXPECT_EQ(crew.takeBack(), nullptr);
}

TEST(Crew, OfOneWorksOnTheOwnersThread) {
    const auto owner = std::this_thread::get_id();
    Crew crew(
        {[owner](Chunk& chunk) { chunk.text = std::this_thread::get_id() == owner ? "mine" : "other"; }});
    crew.handIn(chunk("0"));
    EXPECT_EQ(crew.held(), 1U);
    EXPECT_EQ(crew.takeBack()->text, "mine");
    EXPECT_EQ(crew.held(), 0U);
}

TEST(Crew, LosesNothingHoweverManyWork) {
    Crew crew(std::vector<Crew::Job>(4, addMark));
    int next = 0;
    for (int i = 0; i < 2000; ++i) {
        crew.handIn(chunk(std::to_string(i)));
        if (crew.held() > 9) {
            EXPECT_EQ(crew.takeBack()->text, std::to_string(next++) + "!");
        }
    }
    while (crew.held() > 0)
        EXPECT_EQ(crew.takeBack()->text, std::to_string(next++) + "!");
    EXPECT_EQ(next, 2000);
}

TEST(Crew, ThrowsTheExceptionsOfItsJobs) {
    const auto job = [](Chunk& chunk) {
        if (chunk.text == "bad")
            throw std::runtime_error("no good");
    };
    Crew crew({job, job});
    crew.handIn(chunk("good"));
    crew.handIn(chunk("bad"));
    crew.handIn(chunk("good"));
    EXPECT_NE(crew.takeBack(), nullptr);
    EXPECT_THROW(crew.takeBack(), std::runtime_error);
    EXPECT_NE(crew.takeBack(), nullptr);
}

TEST(Crew, MayBeLeftWithChunks) {
    Crew crew({addMark, addMark});
    crew.handIn(chunk("0"));
    crew.handIn(chunk("1"));
}

}  // namespace
}  // namespace reader
