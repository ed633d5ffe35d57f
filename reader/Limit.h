// Applies --first and --not --first to calls and findings, which commands count themselves.
#ifndef READER_LIMIT_H
#define READER_LIMIT_H

#include <cstdint>

#include "reader/Options.h"

namespace reader {

class Limit {
  public:
    explicit Limit(const Options& options) : skipped_(options.skipped), most_(options.first) {}

    // Counts one more, and returns whether it is wanted: not among those that are skipped at the beginning,
    // and not after the last that is wanted.
    bool takeOne() {
        if (skipped_ != 0) {
            --skipped_;
            return false;
        }
        if (most_ != 0 && taken_ == most_)
            return false;
        ++taken_;
        return true;
    }
    // How many were wanted so far.
    std::uint64_t taken() const { return taken_; }

  private:
    std::uint64_t skipped_;
    std::uint64_t most_;  // 0: all
    std::uint64_t taken_ = 0;
};

}  // namespace reader

#endif
