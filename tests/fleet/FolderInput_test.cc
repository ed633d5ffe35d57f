#include "fleet/ship/FolderInput.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include "InputText.h"
#include "Recordings.h"

namespace {

using fleet::FolderInput;
using fleet::Place;
using fleet_tests::restOf;
using Before = fleet::FolderInput::Before;

class FolderInputTest : public testing::Test {
  protected:
    FolderInput input(const Place& place = {}, Before before = Before::nothing) const {
        return {folder_.path(), "pri1", place, before};
    }

    fleet_tests::Folder folder_;
    fleet_tests::Recordings recorder_{folder_.path()};
};

TEST_F(FolderInputTest, WithoutARecorderThereIsNothingYet) {
    FolderInput input = this->input();
    EXPECT_EQ(restOf(input), "");
    EXPECT_EQ(input.lacks(), folder_.path() + ": no recordings of pri1 yet");
    recorder_.begin(7, 1);
    recorder_.frames(1);
    EXPECT_EQ(restOf(input), "7/1:00010001");
    EXPECT_EQ(input.lacks(), "");
}

TEST_F(FolderInputTest, SaysThatItsFolderIsNotThere) {
    FolderInput input(folder_.file("spelt-wrong"), "pri1", {}, Before::nothing);
    EXPECT_EQ(restOf(input), "");
    EXPECT_EQ(input.lacks(), folder_.file("spelt-wrong") + ": no such folder");
}

TEST_F(FolderInputTest, SaysWhyItsFolderCannotBeRead) {
    std::filesystem::create_symlink("itself", folder_.file("itself"));
    FolderInput input(folder_.file("itself"), "pri1", {}, Before::nothing);
    EXPECT_EQ(restOf(input), "");
    EXPECT_EQ(input.lacks(), folder_.file("itself") + ": Too many levels of symbolic links");
}

TEST_F(FolderInputTest, FramesComeAsTheyAreWrittenAlsoOverTheEndOfAFile) {
    FolderInput input = this->input();
    recorder_.begin(7, 1);
    recorder_.frames(2);
    EXPECT_EQ(restOf(input), "7/1:00010001 7/2:00010002");
    recorder_.frames(1);
    EXPECT_EQ(restOf(input), "7/3:00010003");
    recorder_.frames(1);
    recorder_.finish();
    recorder_.begin(7, 5);
    recorder_.frames(1);
    EXPECT_EQ(restOf(input), "7/4:00010004 7/5:00010005");
    recorder_.finish();
    EXPECT_EQ(restOf(input), "");
}

TEST_F(FolderInputTest, WhatTheRecorderSaysComesWithTheFrames) {
    FolderInput input = this->input();
    recorder_.begin(7, 1);
    recorder_.frames(1);
    recorder_.lost(3);
    recorder_.frames(1);
    EXPECT_EQ(restOf(input), "7/1:00010001 frames-lost=3 7/2:00010002");
    recorder_.lost(4);
    recorder_.finish();
    recorder_.begin(7, 3);
    recorder_.frames(1);
    EXPECT_EQ(restOf(input), "frames-lost=4 7/3:00010003");
}

TEST_F(FolderInputTest, GoesOnBehindThePlaceWhateverFileThatIsIn) {
    recorder_.begin(7, 1);
    recorder_.frames(2);
    recorder_.lost(5);
    recorder_.finish();
    recorder_.begin(7, 3);
    recorder_.frames(3);
    const std::string all[] = {
        "",
        "7/1:00010001 7/2:00010002 frames-lost=5 7/3:00010003 7/4:00010004 7/5:00010005",
        "(7/1:00010001) 7/2:00010002 frames-lost=5 7/3:00010003 7/4:00010004 7/5:00010005",
        "(7/1:00010001) (7/2:00010002) frames-lost=5 7/3:00010003 7/4:00010004 7/5:00010005",
        "(7/3:00010003) 7/4:00010004 7/5:00010005",
        "(7/3:00010003) (7/4:00010004) 7/5:00010005",
        "(7/3:00010003) (7/4:00010004) (7/5:00010005)"};
    for (std::uint64_t next = 1; next <= 6; ++next) {
        FolderInput input = this->input({7, next, false, {}});
        EXPECT_EQ(restOf(input), all[next]) << next;
    }
}

TEST_F(FolderInputTest, OldFramesOfTheRecordingBeforeAreGivenOnRequest) {
    recorder_.begin(7, 1);
    recorder_.frames(1);
    recorder_.finish();
    recorder_.begin(7, 2);
    recorder_.frames(2);
    FolderInput input = this->input({7, 3, false, {}}, Before::recording);
    EXPECT_EQ(restOf(input), "(7/1:00010001) (7/2:00010002) 7/3:00010003");
}

TEST_F(FolderInputTest, ARunEndsWhereAnotherOneBegins) {
    FolderInput input = this->input();
    recorder_.begin(7, 1);
    recorder_.frames(1);
    recorder_.finish();
    EXPECT_EQ(restOf(input), "7/1:00010001");
    recorder_.begin(9, 1);
    recorder_.frames(1);
    EXPECT_EQ(restOf(input), "end@2 9/1:00010001");
    FolderInput anew = this->input({7, 2, true, {}});
    EXPECT_EQ(restOf(anew), "(7/1:00010001) 9/1:00010001") << "its end was shipped before";
}

TEST_F(FolderInputTest, FramesThatWereNotRecordedAreAGap) {
    FolderInput input = this->input();
    recorder_.begin(7, 1);
    recorder_.frames(1);
    recorder_.finish();
    recorder_.begin(7, 5);
    recorder_.frames(1);
    EXPECT_EQ(restOf(input), "7/1:00010001 gap=2-4 7/5:00010005");
}

TEST_F(FolderInputTest, ARecordingThatWasRemovedUnreadIsAGap) {
    recorder_.begin(7, 1);
    recorder_.frames(1);
    recorder_.finish();
    recorder_.begin(7, 2);
    recorder_.frames(2);
    recorder_.finish();
    recorder_.begin(7, 4);
    recorder_.frames(1);
    recorder_.remove(1);
    FolderInput input = this->input();
    EXPECT_EQ(restOf(input), "7/1:00010001 gap=2-3 7/4:00010004");
}

TEST_F(FolderInputTest, TheEndOfARunThatWasRemovedIsAGapOfUnknownSize) {
    recorder_.begin(7, 1);
    recorder_.frames(1);
    recorder_.finish();
    recorder_.begin(7, 2);
    recorder_.frames(1);
    recorder_.finish();
    recorder_.remove(0);
    recorder_.begin(9, 1);
    recorder_.frames(1);
    FolderInput input = this->input();
    EXPECT_EQ(restOf(input), "7/1:00010001 end@2+gap 9/1:00010001");
}

TEST_F(FolderInputTest, ARunOfWhichNoRecordingIsLeftEndsInAGap) {
    recorder_.begin(9, 1);
    recorder_.frames(1);
    FolderInput input = this->input({7, 5, false, {}});
    EXPECT_EQ(restOf(input), "end@5+gap 9/1:00010001");
}

TEST_F(FolderInputTest, RecordingsThatWereRemovedBeforeTheFirstStartAreAGap) {
    recorder_.begin(7, 100);
    recorder_.frames(1);
    FolderInput input = this->input();
    EXPECT_EQ(restOf(input), "gap=1-99 7/100:00010064");
}

TEST_F(FolderInputTest, WhatAKilledRecorderHasLeftOfAFrameIsSaidAndHasNoNumber) {
    FolderInput input = this->input();
    recorder_.begin(7, 1);
    recorder_.frames(1);
    EXPECT_EQ(restOf(input), "7/1:00010001");
    recorder_.tear();
    recorder_.begin(7, 2);
    recorder_.frames(1);
    const std::string rest = restOf(input);
    EXPECT_TRUE(rest.starts_with("(7/1:00010001) ")) << rest << ": the file is read once more";
    EXPECT_NE(rest.find("=0 7/2:00010002"), std::string::npos) << rest;
    EXPECT_EQ(rest.find("7/3"), std::string::npos) << rest;
}

// The reader looks while the torn frame is in the file, and again while the file is cut back and has its name
// of an unfinished file, or only when it has the name of a finished one.
TEST_F(FolderInputTest, AFileThatIsCutBackUnderTheReaderIsNeitherDamageNorAnotherFile) {
    for (const bool looksBehindTheCut : {true, false}) {
        fleet_tests::Folder folder;
        fleet_tests::Recordings recorder{folder.path()};
        FolderInput input{folder.path(), "pri1", {}, Before::nothing};
        recorder.begin(7, 1);
        recorder.frames(2);
        EXPECT_EQ(restOf(input), "7/1:00010001 7/2:00010002");
        std::string seen;
        const auto look = [&] { seen += restOf(input) + ";"; };
        recorder.runOutOfRoom(look, [&] {
            if (looksBehindTheCut)
                look();
        });
        look();
        const std::string old = "(7/1:00010001) (7/2:00010002);";
        EXPECT_EQ(seen, looksBehindTheCut ? ";" + old + ";" : ";" + old);
        recorder.begin(7, 4);
        recorder.lost(1);
        recorder.frames(1);
        EXPECT_EQ(restOf(input), "gap=3-3 frames-lost=1 7/4:00010004");
    }
}

TEST_F(FolderInputTest, AFileThatIsNoRecordingIsSaidAndItsFramesAreAGap) {
    recorder_.begin(7, 1);
    recorder_.frames(2);
    recorder_.finish();
    std::ofstream(folder_.file("pri1.20261121T000000Z.pcapng"), std::ios::trunc)
        << "nothing of the kind\n\n\n";
    recorder_.begin(7, 3);
    recorder_.frames(1);
    FolderInput input = this->input();
    fleet::InputEvent event;
    EXPECT_THROW(input.next(event), capture::BadInput);
    EXPECT_EQ(restOf(input), "gap=1-2 7/3:00010003");
}

TEST_F(FolderInputTest, AStateThatIsDamagedIsSaidAndReadAgainLater) {
    std::ofstream(folder_.file("pri1.state.json")) << "{";
    FolderInput input = this->input();
    fleet::InputEvent event;
    EXPECT_THROW(input.next(event), capture::BadInput);
    recorder_.begin(7, 1);
    recorder_.frames(1);
    EXPECT_EQ(restOf(input), "7/1:00010001");
}

}  // namespace
