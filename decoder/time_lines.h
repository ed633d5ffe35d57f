// The two lines that begin a frame's text: when it was written down, and when it passed on the board's clock.
#ifndef DECODER_TIME_LINES_H
#define DECODER_TIME_LINES_H

#include <array>
#include <ctime>
#include <string_view>

namespace decoder {

// Composes the empty line and both time lines, and sets `flag` for the lines that follow. `localTime` is a
// LocalTime's text; the time stamp counts 4 ms. Milliseconds have no leading zeros.
void timeLines(bool transmitted, unsigned int timestamp, std::string_view localTime);

// Seconds since 1970 as local time. Frames of one second share the text, whose making takes as long as the
// decoding of a frame. Used by one thread at a time.
class LocalTime {
  public:
    // The C library's form of 24 characters and a line end; a line end alone for a year beyond its reach.
    // Valid until the next call.
    std::string_view of(std::time_t second);

  private:
    std::time_t shown_ = -1;
    long shownZone_ = 0;
    std::array<char, 26> text_{};
};

}  // namespace decoder

#endif
