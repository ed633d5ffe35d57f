// Records what happened to the links of call control, and the present state of each.
#ifndef CALLS_LINKHISTORY_H
#define CALLS_LINKHISTORY_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

#include "calls/Call.h"
#include "calls/Link.h"
#include "isdn/Layer2.h"

namespace calls {

enum class LinkNews : std::uint8_t {
    started,  // the recorder or the board was started
    lost,     // the recorder says that frames are missing
    pollUnanswered,
    rejected,  // FRMR
    down,      // by DM, or by the answer to DISC
    released,  // DISC
    asked,     // SABME
    up,        // by UA
    unseen     // numbers began again: the link was set up, but the trace does not show it
};
inline constexpr std::size_t linkNewsKinds = 9;
// "up", "SABME", "poll unanswered".
std::string_view nameOf(LinkNews news);

// Takes frames, and what they mean for their links. Memory is bounded.
class LinkHistory {
  public:
    struct Entry {
        LinkNews news;
        std::string dChannel;
        std::optional<std::uint8_t> tei{};  // empty: all links of the D channel
        std::optional<Side> from{};         // who sent the frame that shows it
        Moment moment;
    };
    struct Standing {
        LinkState state = LinkState::unknown;
        Moment since{};           // when the state was entered
        bool sawSetUp = false;    // of a link that is up; otherwise it is up at least since then
        std::uint64_t ups = 0;    // how often it was set up
        std::uint64_t downs = 0;  // how often it ended, or began anew, while it was up
    };
    using Key = std::pair<std::string, std::uint8_t>;  // D channel and TEI

    // Limits. If there are more entries, the oldest is dropped. Further links are ignored.
    static constexpr std::size_t mostEntries = 2000;
    static constexpr std::size_t mostLinks = 1000;

    void take(const std::string& dChannel, const isdn::Layer2& frame, Side from, const Marks& marks,
              const Moment& moment);
    // The recorder says something between frames.
    void note(const std::string& dChannel, LinkNews news, const Moment& moment);

    const std::deque<Entry>& entries() const { return entries_; }
    // How many entries were dropped.
    std::uint64_t gone() const { return gone_; }
    // How often the recorder said that frames are missing.
    std::uint64_t losses() const { return losses_; }
    const std::map<Key, Standing>& links() const { return links_; }

  private:
    void add(Entry entry);
    void enter(const std::string& dChannel, std::uint8_t tei, const Marks& marks, const Moment& moment);

    std::deque<Entry> entries_;
    std::uint64_t gone_ = 0;
    std::uint64_t losses_ = 0;
    std::map<Key, Standing> links_;
};

}  // namespace calls

#endif
