// A file of this process alone; tests run side by side.
#ifndef TESTS_SOFTBOARD_TEMP_FILE_H
#define TESTS_SOFTBOARD_TEMP_FILE_H

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <string>

namespace softboard {

class TempFile {
  public:
    explicit TempFile(const std::string& suffix)
        : path_(testing::TempDir() + "softboard-" + std::to_string(getpid()) + suffix) {}
    ~TempFile() { std::filesystem::remove(path_); }
    TempFile(const TempFile&) = delete;
    TempFile& operator=(const TempFile&) = delete;

    const std::string& path() const { return path_; }
    // Returns the path.
    const std::string& write(const std::string& octets) const {
        std::ofstream(path_, std::ios::binary) << octets;
        return path_;
    }

  private:
    std::string path_;
};

}  // namespace softboard

#endif
