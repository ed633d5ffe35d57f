// The lines of a source.
#ifndef CAPTURE_LINES_H
#define CAPTURE_LINES_H

#include <cstdint>
#include <string_view>

#include "capture/Source.h"

namespace capture {

// Gives one line after another, without line feed and carriage return. A line is valid until the next one is
// asked for.
class Lines {
  public:
    static constexpr std::size_t longest = std::size_t{1} << 20;  // a longer line is given in pieces

    explicit Lines(Source& source) : source_(source) {}

    Source::State next(std::string_view& line);
    std::uint64_t number() const { return number_; }  // the number of the last line, from 1

  private:
    Source& source_;
    std::uint64_t number_ = 0;
    std::size_t toConsume_ = 0;
};

}  // namespace capture

#endif
