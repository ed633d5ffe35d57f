// Follows the I frames of one side of a link, and decides which of them the other side's layer 2 accepts.
#ifndef CALLS_STREAM_H
#define CALLS_STREAM_H

#include <array>
#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "calls/Message.h"
#include "capture/Frame.h"

namespace calls {

// Sequence numbers count modulo 128 (Q.921 3.5.2.1).
constexpr unsigned ahead(std::uint8_t number, std::uint8_t of) {
    return static_cast<unsigned>(number - of) & 0x7FU;
}
// No more than half of all numbers can be ahead; others lie behind.
constexpr bool isAhead(std::uint8_t number, std::uint8_t of) {
    const unsigned distance = ahead(number, of);
    return distance > 0 && distance < 64;
}
constexpr std::uint8_t after(std::uint8_t number) { return static_cast<std::uint8_t>((number + 1) & 0x7F); }

// A frame as the state machines of links take it.
struct Sample {
    const capture::Frame* frame;
    std::uint64_t number;  // in the input, from 1
    std::int64_t at;       // nanoseconds on the D channel's clock
    isdn::Layer2 layer2;
    std::optional<bool> command{};  // empty while it is not known
    std::optional<bool> assumed{};  // the same, where the link itself does not tell

    Side from() const { return frame->transmitted ? Side::us : Side::peer; }
};

// A frame with its own copy of the octets.
struct KeptFrame {
    explicit KeptFrame(const Sample& sample);
    // A view of the kept frame, valid as long as this object.
    Sample sample() const;

    std::vector<std::uint8_t> octets;
    capture::Frame frame;
    std::uint64_t number;
    std::int64_t at;
};

// Numbers that are missing in what a side sent.
struct Hole {
    std::uint8_t first = 0;   // the first missing N(S)
    unsigned count = 0;       // how many are missing
    std::uint64_t frame = 0;  // number of the frame behind it
    std::int64_t at = 0;
    std::string_view reason{};  // what the recorder says about the missing frames; empty if it says nothing
};

// Who lost the frames of a hole.
enum class LostBy : std::uint8_t { line, recorder, unknown };

class Stream {
  public:
    enum class Verdict : std::uint8_t {
        accepted,   // the receiver's layer 2 hands it up
        duplicate,  // the receiver has it already
        waiting,    // ahead of a hole: what the receiver says next decides
        ahead       // the receiver waits for an earlier one that was lost on the line
    };
    struct Taken {
        Verdict verdict = Verdict::accepted;
        bool again = false;             // its number was seen before
        std::optional<Hole> found{};    // a hole in front of it
        std::optional<LostBy> by{};     // who lost the frames of `found` or `decided`
        std::optional<Hole> decided{};  // an earlier hole about which this frame decides
    };

    // Takes an I frame of this side. `recorded` is the recorder's own report that it has missed frames since
    // the last one, or empty. A hole in what our own side sent was made by the recorder.
    Taken take(const Sample& sample, std::string_view recorded);
    // Takes the N(R) of a frame of the other side. Appends to `accepted` the frames that were waiting and are
    // accepted now.
    Taken acknowledged(const Sample& sample, std::string_view recorded, std::vector<KeptFrame>& accepted);

    // The link was set up: numbers begin at 0.
    void reset();
    // Frames may be missing from here on. The next number is believed, whatever it is.
    void loosen();

    // Closes the hole about which nothing was decided, and returns it.
    std::optional<Hole> giveUp();
    bool hasOpenHole() const { return hole_.has_value(); }

    unsigned outstanding() const { return firm_ ? ahead(next_, acknowledged_) : 0; }
    std::uint8_t acknowledged() const { return acknowledged_; }
    // Whether N(R) acknowledges what this side has not sent, as far as the trace shows.
    bool isBeyond(std::uint8_t nr) const { return firm_ && isAhead(nr, next_); }
    // Whether N(R) is behind what was acknowledged, by more than a window, so that it is no repetition of an
    // older N(R). Never for 0, which may follow a SABME that the trace lacks.
    bool isLongAcknowledged(std::uint8_t nr) const {
        const unsigned behind = ahead(acknowledged_, nr);
        return firm_ && nr != 0 && ahead(nr, acknowledged_) > ahead(next_, acknowledged_) &&
               !isAhead(nr, next_) && behind > widestWindow;
    }
    bool isFirm() const { return firm_; }
    std::uint8_t next() const { return next_; }

  private:
    static constexpr unsigned widestWindow = 7;

    // Whether a frame whose number is not ahead can be a repetition: its sender may still hold it, and no
    // frame with another text had this number. The sender holds frames whose acknowledgement it has not
    // received, and an acknowledgement may be lost on the line.
    bool mayRepeat(std::uint8_t ns, std::uint32_t text) const {
        return ahead(next_, ns) <= outstanding() + widestWindow && (texts_[ns] == 0 || texts_[ns] == text);
    }
    void goOnAt(const Sample& sample, std::string_view recorded, Taken& taken);
    void takeAhead(const Sample& sample, std::string_view recorded, Taken& taken);
    void keep(const Sample& sample);

    bool known_ = false;                      // some number was seen
    bool firm_ = false;                       // the next number is known for sure
    std::uint8_t next_ = 0;                   // V(S): the number after the highest that was sent
    std::uint8_t expected_ = 0;               // V(R) of the receiver
    std::uint8_t acknowledged_ = 0;           // the last N(R) of the receiver
    bool recovering_ = false;                 // the receiver waits for `expected_` to be sent again
    std::array<std::uint32_t, 128> texts_{};  // hashes of the newest frame of each number; 0: not known
    std::optional<Hole> hole_;
    std::vector<KeptFrame> waiting_;  // behind the hole; at most `mostWaiting`
};

}  // namespace calls

#endif
