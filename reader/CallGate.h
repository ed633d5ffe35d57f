// Lets through the frames of the calls that are wanted, for commands that show frames.
#ifndef READER_CALLGATE_H
#define READER_CALLGATE_H

#include <cstdint>
#include <deque>
#include <map>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "calls/Analysis.h"
#include "reader/CallFilter.h"
#include "reader/Feed.h"

namespace reader {

// A frame belongs to the call whose message it carries; all other items belong to none. Frames are held until
// it is known whether their call is wanted. Used on the thread that reads.
class CallGate : private calls::Listener {
  public:
    enum class Order {
        ofInput,    // a frame that is held holds up all that come after it
        ofDecision  // the frames of a call come together, as soon as it is known that it is wanted
    };
    // At most so many frames are held. Then the oldest frame of an undecided call is dropped and counted.
    static constexpr std::size_t mostHeld = 100'000;

    // The filter must outlive this. `most` is for tests.
    CallGate(const CallFilter& filter, const calls::Options& options, Order order,
             std::size_t most = mostHeld);

    // Takes the next item. If it does not pass the other filters (`passes` is false), the gate looks at it
    // but does not let it through.
    void take(const Seen& seen, bool passes = true);
    // So much time has passed, and nothing has come.
    void advance(std::int64_t nanoseconds);
    // The input has ended.
    void finish();

    // Returns the next item that may go on, or null if there is none just now. It is valid until the next
    // call.
    const Seen* next();

    // How many calls have begun.
    std::uint64_t calls() const { return analysis_.begun(); }
    // How many frames were dropped although their call may have been wanted.
    std::uint64_t letGo() const { return letGo_; }

  private:
    // An item, with copies of everything that the reader owns and will reuse.
    struct Held {
        explicit Held(const Seen& from);
        const Seen& view();

        Seen seen;
        capture::Item item;
        std::vector<std::uint8_t> octets;
        std::string text;
        bool wanted = false;
    };
    using Place = std::uint64_t;  // counts the items that were held, in the order of the input
    using HeldItems = std::map<Place, Held>;

    void heard(const calls::Message& message, const calls::Call* call) override {
        claim(message.number, call);
    }
    void carried(const calls::Message& message, const calls::Call* call) override {
        claim(message.number, call);
    }
    void gone(const calls::Call& call) override;

    void claim(std::uint64_t frame, const calls::Call* call);
    void settle(HeldItems::iterator held, const calls::Call* call);
    void decide(HeldItems::iterator held, bool wanted);
    void release();

    const CallFilter& filter_;
    Order order_;
    std::size_t most_;
    HeldItems held_;
    Place lastPlace_ = 0;
    std::unordered_map<std::uint64_t, Place> unclaimed_;               // by the number of the frame
    std::unordered_map<std::uint64_t, std::vector<Place>> undecided_;  // by the number of the call
    std::deque<Held> ready_;
    std::optional<Held> given_;
    std::uint64_t letGo_ = 0;
    calls::Analysis analysis_;
};

}  // namespace reader

#endif
