// Counts how often something happened in the last minute.
#ifndef READER_BROWSE_PERMINUTE_H
#define READER_BROWSE_PERMINUTE_H

#include <array>
#include <cstdint>
#include <numeric>

#include "calls/Message.h"

namespace reader::browse {

// Times are nanoseconds on a clock that never goes back.
class PerMinute {
  public:
    void count(std::int64_t at) {
        moveTo(at);
        ++counts_[static_cast<std::size_t>(second_ % seconds)];
    }
    // How often it happened in the minute that ends at `at`, to a second.
    std::uint64_t upTo(std::int64_t at) {
        moveTo(at);
        return std::accumulate(counts_.begin(), counts_.end(), std::uint64_t{0});
    }

  private:
    static constexpr std::int64_t seconds = 60;

    void moveTo(std::int64_t at) {
        const std::int64_t second = at < 0 ? 0 : at / calls::second;
        if (second - second_ >= seconds)
            counts_ = {};
        else
            for (std::int64_t i = second_ + 1; i <= second; ++i)
                counts_[static_cast<std::size_t>(i % seconds)] = 0;
        second_ = second > second_ ? second : second_;
    }

    std::array<std::uint64_t, seconds> counts_{};
    std::int64_t second_ = 0;
};

}  // namespace reader::browse

#endif
