#include <gtest/gtest.h>
#include <algorithm>

#include "reader/Pipeline.h"
#include "tests/reader/streams.h"

namespace reader {
namespace {

using testing::ScriptedReader;
using testing::second;
using Steps = std::vector<ScriptedReader::Step>;

const std::vector<std::uint8_t> poll{0x00, 0x01, 0x01, 0x01};    // RR, P, of the user
const std::vector<std::uint8_t> answer{0x00, 0x01, 0x01, 0x01};  // RR, F, of the network
const std::vector<std::uint8_t> establish{0x00, 0x01, 0x7F};
const std::vector<std::uint8_t> established{0x00, 0x01, 0x73};

// Collects the numbers of the frames that pass, a "|" where output is flushed between them.
class Numbers : public Consumer, public Composer {
  public:
    void compose(const Seen& seen, std::string& text, Piece& /*piece*/) override {
        text += std::to_string(seen.number) + " ";
    }
    void take(Chunk& chunk, std::size_t count) override {
        told += chunk.text.substr(0, chunk.pieces[count - 1].end);
    }
    void flush() override {
        if (!told.empty() && told.back() != '|')
            told += "|";
    }
    std::string told;
};

std::string shown(const Steps& steps, bool negated = false) {
    ScriptedReader reader(steps);
    Tracker tracker{InputOptions()};
    Filter filter({{"no-keepalive", "", negated}});
    Numbers numbers;
    Chatter chatter(Loudness::quiet);
    Work work;
    work.makeComposer = [] { return std::make_unique<Numbers>(); };
    runPipeline(reader, tracker, filter, numbers, chatter, work);
    return numbers.told;
}

Steps linkUp() { return {{"x", 0, establish, true}, {"x", second / 100, established, false}}; }

Steps with(Steps steps, const Steps& more) {
    steps.insert(steps.end(), more.begin(), more.end());
    return steps;
}

TEST(KeepAlives, AreHiddenWithTheirAnswers) {
    EXPECT_EQ(shown(with(linkUp(), {{"x", 20 * second, poll, true},
                                    {"x", 20 * second + 1, answer, false},
                                    {"x", 40 * second, poll, true},
                                    {"x", 40 * second + 1, answer, false}})),
              "1 2 |");
}

TEST(KeepAlives, AreTheOnlyFramesShownIfTheFilterIsNegated) {
    EXPECT_EQ(
        shown(with(linkUp(), {{"x", 20 * second, poll, true}, {"x", 20 * second + 1, answer, false}}), true),
        "3 4 |");
}

TEST(KeepAlives, AreShownIfNoAnswerComes) {
    EXPECT_EQ(shown(with(linkUp(), {{"x", 20 * second, poll, true}, {"x", 22 * second, poll, true}})),
              "1 2 3 4 |");
}

TEST(KeepAlives, WaitForAnAnswerThatComesAfterAPause) {
    EXPECT_EQ(shown(with(linkUp(),
                         {{"x", 20 * second, poll, true}, {"pause"}, {"x", 20 * second + 1, answer, false}})),
              "1 2 |");
}

TEST(KeepAlives, AreRecognisedAcrossTheBordersOfChunks) {
    Steps steps = linkUp();
    for (int i = 1; i <= 1000; ++i) {
        steps.push_back({"x", i * 20 * second, poll, true});
        steps.push_back({"x", i * 20 * second + 1, answer, false});
        if (i % 100 == 0)
            steps.push_back({"x", i * 20 * second + 2, establish, true});
        if (i % 100 == 0)
            steps.push_back({"x", i * 20 * second + 3, established, false});
    }
    const std::string told = shown(steps);
    EXPECT_EQ(std::count(told.begin(), told.end(), ' '), 22) << told;
}

}  // namespace
}  // namespace reader
