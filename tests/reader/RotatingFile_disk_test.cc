// Recordings on a disk that becomes full. It is a small tmpfs, which only root can make.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/mount.h>
#include <unistd.h>

#include <array>
#include <filesystem>
#include <fstream>
#include <memory>
#include <span>
#include <string>

#include "capture/writers.h"
#include "reader/RecordedTrunk.h"
#include "reader/RotatingFile.h"
#include "reader/inputs.h"

namespace reader {
namespace {

// Whether a flush has failed when a part of it was in the file.
bool wasTorn = false;

class WatchedWriter : public capture::Writer {
  public:
    WatchedWriter(int file, const std::string& name)
        : file_(file), writer_(capture::makePcapngWriter(file, name)) {}

    void write(const capture::Item& item) override { writer_->write(item); }
    void flush() override {
        const off_t before = size();
        try {
            writer_->flush();
        } catch (const capture::WriteError&) {
            wasTorn = wasTorn || size() > before;
            throw;
        }
    }
    void finish() override { writer_->finish(); }

  private:
    off_t size() const { return lseek(file_, 0, SEEK_END); }

    int file_;
    std::unique_ptr<capture::Writer> writer_;
};

class RotatingFileOnAFullDisk : public ::testing::Test {
  protected:
    static constexpr std::size_t diskSize = 1U << 20U;

    void SetUp() override {
        wasTorn = false;
        const auto* const test = ::testing::UnitTest::GetInstance()->current_test_info();
        disk_ = std::filesystem::path(::testing::TempDir()) /
                ("disk." + std::to_string(getpid()) + "." + test->name());
        std::filesystem::create_directories(disk_);
        isMounted_ = mount("none", disk_.c_str(), "tmpfs", 0, "size=1m") == 0;
        if (!isMounted_)
            GTEST_SKIP() << "only root can make a disk that is small enough";
        form_.makeWriter = [](int file, const std::string& name) -> std::unique_ptr<capture::Writer> {
            return std::make_unique<WatchedWriter>(file, name);
        };
        rules_.folder = disk_;
        rules_.form = &form_;
    }
    void TearDown() override {
        if (isMounted_)
            umount2(disk_.c_str(), MNT_DETACH);
        std::filesystem::remove_all(disk_);
    }

    // A frame of so many octets.
    capture::Item frame(std::size_t size) const {
        static const std::array<std::uint8_t, 300> octets{};
        capture::Item item;
        item.frame.octets = std::span(octets).first(size);
        item.frame.interface = &interface_;
        item.frame.clock = capture::Clock::absolute;
        item.frame.time = 1'795'260'333'000'000'000;  // 2026-11-21 11:25:33 UTC
        return item;
    }

    std::size_t room() const { return std::filesystem::space(disk_).available; }

    // Leaves so much room.
    void fillBut(std::size_t left) {
        std::ofstream(disk_ / ("ballast." + std::to_string(++ballast_))) << std::string(room() - left, 'x');
        ASSERT_EQ(room(), left);
    }

    std::filesystem::path disk_;
    bool isMounted_ = false;
    int ballast_ = 0;
    capture::Interface interface_{"t", capture::Variant::net5};
    Form form_ = formNamed("pcapng");
    RotationRules rules_;
    Chatter chatter_{Loudness::quiet};
};

// A reader that follows the file may take what is there for good.
TEST_F(RotatingFileOnAFullDisk, HasNothingInItThatIsCutOffAgain) {
    RotatingFile file(rules_, "t", chatter_);
    for (int i = 0; file.lostInAll() == 0 && i < 100'000; ++i) {
        for (int frames = 0; frames < 3; ++frames)
            file.write(frame(17 + i % 40));
        file.flush();
    }
    EXPECT_EQ(file.lostInAll(), 3U);
    EXPECT_FALSE(wasTorn);
    const auto size = std::filesystem::file_size(disk_ / "t.20261121T112533Z.pcapng");
    EXPECT_GT(size, 900'000U);
    EXPECT_GT(room() + size + 8192, diskSize) << "what was reserved behind its end is free again";
}

TEST_F(RotatingFileOnAFullDisk, UsesWhatRoomThereIsAndEndsWithoutAny) {
    constexpr std::size_t page = 4096;
    RotatingFile file(rules_, "t", chatter_);
    fillBut(2 * page);
    file.write(frame(5));
    file.flush();
    fillBut(0);
    file.finish();
    EXPECT_EQ(file.lostInAll(), 0U);
    const auto reader = openFile(disk_ / "t.20261121T112533Z.pcapng", {});
    capture::Item item;
    EXPECT_EQ(reader->next(item), capture::Reader::Next::item);
    EXPECT_EQ(item.frame.octets.size(), 5U);
    EXPECT_EQ(reader->next(item), capture::Reader::Next::end);
}

// A recorder that is killed cannot give back what it has reserved.
TEST_F(RotatingFileOnAFullDisk, GivesBackWhatAKilledRecorderHasReserved) {
    const std::string part = disk_ / "t.20261121T112533Z.pcapng.part";
    const int left = open(part.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0666);
    ASSERT_EQ(fallocate(left, FALLOC_FL_KEEP_SIZE, 0, diskSize / 2), 0);
    close(left);
    EXPECT_LE(room(), diskSize / 2);
    RecordRules rules{rules_, {0, 0, rules_}};
    const RecordedTrunk trunk(rules, "t", chatter_);
    EXPECT_GT(room(), diskSize / 2);
}

}  // namespace
}  // namespace reader
