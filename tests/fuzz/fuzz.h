// What the fuzz targets share. A target takes any octets and returns; whatever else it does (a crash, a hang,
// a leak, a broken promise) is a find.
#ifndef TESTS_FUZZ_FUZZ_H
#define TESTS_FUZZ_FUZZ_H

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <string>
#include <string_view>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace fuzz {

using Octets = std::vector<std::uint8_t>;

// A promise of the code under test.
inline void require(bool holds, std::string_view promise) {
    if (holds)
        return;
    (void)std::fprintf(stderr, "broken promise: %.*s\n", static_cast<int>(promise.size()), promise.data());
    std::abort();
}

// The input, octet by octet.
class Input {
  public:
    Input(const std::uint8_t* data, std::size_t size) : rest_(data, data + size) {}

    // 0 at the end.
    std::uint8_t octet() {
        if (at_ == rest_.size())
            return 0;
        return rest_[at_++];
    }
    bool atEnd() const { return at_ == rest_.size(); }
    Octets rest() const { return {rest_.begin() + static_cast<std::ptrdiff_t>(at_), rest_.end()}; }
    std::string text() const { return {rest_.begin() + static_cast<std::ptrdiff_t>(at_), rest_.end()}; }

  private:
    Octets rest_;
    std::size_t at_ = 0;
};

// Discards what the code under test writes to its streams, because it runs a million times.
static const struct Muted {
    Muted() {
        std::cout.rdbuf(nullptr);
        std::cerr.rdbuf(nullptr);
    }
} muted;  // not inline: the streams must be there before it

}  // namespace fuzz

#endif
