// A file in memory, for readers that want a path.
#ifndef TESTS_FUZZ_FILE_H
#define TESTS_FUZZ_FILE_H

#include <sys/mman.h>
#include <unistd.h>

#include <string>

#include "tests/fuzz/fuzz.h"

namespace fuzz {

class File {
  public:
    File() : descriptor_(memfd_create("fuzz", MFD_CLOEXEC)) { require(descriptor_ >= 0, "a file in memory"); }
    ~File() { close(descriptor_); }
    File(const File&) = delete;
    File& operator=(const File&) = delete;

    // Puts these octets in place of what it held.
    void hold(const std::uint8_t* data, std::size_t size) {
        const bool written = ftruncate(descriptor_, 0) == 0 &&
                             pwrite(descriptor_, data, size, 0) == static_cast<ssize_t>(size);
        require(written, "a file in memory");
    }
    // For writing from its beginning.
    void empty() const {
        require(ftruncate(descriptor_, 0) == 0 && lseek(descriptor_, 0, SEEK_SET) == 0, "a file in memory");
    }
    int descriptor() const { return descriptor_; }
    std::string path() const { return "/proc/self/fd/" + std::to_string(descriptor_); }

  private:
    int descriptor_;
};

}  // namespace fuzz

#endif
