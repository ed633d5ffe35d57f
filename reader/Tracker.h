// What the frames before it say about a frame: its number, our side's role, the state of its link.
#ifndef READER_TRACKER_H
#define READER_TRACKER_H

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>

#include "calls/ChannelClock.h"
#include "calls/DChannel.h"
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

    // From now on frames are numbered and nothing else: links take time, and not every command asks for them.
    void leaveLinksAlone() { followsLinks_ = false; }
    bool followsLinks() const { return followsLinks_; }

    // How many have been numbered.
    std::uint64_t frames() const { return frames_; }
    // Whether something has come from a D channel of this name.
    bool knows(const std::string& dChannel) const { return channels_.contains(dChannel); }

    // The headers themselves are left to whoever looks at the frame, see readHeaders.
    Seen see(const capture::Item& item);

  private:
    struct Channel {
        Channel(const calls::Timers& timers, capture::Role role) : links(timers, role) {}
        calls::DChannel links;
        calls::ChannelClock clock;
        Instant last;
    };

    capture::Variant variantOf(const capture::Item& item);
    Channel& channelOf(const capture::Frame& frame);
    void tellTime(Channel& channel, Seen& seen);
    static void follow(Channel& channel, Seen& seen);

    capture::Role role_;
    capture::Variant variant_;
    bool followsLinks_ = true;
    std::uint64_t frames_ = 0;
    std::optional<std::int64_t> first_;  // on the clocks of the D channels
    using Channels = std::map<std::string, Channel, std::less<>>;
    Channels channels_;                     // by the name of the D channel
    Channels::value_type* last_ = nullptr;  // that of the last item
    Chatter* chatter_ = nullptr;            // null once the guess was told, or if it need not be
    std::string_view done_;
};

// Reads link header and message of the octets as they stand now.
void readHeaders(Seen& seen);

}  // namespace reader

#endif
