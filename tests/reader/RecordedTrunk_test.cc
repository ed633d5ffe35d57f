#include "reader/RecordedTrunk.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <filesystem>
#include <fstream>
#include <string>
#include <utility>
#include <vector>

#include "capture/writers.h"
#include "reader/inputs.h"

namespace reader {
namespace {

namespace fs = std::filesystem;
using Kind = capture::Item::Kind;

// Whether the disk of the recordings is full. That of the state has room.
bool full = false;

class PcapngOnADisk : public capture::Writer {
  public:
    PcapngOnADisk(int file, const std::string& name) : writer_(capture::makePcapngWriter(file, name)) {}

    void write(const capture::Item& item) override { writer_->write(item); }
    void flush() override {
        failIfFull();
        writer_->flush();
    }
    void finish() override {
        failIfFull();
        writer_->finish();
    }

  private:
    static void failIfFull() {
        if (full)
            throw capture::WriteError("no room", ENOSPC);
    }

    std::unique_ptr<capture::Writer> writer_;
};

std::unique_ptr<capture::Writer> makeWriter(int file, const std::string& name) {
    return std::make_unique<PcapngOnADisk>(file, name);
}

// A form as pcapng, but for what the disk does.
Form formOnADisk() {
    Form form = formNamed("pcapng");
    form.makeWriter = makeWriter;
    return form;
}

class RecordedTrunkTest : public ::testing::Test {
  protected:
    void SetUp() override {
        full = false;
        const auto* const test = ::testing::UnitTest::GetInstance()->current_test_info();
        folder_ = fs::path(::testing::TempDir()) / ("trunk." + std::to_string(getpid()) + "." + test->name());
        fs::create_directories(folder_ / "kept");
        log_ = folder_ / "t.log";
        std::ofstream(log_) << "a file that the items are said to come from";
        rules_.files.folder = folder_;
        rules_.files.form = &form_;
        rules_.surroundings.files.folder = folder_ / "kept";
        rules_.surroundings.files.form = &form_;
        rules_.surroundings.files.mark = "kept";
    }
    void TearDown() override { fs::remove_all(folder_); }

    // Frame `number` of the log: one octet, its number, and a second of its own.
    void take(RecordedTrunk& trunk, int first, int last) {
        for (int number = first; number <= last; ++number) {
            const std::array<std::uint8_t, 1> octets{static_cast<std::uint8_t>(number)};
            capture::Item item = this->item(number);
            item.frame.octets = octets;
            trunk.take(item);
        }
        trunk.flush();
    }

    capture::Item item(int second, Kind kind = Kind::frame) {
        constexpr std::int64_t november = 1'795'260'333;  // 2026-11-21 11:25:33 UTC
        capture::Item item;
        item.kind = kind;
        item.frame.interface = &interface_;
        item.frame.clock = capture::Clock::absolute;
        item.frame.time = (november + second) * 1'000'000'000;
        item.frame.place = {log_, 1, capture::Place::Unit::line};
        return item;
    }

    recording::RecordState state() const {
        return recording::readState(recording::statePath(folder_, "t")).value();
    }
    void setState(const recording::RecordState& state) const {
        ASSERT_EQ(recording::writeState(state, recording::statePath(folder_, "t")), std::nullopt);
    }

    // "1 2 | lost 1 | 4": the recordings that the state lists, each with the number that it should begin with
    // in front, "4:", unless that is its first frame; with a "?" if it is not there.
    std::string recorded() const {
        std::string all;
        for (const recording::RecordedFile& file : state().files) {
            all += all.empty() ? "" : " | ";
            const fs::path path = folder_ / file.name;
            all += std::to_string(file.first) + ":" + (fs::exists(path) ? textOf(path) : "?");
        }
        return all;
    }

    static std::string textOf(const fs::path& path) {
        std::string text;
        const std::unique_ptr<capture::Reader> reader = openFile(path, {});
        for (capture::Item item; reader->next(item) == capture::Reader::Next::item;) {
            text += " ";
            text += item.isFrame()
                        ? std::to_string(item.frame.octets[0])
                        : std::string(capture::kindName(item.kind)) + "=" + std::to_string(item.count);
        }
        return text;
    }

