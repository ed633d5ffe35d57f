#include "reader/Joined.h"

#include <gtest/gtest.h>

#include "tests/reader/streams.h"

namespace reader {
namespace {

using testing::ScriptedReader;
using testing::second;
using Steps = std::vector<ScriptedReader::Step>;

Opener scripted(const std::string& file, Steps steps) {
    return [file, steps] { return std::make_unique<ScriptedReader>(steps, file); };
}

// "name@seconds file:line", a comma between items; "pause" where there was one.
std::string all(capture::Reader& reader) {
    std::string told;
    std::vector<capture::Item> items;
    while (true) {
        capture::Item item;
        const auto next = reader.next(item);
        if (next == capture::Reader::Next::end)
            break;
        told += told.empty() ? "" : ", ";
        if (next == capture::Reader::Next::pause) {
            told += "pause";
            reader.wait(std::chrono::milliseconds(1));
            continue;
        }
        told += item.frame.interface->name + "@" + std::to_string(item.frame.time / second) + " " +
                capture::toString(item.frame.place);
        items.push_back(item);
    }
    return told;
}

TEST(Sequence, GivesOneInputAfterAnother) {
    Sequence sequence(
        {scripted("a", {{"x", 5 * second}, {"x", 6 * second}}), scripted("b", {{"y", 1 * second}})});
    EXPECT_EQ(all(sequence), "x@5 a:1, x@6 a:2, y@1 b:1");
}

TEST(Sequence, KeepsNamesForLongerThanTheInputsTheyCameFrom) {
    Sequence sequence({scripted("a", {{"x", 0}}), scripted("b", {{"y", 0}})});
    capture::Item first;
    capture::Item other;
    sequence.next(first);
    sequence.next(other);
    EXPECT_EQ(first.frame.interface->name, "x");
    EXPECT_EQ(first.frame.place.file, "a");
    EXPECT_EQ(other.frame.interface->name, "y");
}

TEST(Sequence, GivesOneObjectForFramesOfOneDChannel) {
    Sequence sequence({scripted("a", {{"x", 0}}), scripted("b", {{"y", 0}, {"x", 0}})});
    capture::Item first;
    capture::Item other;
    capture::Item again;
    sequence.next(first);
    sequence.next(other);
    sequence.next(again);
    EXPECT_EQ(first.frame.interface, again.frame.interface);
    EXPECT_NE(first.frame.interface, other.frame.interface);
}

TEST(Sequence, PausesWhereItsInputDoes) {
    Sequence sequence({scripted("a", {{"x", 0}, {"pause"}, {"x", second}})});
    EXPECT_EQ(all(sequence), "x@0 a:1, pause, x@1 a:2");
}

TEST(Merge, PutsItemsInTheOrderOfTheirTimes) {
    Merge merge({scripted("a", {{"x", 1 * second}, {"x", 4 * second}}),
                 scripted("b", {{"y", 2 * second}, {"y", 3 * second}, {"y", 5 * second}})});
    EXPECT_EQ(all(merge), "x@1 a:1, y@2 b:1, y@3 b:2, x@4 a:2, y@5 b:3");
}

TEST(Merge, LeavesItemsOfOneTimeInTheOrderOfTheInputs) {
    Merge merge({scripted("a", {{"x", second}}), scripted("b", {{"y", second}})});
    EXPECT_EQ(all(merge), "x@1 a:1, y@1 b:1");
}

TEST(Merge, DoesNotWaitForAnInputThatHasNothingJustNow) {
    Merge merge({scripted("a", {{"pause"}, {"x", 1 * second}}), scripted("b", {{"y", 2 * second}})});
    EXPECT_EQ(all(merge), "y@2 b:1, x@1 a:1");
}

TEST(Merge, LetsItemsWithoutATimeThrough) {
    Merge merge({scripted("a", {{"x", 5 * second}}),
                 scripted("b", {{"y", 0, {2, 1, 1, 1}, false, capture::Clock::none}})});
    EXPECT_EQ(all(merge), "y@0 b:1, x@5 a:1");
}

}  // namespace
}  // namespace reader
