#include "reader/TextConsumer.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <algorithm>
#include <csignal>

#include "reader/errors.h"
#include "tests/reader/streams.h"

namespace reader {
namespace {

using testing::ScriptedReader;
using testing::second;

// Writes "<delta> N\n" for each frame.
class NumberComposer : public Composer {
  public:
    void compose(const Seen& seen, std::string& text, Piece& piece) override {
        piece.deltaAt = text.size();
        piece.deltaSize = 7;
        text.append(7, ' ');
        text += " " + std::to_string(seen.number) + "\n";
    }
};

class Pipe {
  public:
    Pipe() { EXPECT_EQ(pipe(ends_), 0); }
    ~Pipe() {
        closeEnd(0);
        closeEnd(1);
    }
    Pipe(const Pipe&) = delete;
    Pipe& operator=(const Pipe&) = delete;

    int writeEnd() const { return ends_[1]; }
    void closeEnd(int which) {
        if (ends_[which] >= 0)
            close(ends_[which]);
        ends_[which] = -1;
    }
    std::string contents() {
        closeEnd(1);
        std::string text(1 << 16, '\0');
        text.resize(static_cast<std::size_t>(std::max<ssize_t>(0, read(ends_[0], text.data(), text.size()))));
        return text;
    }

  private:
    int ends_[2] = {-1, -1};
};

std::vector<ScriptedReader::Step> frames(std::size_t count) {
    std::vector<ScriptedReader::Step> steps;
    for (std::size_t i = 0; i < count; ++i)
        steps.push_back({"x", static_cast<std::int64_t>(i * i) * second});
    return steps;
}

std::string run(std::size_t count, const std::vector<FilterWord>& words, std::uint64_t first, unsigned jobs) {
    Pipe pipe;
    Output out(pipe.writeEnd(), "pipe");
    ScriptedReader reader(frames(count));
    Tracker tracker{InputOptions()};
    Filter filter(words);
    TextConsumer consumer(out);
    Chatter chatter(Loudness::quiet);
    Work work;
    work.makeComposer = [] { return std::make_unique<NumberComposer>(); };
    work.first = first;
    work.jobs = jobs;
    runPipeline(reader, tracker, filter, consumer, chatter, work);
    return pipe.contents();
}

TEST(Pipeline, FillsInTheTimeSinceTheLineBefore) {
    EXPECT_EQ(run(4, {}, 0, 1), "  0.000 1\n  1.000 2\n  3.000 3\n  5.000 4\n");
}

TEST(Pipeline, CountsTheTimeFromTheLineThatWasShownBefore) {
    EXPECT_EQ(run(6, {{"since", "+2", false}}, 0, 1), "  0.000 3\n  5.000 4\n  7.000 5\n  9.000 6\n");
}

TEST(Pipeline, MakesRoomForLongTimes) {
    // The place of the time has 7 characters.
    const std::string text = run(520, {}, 0, 1);
    EXPECT_NE(text.find("\n997.000 500\n999.000 501\n1001.000 502\n1003.000 503\n"), std::string::npos);
}

TEST(Pipeline, EndsWhenEnoughFramesHavePassed) { EXPECT_EQ(run(600, {}, 2, 1), "  0.000 1\n  1.000 2\n"); }

TEST(Pipeline, GivesTheSameTextWhateverTheNumberOfThreads) {
    const std::string alone = run(3000, {}, 0, 1);
    EXPECT_EQ(std::count(alone.begin(), alone.end(), '\n'), 3000);
    for (const unsigned jobs : {2U, 3U, 8U})
        EXPECT_EQ(run(3000, {}, 0, jobs), alone) << jobs;
    EXPECT_EQ(run(3000, {}, 700, 4), run(3000, {}, 700, 1));
}

TEST(Output, ReportsThatTheReaderHasGone) {
    std::signal(SIGPIPE, SIG_IGN);
    Pipe pipe;
    Output out(pipe.writeEnd(), "pipe");
    pipe.closeEnd(0);
    out.write("text");
    EXPECT_THROW(out.flush(), ReaderGone);
}

TEST(Output, NamesTheFileThatCannotBeWritten) {
    Output out(std::string("/dev/full"));
    out.write("text");
    try {
        out.flush();
        FAIL();
    } catch (const FileError& error) {
        EXPECT_STREQ(error.what(), "cannot write /dev/full: No space left on device");
    }
}

}  // namespace
}  // namespace reader
