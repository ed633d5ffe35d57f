// Finds the frame that a text of the log shows, and proves it.
#ifndef LAPDLOG_PROVER_H
#define LAPDLOG_PROVER_H

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "capture/Frame.h"
#include "lapdlog/headers.h"

namespace lapdlog {

// A frame is proved when decoding its dump gives the text, octet by octet. Display texts may hold anything,
// also another dump; so the dump is the first one that proves. Uses the decoder's words of its thread.
class Prover {
  public:
    struct Proof {
        Reading reading = Reading::bad;  // cut: more text could still prove
        bool isOversized = false;
        bool isDoubtful = false;   // the text ends where the dump could have another line
        bool sawDump = false;      // a whole one
        std::size_t size = 0;      // of the text, when good
        std::size_t untitled = 0;  // no title of a dump begins before this place
        // Valid until the next call. Of a text that is not proved: those of a dump in which it ends.
        std::span<const std::uint8_t> octets;
    };

    // `text` begins behind the time lines. `isAll`: no more of it will come. `untitled`: no title of a dump
    // begins before this place, as an earlier proof has found.
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
