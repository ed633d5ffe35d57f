// Replaces what identifies a person in frames. The frames must be given in the order in which they passed.
#ifndef REDACTION_REDACTOR_H
#define REDACTION_REDACTOR_H

#include <cstdint>
#include <map>
#include <optional>
#include <span>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "calls/Analysis.h"
#include "redaction/Pseudonyms.h"
#include "redaction/SegmentPieces.h"
#include "redaction/plan.h"

namespace redaction {

// Listens to an analysis, which says to which call digits belong. TraceRedactor puts both together. For each
// frame in turn:
//
//     redactor.expect(number);
//     const calls::Marks& marks = analysis.take(frame, number);
//     redactor.take(frame, marks, variant, done);
//
// With pseudonyms that restore, the same calls give the original frames back, but for what was blanked.
// Memory is bounded if giveUpSegments() is called now and then. Used by one thread at a time.
class Redactor : public calls::Listener {
  public:
    // `blankShort`: numbers of fewer than six digits are blanked, as far as they are known to be so short
    // when their first digits pass.
    Redactor(Pseudonyms& pseudonyms, bool blankShort) : pseudonyms_(pseudonyms), blankShort_(blankShort) {}

    void expect(std::uint64_t number);
    // Appends to `done` the frames that are ready now, which in most cases is this one. A SEGMENT waits for
    // the rest of its message, so frames may leave in another order.
    void take(const capture::Frame& frame, const calls::Marks& marks, isdn::Variant variant,
              std::vector<Rebuilt>& done);
    // Redacts a frame that was not recorded whole, and that the analysis therefore does not see.
    std::vector<std::uint8_t> cut(isdn::Octets frame, isdn::Variant variant);
    // Frames may be missing from here on, digits with them.
    void mayMiss() { ++losses_; }
    // Blanks all segments that wait, and appends their frames to `done`.
    void giveUpSegments(std::vector<Rebuilt>& done) { segments_.giveUpAll(done); }
    // Does the same with segments of messages whose first segment came in a frame before `number`, or before
    // `time`.
    void giveUpOlderSegments(std::uint64_t number, std::int64_t time, std::vector<Rebuilt>& done) {
        segments_.giveUpOlder(number, time, done);
    }
    bool isWaiting() const { return segments_.isWaiting(); }

    void heard(const calls::Message& message, const calls::Call* call) override;
    void gone(const calls::Call& call) override;

  private:
    // What the analysis has said about the frame that is being taken.
    struct Heard {
        std::uint64_t call = 0;  // 0: none
        calls::Side from = calls::Side::us;
        bool isAccepted = false;
        std::vector<std::uint8_t> whole;  // the message, if its last segment came in this frame
    };
    // What a side of a call has dialled so far, without pseudonyms.
    struct Dialled {
        std::string digits;
        std::uint64_t losses = 0;
    };
    // A piece of a number in a frame that may be sent again.
    struct Sent {
        std::vector<std::uint8_t> information;
        std::string before;
    };
    // D channel, TEI, N(S) and direction of a frame that may be sent again.
    using Place = std::tuple<const capture::Interface*, std::uint8_t, std::uint8_t, bool>;

    void apply(const Plan& plan, std::span<std::uint8_t> octets, std::uint8_t messageType);
    void replaceDialled(std::span<std::uint8_t> octets, std::uint8_t messageType);
    bool replaceNumber(std::span<std::uint8_t> octets, std::string& before);
    std::optional<std::string> digitsBefore();
    // Returns true if the segment waits for the rest of its message. `rebuilt` is its frame, with its piece
    // blanked; if its message is complete, it gets the redacted piece.
    bool takeSegment(const Segment& segment, isdn::Variant variant, std::vector<Rebuilt>& done,
                     Rebuilt& rebuilt);

    Pseudonyms& pseudonyms_;
    bool blankShort_;
    std::uint64_t expected_ = 0;
    std::uint64_t losses_ = 0;
    Heard heard_;
    Place place_{};             // of the frame that is taken
    isdn::Octets information_;  // of the frame that is taken
    // By number of the call, and side. Calls whose SETUP was seen.
    std::map<std::pair<std::uint64_t, calls::Side>, Dialled> dialled_;
    std::map<Place, Sent> sent_;
    SegmentPieces segments_;
};

}  // namespace redaction

#endif
