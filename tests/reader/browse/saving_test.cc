#include "reader/browse/saving.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

#include "Stage.h"
#include "reader/errors.h"
#include "reader/inputs.h"

namespace reader::browse {
namespace {

using testing::Stage;

class Saving : public ::testing::Test {
  protected:
    Saving() : stage_("examples/net5.pcap") {
        char name[] = "/tmp/browse.XXXXXX";
        folder_ = mkdtemp(name);
        options_.input.files = {LAPDMON_SOURCE_DIR "/examples/net5.pcap"};
    }
    ~Saving() override { std::filesystem::remove_all(folder_); }

    std::string save(std::set<std::uint64_t> frames, bool redacted) {
        return saveFrames(stage_.browser().trace().frames(), {path(), std::move(frames), redacted}, options_,
                          redaction::randomKey({}));
    }
    std::string path() const { return folder_ + "/out.pcapng"; }
    // The octets of the file's frames.
    std::vector<std::vector<std::uint8_t>> written() const {
        const auto reader = openFile(path(), {});
        std::vector<std::vector<std::uint8_t>> frames;
        for (capture::Item item; reader->next(item) == capture::Reader::Next::item;) {
            if (item.isFrame())
                frames.emplace_back(item.frame.octets.begin(), item.frame.octets.end());
        }
        return frames;
    }
    std::vector<std::uint8_t> original(std::uint64_t number) const {
        const FrameStore& store = stage_.browser().trace().frames();
        Shown shown;
        EXPECT_TRUE(store.load(*store.placeOf(number), shown));
        const auto octets = shown.seen().frame().octets;
        return {octets.begin(), octets.end()};
    }

    mutable Stage stage_;
    Options options_;
    std::string folder_;
};

TEST_F(Saving, WritesTheFramesThatWereAskedForAsTheyAre) {
    EXPECT_EQ(save({5, 7, 9}, false), "wrote 3 frames to " + path());
    EXPECT_EQ(written(), (std::vector{original(5), original(7), original(9)}));
}

TEST_F(Saving, RedactedFramesHoldNoNumberAndAreAsLong) {
    EXPECT_EQ(save({5}, true), "wrote 1 frame, redacted, to " + path());
    const auto frames = written();
    ASSERT_EQ(frames.size(), 1U);
    EXPECT_EQ(frames[0].size(), original(5).size());
    const std::string octets(frames[0].begin(), frames[0].end());
    EXPECT_EQ(octets.find("4957414501"), std::string::npos);
    EXPECT_EQ(octets.find("73134483"), std::string::npos);
    const auto before = original(5);
    const std::string originals(before.begin(), before.end());
    EXPECT_NE(originals.find("4957414501"), std::string::npos);
}

TEST_F(Saving, ANumberHasOnePseudonymWhicheverFramesAreSaved) {
    const redaction::Key key = redaction::randomKey({});
    const auto saved = [&](std::set<std::uint64_t> frames) {
        saveFrames(stage_.browser().trace().frames(), {path(), std::move(frames), true}, options_, key);
        return written().back();
    };
    EXPECT_EQ(saved({5}), saved({3, 4, 5}));
}

TEST_F(Saving, TheInputIsNotWrittenOver) {
    std::filesystem::copy(options_.input.files[0], path());
    options_.input.files = {path()};
    const auto size = std::filesystem::file_size(path());
    EXPECT_THROW(save({5}, false), FileError);
    EXPECT_EQ(std::filesystem::file_size(path()), size);
}

TEST_F(Saving, AFileOfAnotherKindIsNotWrittenOver) {
    std::ofstream(path()) << "precious";
    EXPECT_THROW(save({5}, false), FileError);
    EXPECT_EQ(std::filesystem::file_size(path()), 8U);
}

TEST_F(Saving, AFolderThatIsNotThereIsSaid) {
    folder_ += "/none";
    EXPECT_THROW(save({5}, false), FileError);
}

TEST_F(Saving, TheScreenAsksForTheFramesOfTheCall) {
    stage_.press("Down Down Down w Enter");
    ASSERT_EQ(stage_.saved().size(), 1U);
    EXPECT_EQ(stage_.saved()[0].path, "call-4.pcapng");
    EXPECT_FALSE(stage_.saved()[0].redacted);
    std::set<std::uint64_t> frames;
    for (const CallFrame& frame : stage_.browser().trace().framesOf(4))
        frames.insert(frame.frame);
    EXPECT_EQ(stage_.saved()[0].frames, frames);
    EXPECT_GE(frames.size(), 3U);
}

TEST_F(Saving, TheScreenAsksBeforeItWritesOverAFile) {
    std::ofstream(path()) << "";
    stage_.press("w BS BS BS BS BS BS BS BS BS BS BS BS BS");
    stage_.press(path());
    stage_.press("Enter");
    EXPECT_TRUE(stage_.saved().empty());
    stage_.press("Enter");
    ASSERT_EQ(stage_.saved().size(), 1U);
    EXPECT_EQ(stage_.saved()[0].path, path());
}

TEST_F(Saving, EscapeWritesNothing) {
    stage_.press("w Tab Space Esc");
    EXPECT_TRUE(stage_.saved().empty());
    EXPECT_EQ(stage_.line(1), "Calls: 6");
}

}  // namespace
}  // namespace reader::browse
