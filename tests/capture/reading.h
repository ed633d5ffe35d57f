// Reads inputs that tests have in memory, and shows the items that come as text.
#ifndef TESTS_CAPTURE_READING_H
#define TESTS_CAPTURE_READING_H

#include <stdlib.h>
#include <sys/mman.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <string>
#include <string_view>
#include <vector>

#include "capture/open.h"

namespace capture::testing {

using Octets = std::vector<std::uint8_t>;

// A folder of this test alone.
class Folder {
  public:
    Folder() : path_(::testing::TempDir() + "capture-XXXXXX") {
        if (mkdtemp(path_.data()) == nullptr)
            ADD_FAILURE() << path_;
    }
    ~Folder() { std::filesystem::remove_all(path_); }
    Folder(const Folder&) = delete;
    Folder& operator=(const Folder&) = delete;

    std::string operator/(std::string_view name) const { return path_ + "/" + std::string(name); }
    // Returns the path.
    std::string write(std::string_view name, std::string_view content) const {
        std::ofstream(*this / name, std::ios::binary) << content;
        return *this / name;
    }

  private:
    std::string path_;
};

// A file that exists in memory alone.
class MemoryFile {
  public:
    explicit MemoryFile(std::string_view content) : file_(memfd_create("test", MFD_CLOEXEC)) {
        EXPECT_EQ(::write(file_, content.data(), content.size()), static_cast<ssize_t>(content.size()));
    }
    ~MemoryFile() { ::close(file_); }
    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;

    std::string path() const { return "/proc/self/fd/" + std::to_string(file_); }

  private:
    int file_;
};

inline std::string hexOf(std::span<const std::uint8_t> octets) {
    std::string text;
    for (const std::uint8_t octet : octets) {
        constexpr std::string_view digits = "0123456789abcdef";
        text += {digits[octet >> 4U], digits[octet & 15U]};
    }
    return text;
}

// "frame 3 TX user 1000.5 t75 0001 7f": kind, number of the place, and what is known.
inline std::string shown(const Item& item) {
    constexpr const char* kinds[] = {"frame",    "oversized", "cut",     "lost",    "notQueued",
                                     "notTaken", "dropped",   "run",     "restart", "replaced",
                                     "mixed",    "unproved",  "damaged", "comment"};
    const Frame& frame = item.frame;
    std::string text =
        std::string(kinds[static_cast<std::size_t>(item.kind)]) + " " + std::to_string(frame.place.number);
    if (item.kind <= Item::Kind::cut) {
        text += frame.transmitted ? " TX" : " RX";
        text += frame.role == Role::user ? " user" : frame.role == Role::network ? " network" : "";
        if (frame.clock != Clock::none)
            text +=
                (frame.clock == Clock::relative ? " +" : " ") + std::to_string(frame.time / 1'000'000) + "ms";
        if (frame.ticks)
            text += " t" + std::to_string(*frame.ticks);
        if (frame.written)
            text += " w" + std::to_string(*frame.written);
        text += " " + hexOf(frame.octets);
    }
    if (item.kind == Item::Kind::run)
        text += " " + std::string(variantName(frame.interface->variant));
    if (item.count != 0)
        text += " x" + std::to_string(item.count);
    if (!item.text.empty())
        text += " \"" + std::string(item.text) + "\"";
    return text + "\n";
}

// All items to the end, or to the first pause.
inline std::string itemsOf(Reader& reader) {
    std::string text;
    Item item;
    while (reader.next(item) == Reader::Next::item)
        text += shown(item);
    return text;
}

// Also what it throws: "! ...", with the path left out.
inline std::string itemsIn(const std::string& path, const ReadOptions& options = {},
                           std::span<const Form> known = forms()) {
    try {
        return itemsOf(*openReader(path, options, known));
    } catch (const BadInput& bad) {
        const std::string what = bad.what();
        return "!" + (what.starts_with(path) ? what.substr(path.size()) : what) + "\n";
    }
}

}  // namespace capture::testing

#endif
