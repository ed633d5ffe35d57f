// Frames that carry pieces of messages, until the messages are whole.
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
    std::uint64_t number = 0;  // of the frame in the input
    std::vector<std::uint8_t> octets;
};

// A SEGMENT, with the frame that carries it.
struct Segment {
    const capture::Frame* frame;
    std::uint64_t number;
    isdn::Layer3 message;  // a view of the frame
    std::uint8_t tei;
};

// Which frames belong to one message. The rule by which segments follow each other is the analysis's: it says
// when a message is whole.
class SegmentPieces {
  public:
    // Keeps a segment. Without `isFirst` it joins those before it; false if there are none.
    bool keep(const Segment& segment, bool isFirst, std::vector<Rebuilt>& givenUp);
    // Writes the message that ends with this segment over its pieces. The frames before the last go to
    // `done`, the last one is `lastOctets`. False, and nothing is written, if the pieces are not those of the
    // message.
    bool finish(const Segment& last, isdn::Octets whole, std::vector<Rebuilt>& done,
                std::vector<std::uint8_t>& lastOctets);
    // The pieces before this segment belong to no whole message: they are blanked.
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
        std::int64_t time;
        std::size_t at;  // of the piece in the frame; it reaches to the frame's end
    };
    using Pieces = std::vector<Piece>;

    static Key keyOf(const Segment& segment);
    static Piece pieceOf(const Segment& segment);
    static void blank(Pieces& pieces, std::vector<Rebuilt>& givenUp);

    std::map<Key, Pieces> pieces_;
};

}  // namespace redaction

#endif
