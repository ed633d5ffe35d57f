// Finds out what the earlier frames say about a frame: its number, our side's role, the state of its link.
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
    // A role or a variant in the options replaces those of the frames.
    explicit Tracker(const InputOptions& options) : role_(options.role), variant_(options.variant) {}

    // From now on, says once if frames are `done` ("decoded") by a variant that nobody has named.
    void tellGuessedVariant(Chatter& chatter, std::string_view done) {
        chatter_ = &chatter;
        done_ = done;
    }

    // From now on only numbers frames. Following the links takes time, and not every command needs it.
    void leaveLinksAlone() { followsLinks_ = false; }
    bool followsLinks() const { return followsLinks_; }

    // How many frames have been numbered.
    std::uint64_t frames() const { return frames_; }
    // Whether an item has come from a D channel of this name.
    bool knows(const std::string& dChannel) const { return channels_.contains(dChannel); }

    // Numbers the item and follows its link. `seen` must be a newly made object. Does not read the headers of
    // the frame; readHeaders does, on the thread that needs them.
    void see(const capture::Item& item, Seen& seen);
    Seen see(const capture::Item& item) {
        Seen seen;
        see(item, seen);
        return seen;
    }

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
    Channels::value_type* last_ = nullptr;  // the channel of the last item
    Chatter* chatter_ = nullptr;            // null if nothing has to be said any more
    std::string_view done_;
};

// Reads the link header and the message from the frame's octets.
void readHeaders(Seen& seen);

}  // namespace reader

#endif
