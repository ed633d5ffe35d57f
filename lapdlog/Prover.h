// Finds the frame that a piece of the log shows, and proves that it is the right one.
#ifndef LAPDLOG_PROVER_H
#define LAPDLOG_PROVER_H

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "capture/Frame.h"
#include "lapdlog/headers.h"

namespace lapdlog {

// A frame is proved when decoding the octets of its dump gives exactly the text of the log. The text of a
// display element may hold anything, even something that looks like a dump. So the prover tries each dump in
// the text, and takes the first that proves it. Changes the decoder's variables (decoder/state.h) of the
// thread that calls it.
class Prover {
  public:
    struct Proof {
        Reading reading = Reading::bad;  // `cut` means that more text could still complete the proof
        bool isOversized = false;
        bool isDoubtful = false;   // the text ends where another line of the dump could follow
        bool sawDump = false;      // a whole dump was seen
        std::size_t size = 0;      // octets of the text that the frame takes, if it is proved
        std::size_t untitled = 0;  // no title of a dump begins before this place
        // The frame's octets, valid until the next call. If nothing was proved, the octets of the dump in
        // which the text ends.
        std::span<const std::uint8_t> octets;
    };

    // `text` begins after the time lines. `isAll`: no more text will come. `untitled`: an earlier proof has
    // found that no title of a dump begins before this place.
    Proof prove(std::string_view text, bool transmitted, capture::Variant variant, bool isAll,
                std::size_t untitled = 0);

  private:
    enum class Dump : std::uint8_t { whole, wholeSoFar, cut, bad };

    Dump readDump(std::string_view text, std::size_t& at, bool transmitted);
    std::string_view decode(bool transmitted, capture::Variant variant);

    std::vector<std::uint8_t> octets_;
};

}  // namespace lapdlog

#endif
