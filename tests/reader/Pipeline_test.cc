#include "reader/Pipeline.h"

#include <gtest/gtest.h>

#include <array>
#include <stdexcept>
#include <vector>

#include "tests/reader/streams.h"

namespace reader {
namespace {

// Gives so many frames of one D channel, and then throws or ends.
class Frames : public capture::Reader {
  public:
    explicit Frames(std::uint64_t count, bool isBad = false) : left_(count), isBad_(isBad) {}

    Next next(capture::Item& item) override {
        if (left_ == 0 && isBad_)
            throw capture::BadInput("bad");
        if (left_ == 0)
            return Next::end;
        --left_;
        item = {};
        item.frame.octets = octets_;
        item.frame.interface = &interface_;
        return Next::item;
    }
    void wait(std::chrono::milliseconds /*most*/) override {}
    Progress progress() const override { return {}; }

  private:
    std::uint64_t left_;
    bool isBad_;
    capture::Interface interface_;
    std::array<std::uint8_t, 4> octets_{0x02, 0x01, 0x01, 0x01};
};

// Gives frames, and behind each of them a line that says that others were lost.
class Losses : public Frames {
  public:
    using Frames::Frames;

    Next next(capture::Item& item) override {
        isLoss_ = !isLoss_;
        if (isLoss_)
            return Frames::next(item);
        item.kind = capture::Item::Kind::lost;
        item.count = 3;
        item.frame.octets = {};
        return Next::item;
    }

  private:
    bool isLoss_ = false;
};

// Gathers the numbers of what comes; 0 stands for what is no frame.
class Numbers : public Consumer {
  public:
    void take(Chunk& chunk, std::size_t count) override {
        for (std::size_t i = 0; i < count; ++i)
            numbers.push_back(chunk.seen()[chunk.pieces[i].item].number);
    }
    void flush() override {}
    std::vector<std::uint64_t> numbers;
};

// Checks that frames come in their order, and may fail at one of them.
class Counting : public Consumer {
  public:
    explicit Counting(std::uint64_t failAt = 0, std::uint64_t after = 0) : taken(after), failAt_(failAt) {}
    void take(Chunk& chunk, std::size_t count) override {
        for (std::size_t i = 0; i < count; ++i) {
            EXPECT_EQ(chunk.seen()[chunk.pieces[i].item].number, ++taken);
            if (taken == failAt_)
                throw std::runtime_error("full");
        }
    }
    void flush() override { flushed = taken; }

    std::uint64_t taken;  // the number of the last one
    std::uint64_t flushed = 0;

  private:
    std::uint64_t failAt_;
};

class Failing : public Composer {
  public:
    explicit Failing(std::uint64_t failAt) : failAt_(failAt) {}
    void compose(const Seen& seen, std::string& text, Piece& /*piece*/) override {
        if (seen.number == failAt_)
            throw std::runtime_error("no words");
        text += 'x';
    }

  private:
    std::uint64_t failAt_;
};

class PipelineTest : public ::testing::TestWithParam<unsigned> {
  protected:
    Outcome run(capture::Reader& reader, Counting& counting, std::uint64_t first = 0,
                std::uint64_t failAt = 0, std::uint64_t skipped = 0) {
        Work work;
        work.makeComposer = [failAt] { return std::make_unique<Failing>(failAt); };
        work.jobs = GetParam();
        work.first = first;
        work.skipped = skipped;
        return runPipeline(reader, tracker_, filter_, counting, chatter_, work);
    }

    Tracker tracker_{InputOptions()};
    Filter filter_{{}};
    Chatter chatter_{Loudness::quiet};
};

TEST_P(PipelineTest, HandsOnAllFramesInTheirOrder) {
    for (const std::uint64_t frames : {0U, 1U, 255U, 256U, 257U, 20'000U}) {
        Frames reader(frames);
        Counting counting;
        Tracker tracker{InputOptions()};
        tracker_ = std::move(tracker);
        const Outcome outcome = run(reader, counting);
        EXPECT_TRUE(outcome.isWhole);
        EXPECT_EQ(outcome.passed, frames);
        EXPECT_EQ(counting.flushed, frames);
    }
}

TEST_P(PipelineTest, HandsOnNoMoreThanTheFirst) {
    Frames reader(20'000);
    Counting counting;
    EXPECT_FALSE(run(reader, counting, 3000).isWhole);
    EXPECT_EQ(counting.flushed, 3000U);
}

TEST_P(PipelineTest, LeavesOutSoManyInFront) {
    for (const std::uint64_t skipped : {1U, 255U, 256U, 257U, 3000U}) {
        tracker_ = Tracker(InputOptions());
        Frames reader(20'000);
        Counting counting(0, skipped);
        run(reader, counting, 1000, 0, skipped);
        EXPECT_EQ(counting.flushed, skipped + 1000);
    }
}

TEST_P(PipelineTest, CountsFramesAndNotWhatIsSaidBetweenThem) {
    Losses reader(20'000);
    Numbers consumer;
    Work work;
    work.makeComposer = [] { return std::make_unique<Failing>(~0ULL); };
    work.jobs = GetParam();
    work.first = 3;
    work.skipped = 700;
    runPipeline(reader, tracker_, filter_, consumer, chatter_, work);
    EXPECT_EQ(consumer.numbers, (std::vector<std::uint64_t>{0, 701, 0, 702, 0, 703}));
}

TEST_P(PipelineTest, HandsOnWhatWasReadBeforeTheInputTurnedBad) {
    Frames reader(5000, true);
    Counting counting;
    EXPECT_THROW(run(reader, counting), capture::BadInput);
    EXPECT_EQ(counting.flushed, 5000U);
}

TEST_P(PipelineTest, HandsOnNothingBehindAFailure) {
    {
        Frames reader(20'000);
        Counting counting;
        EXPECT_THROW(run(reader, counting, 0, 4000), std::runtime_error);
        EXPECT_LE(counting.taken, 4000U);
        EXPECT_GE(counting.taken, 3999U);
    }
    tracker_ = Tracker(InputOptions());
    Frames reader(20'000);
    Counting counting(4000);
    EXPECT_THROW(run(reader, counting), std::runtime_error);
    EXPECT_EQ(counting.taken, 4000U);
}

INSTANTIATE_TEST_SUITE_P(Jobs, PipelineTest, ::testing::Values(1, 2, 5));

}  // namespace
}  // namespace reader
