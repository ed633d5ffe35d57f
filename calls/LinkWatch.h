// Finds what only time shows on a link: polls and SABMEs without an answer, full windows, silence, flaps.
#ifndef CALLS_LINKWATCH_H
#define CALLS_LINKWATCH_H

#include <array>
#include <cstdint>
#include <limits>
#include <optional>
#include <string>
#include <vector>

#include "calls/DChannel.h"
#include "calls/Finding.h"
#include "calls/Timers.h"

namespace calls {

// Basic access has several terminals, sets links up as needed, and sends one frame at a time; a primary rate
// has one link that stays up.
enum class Access : std::uint8_t { unknown, basic, primary };

// What a watch has found. The owner of the watch reports it.
struct Observation {
    const FindingKind* kind;
    Severity severity;
    std::uint64_t frame;
    std::int64_t at;
    std::string sentence;
};

class LinkWatch {
  public:
    // What the watch has to know about the D channel.
    struct Circumstances {
        const Timers* timers;
        Access access = Access::unknown;
        bool grouped = false;       // the D channel may be the standby of a group
        bool outOfService = false;  // SERVICE has said so
        bool bothHeard = false;     // both directions occur in the trace
    };

    static constexpr std::int64_t never = std::numeric_limits<std::int64_t>::max();

    explicit LinkWatch(std::uint8_t tei) : tei_(tei) {}

    // Takes what the channel says about its last frame, which must belong to this link.
    void take(const DChannel& channel, const Sample& sample, const Circumstances& around);
    // Notes what should have happened by `at` and has not.
    void expire(std::int64_t at, const Circumstances& around);
    // When expire() may have something to report.
    std::int64_t due() const { return due_; }
    // The recorder was started again, or has missed frames. What was waited for may have come, so nothing is
    // waited for any more.
    void forget();
    void finish();

    // What was found and not cleared yet. The owner reports the observations and clears the list.
    std::vector<Observation>& observations() { return observations_; }

  private:
    struct Asked {  // polls, or SABMEs, of one side that wait for an answer
        unsigned count = 0;
        std::uint64_t frame = 0;  // the first of them
        std::int64_t first = 0;
        std::int64_t last = 0;
        std::int64_t exhausted = 0;  // when the last repetition that is allowed was sent
        bool heard = false;          // something else came from the other side
        bool reported = false;

        void add(const Sample& sample);
    };
    struct Since {  // something that lasts
        bool holds = false;
        bool reported = false;
        std::uint64_t frame = 0;
        std::int64_t at = 0;

        void begin(const Sample& sample) {
            if (!holds)
                *this = {true, false, sample.number, sample.at};
        }
    };
    struct Repeated {  // I frames of one side within an hour
        std::int64_t since = 0;
        std::uint64_t sent = 0, again = 0, occasions = 0, lastAgain = 0;
        std::int64_t lastAgainAt = 0;
        bool running = false;
    };
    struct Idle {  // polls of one side while nothing else happens
        std::optional<std::int64_t> last;
        bool busy = false;
        std::int64_t period = 0;
        unsigned seen = 0;
        bool missed = false;  // polls were missing since the last one
        bool slower = false;  // they were, once or more, since the last that kept to the period
    };

    void polls(const Sample& sample);
    void setUps(const Sample& sample, const Marks& marks, const Circumstances& around);
    void windows(const Sample& sample, const Link& link, const Circumstances& around);
    void flaps(const Sample& sample, const Marks& marks, const Circumstances& around);
    void demands(const Sample& sample, const Circumstances& around);
    void keepAlives(const Sample& sample, const Marks& marks);
    static void learnPeriod(Idle& idle, std::int64_t period);
    void tellSilence();
    void endSilence(const DChannel& channel, const Sample& sample, const Circumstances& around);
    void repetitions(const Sample& sample, const Marks& marks);
    void endHour(Repeated& repeated, Side side);
    static std::int64_t dueOf(const Asked& asked, const Circumstances& around);
    std::int64_t dueOf(const Idle& idle, const Circumstances& around) const;
    void expireDemands(Side side, std::int64_t at, const Circumstances& around);
    void expireSetUps(Side side, std::int64_t at, const Circumstances& around);
    void expireWindows(Side side, std::int64_t at, const Circumstances& around);
    void expireKeepAlives(Side side, std::int64_t at, const Circumstances& around);
    void schedule(const Circumstances& around);
    void observe(const FindingKind& kind, std::uint64_t frame, std::int64_t at, std::string sentence,
                 std::optional<Severity> severity = {});
    std::string linkWords() const;

    std::uint8_t tei_;
    std::array<Asked, 2> polls_{}, setUps_{}, demands_{};
    std::array<Since, 2> full_{}, notReady_{};
    std::array<unsigned, 2> window_{};  // the largest number of frames on the way; 0: not learnt
    std::array<Repeated, 2> repeated_{};
    std::array<Idle, 2> idle_{};
    std::array<bool, 2> silent_{};  // it was reported that this side sends nothing, and it has not since
    std::vector<std::int64_t> setUpTimes_;  // the last set-ups without a release before them
    bool released_ = false;                 // DISC came since the link was set up
    bool lost_ = false;                     // DM came while the link was up
    bool sentInformation_ = false;
    bool up_ = false;
    bool keepAliveReported_ = false;
    // Polls were missing. Once frames come again, their numbers tell whether the recorder had missed some.
    std::optional<Observation> silence_;
    std::optional<std::int64_t> silenceEnd_;  // when the first of these frames came
    std::uint64_t lastFrame_ = 0;
    std::int64_t lastAt_ = 0;
    std::int64_t due_ = never;
    std::vector<Observation> observations_;
};

}  // namespace calls

#endif
