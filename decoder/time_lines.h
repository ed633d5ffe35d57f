// The two lines with which a frame's text begins: the local time at which it is written, and the board's
// time.
#ifndef DECODER_TIME_LINES_H
#define DECODER_TIME_LINES_H

#include <array>
#include <ctime>
#include <string_view>

namespace decoder {

// Composes the empty line and both time lines, and sets `flag` for the lines that follow. `localTime` is the
// text of a LocalTime. The time stamp counts ticks of 4 ms. Milliseconds are written without leading zeros,
// on purpose.
void timeLines(bool transmitted, unsigned int timestamp, std::string_view localTime);

// Makes the text of a local time. Frames of the same half minute share the text but for its seconds, because
// making it takes as long as decoding a frame. Only one thread at a time may use an object.
class LocalTime {
  public:
    // `second` counts from 1970. The text has the C library's form of 24 characters, and a line end. It is
    // only a line end for a year that the C library cannot show. It is valid until the next call.
    std::string_view of(std::time_t second);

  private:
    // Puts the text forward or back within its minute, if that is all that differs.
    bool moveTo(std::time_t second);

    bool hasDate_ = false;
    std::time_t shown_ = 0;
    long shownZone_ = 0;
    std::array<char, 26> text_{};
};

}  // namespace decoder

#endif
