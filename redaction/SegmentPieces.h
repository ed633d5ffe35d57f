// Keeps frames that carry pieces of messages until the messages are whole.
#ifndef REDACTION_SEGMENTPIECES_H
#define REDACTION_SEGMENTPIECES_H

#include <cstdint>
#include <map>
#include <tuple>
#include <vector>

#include "capture/Frame.h"
#include "isdn/Layer3.h"
#include "isdn/octets.h"

namespace redaction {

// A frame whose octets were rebuilt.
struct Rebuilt {
    std::uint64_t number = 0;  // the frame's number in the input
    std::vector<std::uint8_t> octets;
};

// A SEGMENT message, with the frame that carries it.
struct Segment {
    const capture::Frame* frame;
    isdn::Octets octets;  // of the frame, its piece of a message blanked
    std::uint64_t number;
    isdn::Layer3 message;  // a view into the frame
    std::uint8_t tei;
};

// Knows which frames belong to one message. It does not decide when a message is whole; the analysis of calls
// does, and the caller passes that on.
class SegmentPieces {
  public:
    // Keeps a segment. If `isFirst` is false, the segment joins those before it; returns false if there are
    // none.
    bool keep(const Segment& segment, bool isFirst, std::vector<Rebuilt>& givenUp);
    // Writes `whole`, the message that ends with this segment, over its pieces. Appends the frames before the
    // last to `done`, and puts the octets of the last frame into `lastOctets`. If the pieces do not belong to
    // this message, they stay blank, and `lastOctets` stays as it is.
    void finish(const Segment& last, isdn::Octets whole, std::vector<Rebuilt>& done,
                std::vector<std::uint8_t>& lastOctets);
    // The pieces before this segment belong to no whole message. Blanks them and appends their frames to
    // `givenUp`.
    void giveUp(const Segment& segment, std::vector<Rebuilt>& givenUp);
    void giveUpAll(std::vector<Rebuilt>& givenUp);
    // The same of messages whose first segment came in a frame before `number`, or before `time`.
    void giveUpOlder(std::uint64_t number, std::int64_t time, std::vector<Rebuilt>& givenUp);
    bool isWaiting() const { return !pieces_.empty(); }

  private:
    // D channel, TEI, call reference and its flag, direction.
    using Key = std::tuple<const capture::Interface*, std::uint8_t, std::uint64_t, bool, bool>;
    struct Piece {
        Rebuilt frame;
        std::int64_t time;  // nanoseconds
        std::size_t at;     // where the piece begins in the frame; it ends with the frame
    };
    using Pieces = std::vector<Piece>;

    static Key keyOf(const Segment& segment);
    static Piece pieceOf(const Segment& segment);
    static void blank(Pieces& pieces, std::vector<Rebuilt>& givenUp);

    std::map<Key, Pieces> pieces_;
};

}  // namespace redaction

#endif