    fs::path folder_;
    std::string log_;
    capture::Interface interface_{"t", capture::Variant::net5};
    Form form_ = formOnADisk();
    RecordRules rules_;
    Chatter chatter_{Loudness::quiet};
};

TEST_F(RecordedTrunkTest, AFileIsListedBeforeAnythingIsInIt) {
    RecordedTrunk trunk(rules_, "t", chatter_);
    trunk.take(item(1));
    const recording::RecordState state = this->state();
    ASSERT_EQ(state.files.size(), 1U);
    EXPECT_EQ(state.files[0].first, 1U);
    EXPECT_EQ(state.next, 1U);
    EXPECT_EQ(fs::file_size(folder_ / (state.files[0].name + ".part")), 0U);
}

TEST_F(RecordedTrunkTest, AFileInWhichNothingCouldBeWrittenIsNotListed) {
    RecordedTrunk trunk(rules_, "t", chatter_);
    full = true;
    take(trunk, 1, 2);
    trunk.finish();
    EXPECT_EQ(recorded(), "");
    EXPECT_EQ(state().next, 3U);
}

TEST_F(RecordedTrunkTest, WhatAFullDiskHadNoRoomForIsRecordedByTheNextRecorderIfTheLogStillHasIt) {
    for (const bool isKilled : {true, false}) {
        SetUp();
        {
            RecordedTrunk trunk(rules_, "t", chatter_);
            take(trunk, 1, 3);
            full = true;
            take(trunk, 4, 5);
            if (!isKilled)
                trunk.finish();
        }
        EXPECT_EQ(recorded(), "1: 1 2 3");
        full = false;
        RecordedTrunk trunk(rules_, "t", chatter_);
        take(trunk, 1, 6);
        trunk.finish();
        EXPECT_EQ(recorded(), "1: 1 2 3 | 4: 4 5 6");
        EXPECT_EQ(state().next, 7U);
        TearDown();
    }
}

TEST_F(RecordedTrunkTest, AStateThatCouldNotBeWrittenOnAFullDiskDoublesNothing) {
    recording::RecordState older;
    {
        RecordedTrunk trunk(rules_, "t", chatter_);
        take(trunk, 1, 1);
        older = state();
        take(trunk, 2, 3);
        full = true;
        take(trunk, 4, 5);
    }
    setState(older);
    full = false;
    RecordedTrunk trunk(rules_, "t", chatter_);
    take(trunk, 1, 6);
    trunk.finish();
    EXPECT_EQ(recorded(), "1: 1 2 3 | 4: 4 5 6");
}

// Such a recorder goes on without being started anew.
TEST_F(RecordedTrunkTest, ARecorderThatLivesOnLeavesOutWhatWasLostAndTellsIt) {
    RecordedTrunk trunk(rules_, "t", chatter_);
    trunk.retryEvery(std::chrono::seconds(0));
    take(trunk, 1, 3);
    full = true;
    take(trunk, 4, 5);
    full = false;
    take(trunk, 6, 6);
    trunk.finish();
    EXPECT_EQ(recorded(), "1: 1 2 3 | 6: frames-lost=2 6");
}

TEST_F(RecordedTrunkTest, ALossIsToldThoughTheFileThatBeganWithItIsGone) {
    RecordedTrunk trunk(rules_, "t", chatter_);
    trunk.retryEvery(std::chrono::seconds(0));
    take(trunk, 1, 1);
    full = true;
    take(trunk, 2, 3);  // 2 fails in the first file
    full = false;
    trunk.take(item(4));  // begins a file with the loss of 2 and 3, and waits
    full = true;
    trunk.flush();
    full = false;
    take(trunk, 5, 5);
    trunk.finish();
    EXPECT_EQ(recorded(), "1: 1 | 5: frames-lost=3 5");
}

TEST_F(RecordedTrunkTest, AFormWithoutFramesThatAreTooLongShowsOnlyTheLeastThatWasRecorded) {
    form_ = formNamed("pcap");
    for (const int restarts : {1, 2}) {
        RecordedTrunk trunk(rules_, "t", chatter_);
        take(trunk, 1, 1);
        trunk.take(item(2, Kind::oversized));
        take(trunk, 3, 2 + restarts);
        trunk.finish();
    }
    EXPECT_EQ(recorded(), "1: 1 3 | 4: 4");
    form_ = formOnADisk();  // the form of the next recordings tells nothing of the newest one
    RecordedTrunk trunk(rules_, "t", chatter_);
    take(trunk, 1, 1);
    trunk.take(item(2, Kind::oversized));
    take(trunk, 3, 5);
    trunk.finish();
    EXPECT_EQ(recorded(), "1: 1 3 | 4: 4 | 5: 5");
}

// pcapng writes what is no frame with the frame behind it, so a recorder that is killed has not written it
// yet.
TEST_F(RecordedTrunkTest, WhatWasSaidBehindTheLastFrameOutlivesAKilledRecorder) {
    const fs::path killed = folder_ / "killed";
    {
        RecordedTrunk trunk(rules_, "t", chatter_);
        trunk.writeStateEvery(std::chrono::seconds(0));
        take(trunk, 1, 1);
        trunk.take(item(1, Kind::notQueued));
        trunk.flush();
        EXPECT_EQ(state().besides, 1U);
        fs::create_directory(killed);
        for (const auto& entry : fs::directory_iterator(folder_)) {
            if (entry.is_regular_file())
                fs::copy_file(entry.path(), killed / entry.path().filename());
        }
    }
    rules_.files.folder = folder_ = killed;
    RecordedTrunk trunk(rules_, "t", chatter_);
    take(trunk, 1, 1);
    trunk.take(item(1, Kind::notQueued));
    take(trunk, 2, 2);
    trunk.finish();
    EXPECT_EQ(recorded(), "1: 1 | 2: not-queued=0 2");
    folder_ = killed.parent_path();
}

}  // namespace
}  // namespace reader
