// One link of a D channel (a TEI at a SAPI) as an observer sees it: its state, the meaning of each frame for
// it, and which frames the receivers accept (Q.921 5).
#ifndef CALLS_LINK_H
#define CALLS_LINK_H

#include <array>
#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "calls/CommandBits.h"
#include "calls/Message.h"
#include "calls/Stream.h"
#include "calls/Timers.h"

namespace calls {

enum class LinkState : std::uint8_t {
    unknown,  // nothing was seen that tells
    down,
    establishing,  // SABME waits for its answer
    up,
    releasing  // DISC waits for its answer
};
// "unknown", "down", "establishing", "up", "releasing".
std::string_view nameOf(LinkState state);

// What a frame means for its link. `lapdread list` shows these as marks.
struct Marks {
    capture::Role role = capture::Role::unknown;  // the role of our side, as far as it is known by now
    std::optional<bool> command{};                // empty while it is not known
    // For I and UI frames: whether the receiver's layer 2 hands the message up. Empty for other frames, and
    // for a frame behind a hole, until the receiver's N(R) decides.
    std::optional<bool> accepted{};
    LinkState state = LinkState::unknown;  // after the frame
    bool retransmitted = false;            // its N(S) was sent before
    bool outOfSequence = false;            // an earlier N(S) is missing
    bool pollUnanswered = false;           // a poll; the one before it got no answer
    bool linkUp = false;                   // UA that sets the link up
    bool linkDown = false;  // SABME on a link that was up, DM, or the answer to DISC: it is not up any more
    bool unseenSetUp = false;  // numbers begin at 0 again: a SABME is missing in the trace
    bool contradictsRole = false;
    // `keepAlive`: a poll that says nothing but that the link is alive; it may be hidden if its answer
    // follows. `answers`: the number of the poll that this frame answers, if both may be hidden.
    bool keepAlive = false;
    std::optional<std::uint64_t> answers{};
};

// What else happened on the link. The findings are made of these events.
struct LinkEvent {
    enum class Kind : std::uint8_t {
        hole,               // the frames of `hole` were lost by `by`
        nrInvalid,          // N(R) `number` acknowledges what was not sent
        unseenSetUp,        // numbers begin at 0 again without SABME
        setUpAgain,         // SABME while the link was up
        refused,            // DM answers SABME
        unsolicitedAnswer,  // UA that answers nothing
        frameReject,
        contradiction,  // commands are coded otherwise than before
        sameRole        // both sides code commands alike
    };

    Kind kind;
    Side from;            // who sent the frame that shows it, or the frames that are missing
    std::uint64_t frame;  // number of the frame that shows it
    std::int64_t at;      // nanoseconds on the D channel's clock
    Hole hole{};
    LostBy by = LostBy::unknown;
    std::uint8_t number = 0;
    std::uint8_t tei = 0;  // of the link; set by DChannel
};

class Link {
  public:
    explicit Link(const Timers& timers) : timers_(&timers) {}

    // Takes a frame of this link. Events are appended to `events`; frames that are accepted by now, but came
    // earlier, to `late`.
    Marks take(Sample& sample, std::vector<LinkEvent>& events, std::vector<KeptFrame>& late);
    // The recorder says, in `reason`, that it may have missed frames of this side. `reason` must outlive the
    // link.
    void mayMiss(Side side, std::string_view reason);
    // The recorder has seen a frame of this side, of this link or another, without its octets.
    void mayLack(Side side);
    // The recorder, or the board, was restarted: nothing is known for sure.
    void forget();
    // The trace has ended. Appends events for holes and numbers that were not decided.
    void finish(std::vector<LinkEvent>& events);

    LinkState state() const { return state_; }
    // When and at which frame the state was entered.
    std::int64_t since() const { return since_; }
    std::uint64_t sinceFrame() const { return sinceFrame_; }
    // Whether the set-up itself was seen. If not, the link may have been up before `since`.
    bool sawSetUp() const { return sawSetUp_; }
    // Another number whenever N(S) and N(R) begin again, or may have done so unseen.
    std::uint64_t numbering() const { return numbering_; }
    const CommandBits& commands() const { return commands_; }
    const Stream& sentBy(Side side) const { return streams_[indexOf(side)]; }
    // The numbers suggest that I frames of this side are missing in the trace; what comes next decides.
    bool mayLackFramesOf(Side side) const {
        return sentBy(side).hasOpenHole() || beyond_[indexOf(other(side))];
    }
    // The other side acknowledged an I frame of this side that is not in the trace, and so long before `at`
    // that the recorder cannot have put the two in the wrong order.
    bool hasAcknowledgedUnseen(Side side, std::int64_t at) const {
        const std::optional<PendingNr>& pending = beyond_[indexOf(other(side))];
        return pending && at - pending->at > timers_->slack;
    }

  private:
    struct Poll {
        std::uint64_t frame;
        std::int64_t at;
        bool keepAlive;
    };
    struct Missing {
        std::string_view reason{};  // empty: nothing says that frames are missing
        unsigned seen = 0;          // frames without octets, each of which explains one number
    };
    struct PendingNr {
        std::uint8_t nr;
        std::uint64_t frame;
        std::int64_t at;
        bool behind;  // it names frames that were acknowledged long before
    };

    void setUp(const Sample& sample, Marks& marks, std::vector<LinkEvent>& events);
    void answer(const Sample& sample, Marks& marks, std::vector<LinkEvent>& events);
    void refuse(const Sample& sample, Marks& marks, std::vector<LinkEvent>& events);
    void release(const Sample& sample, std::vector<LinkEvent>& events);
    void supervise(const Sample& sample, std::vector<LinkEvent>& events, std::vector<KeptFrame>& late);
    void information(const Sample& sample, Marks& marks, std::vector<LinkEvent>& events);
    void poll(const Sample& sample, Marks& marks);
    void polled(const Sample& sample, Marks& marks);
    void isAlive(const Sample& sample);
    bool beginsAgain(const Sample& sample) const;
    void beginNumbers();
    void settleNr(const Sample& sample, const Stream::Taken& taken, std::vector<LinkEvent>& events);
    void report(const Sample& sample, Side sender, const Stream::Taken& taken,
                std::vector<LinkEvent>& events);
    void giveUpHoles(std::vector<LinkEvent>& events);
    void enter(LinkState state, const Sample& sample);
    void endPolls() { polls_ = {}; }

    const Timers* timers_;
    CommandBits commands_;
    LinkState state_ = LinkState::unknown;
    std::int64_t since_ = 0;
    std::uint64_t sinceFrame_ = 0;
    bool sawSetUp_ = false;
    std::uint64_t numbering_ = 0;
    std::array<Stream, 2> streams_;
    std::array<bool, 2> settingUp_{}, releasing_{};  // SABME, DISC of a side waits for its answer
    std::array<bool, 2> heard_{};                    // I or S frames of a side since the state was entered
    std::array<std::optional<Poll>, 2> polls_;
    std::array<Missing, 2> missing_;                  // by sender, since its last I frame
    std::array<std::optional<PendingNr>, 2> beyond_;  // by sender: N(R) that acknowledges what was not seen
    std::array<std::optional<std::uint8_t>, 2> lastNr_;  // by sender
    std::array<std::size_t, 2> firstText_{};             // by sender: what its last frame with N(S) 0 said
    std::int64_t eventAt_ = 0;  // when something other than a keep-alive happened last
    bool hadEvent_ = false;
    bool betweenPolls_ = false;  // a frame came between poll and answer
};

}  // namespace calls

#endif
