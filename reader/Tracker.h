// What the frames before it say about a frame: its number, our side's role, the state of its link.
#ifndef READER_TRACKER_H
#define READER_TRACKER_H

#include <cstdint>
#include <string_view>

#include "capture/Item.h"
#include "reader/Chatter.h"
#include "reader/Options.h"
#include "reader/Seen.h"

namespace reader {

// Sees every item of a run, in order, before any filter.
class Tracker {
  public:
    // Role and variant of the options hold over those of the frames.
    explicit Tracker(const InputOptions& options) : role_(options.role), variant_(options.variant) {}

    // From now on a variant that neither options nor input name is said to be a guess, once.
    void tellGuessedVariant(Chatter& chatter, std::string_view done) {
        chatter_ = &chatter;
        done_ = done;
    }

    // The headers themselves are left to whoever looks at the frame, see readHeaders.
    Seen see(const capture::Item& item);

    std::uint64_t frames() const { return frames_; }

  private:
    capture::Variant variantOf(const capture::Item& item);

    capture::Role role_;
    capture::Variant variant_;
    std::uint64_t frames_ = 0;
    Instant first_;
    Chatter* chatter_ = nullptr;  // null once the guess was told, or if it need not be
    std::string_view done_;
};

// Reads link header and message of the octets as they stand now.
void readHeaders(Seen& seen);

}  // namespace reader

#endif
