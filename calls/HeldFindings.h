// Findings that depend on what came before a message, held back while the trace may lack some of it.
#ifndef CALLS_HELDFINDINGS_H
#define CALLS_HELDFINDINGS_H

#include <cstdint>
#include <vector>

#include "calls/Finding.h"
#include "calls/FindingSink.h"
#include "calls/LinkWitness.h"
#include "calls/Message.h"

namespace calls {

// A message may acknowledge a frame of the other side that is not in the trace. If the recorder has only put
// the two in the wrong order, that frame comes within 8 ms, and the finding is reported then. Otherwise the
// recorder has missed it, nobody knows what it said, and the finding is dropped.
class HeldFindings {
  public:
    HeldFindings(const LinkWitnesses& links, FindingSink& sink) : links_(links), sink_(sink) {}

    // Reports what `message` shows, at once if nothing is missing before it.
    void report(Finding finding, const Message& message);
    // Call this before each frame is handed in.
    void advance();
    // The board restarted, or the trace has ended: what is held cannot be decided any more.
    void forget() { held_.clear(); }

  private:
    struct Held {
        Finding finding;
        std::uint8_t tei;
        Side before;      // the side of which a frame may be missing
        std::int64_t at;  // of the message
    };

    static constexpr std::size_t mostHeld = 256;  // a message each, within 8 ms

    const LinkWitnesses& links_;
    FindingSink& sink_;
    std::vector<Held> held_;
};

}  // namespace calls

#endif
