// What writers make of items, in memory.
#ifndef TESTS_CAPTURE_WRITING_H
#define TESTS_CAPTURE_WRITING_H

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>

#include <memory>
#include <string>

#include "capture/Writer.h"

namespace capture::testing {

// A file in memory that is written and then read.
class WrittenFile {
  public:
    WrittenFile() : file_(memfd_create("written", MFD_CLOEXEC)) {}
    ~WrittenFile() { ::close(file_); }
    WrittenFile(const WrittenFile&) = delete;
    WrittenFile& operator=(const WrittenFile&) = delete;

    int descriptor() const { return file_; }
    std::string path() const { return "/proc/self/fd/" + std::to_string(file_); }
    std::string content() const {
        std::string all(static_cast<std::size_t>(lseek(file_, 0, SEEK_END)), '\0');
        EXPECT_EQ(pread(file_, all.data(), all.size(), 0), static_cast<ssize_t>(all.size()));
        return all;
    }

  private:
    int file_;
};

// A frame for tests; the octets stay the caller's.
inline Item frameOf(const Interface& interface, bool transmitted, std::int64_t time,
                    std::span<const std::uint8_t> octets) {
    Item item;
    item.frame.interface = &interface;
    item.frame.transmitted = transmitted;
    item.frame.clock = Clock::absolute;
    item.frame.time = time;
    item.frame.octets = octets;
    return item;
}

inline Item itemOf(const Interface& interface, Item::Kind kind, std::uint64_t count = 0,
                   std::string_view text = {}) {
    Item item;
    item.kind = kind;
    item.count = count;
    item.text = text;
    item.frame.interface = &interface;
    return item;
}

}  // namespace capture::testing

#endif
