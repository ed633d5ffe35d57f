#include "tests/calls/TwoEnds.h"

#include <array>
#include <deque>
#include <queue>
#include <random>
#include <utility>

namespace calls::testing {

namespace {

const capture::Interface trunk{"trunk"};
constexpr std::int64_t onTheWay = 2 * millisecond;

// What happens next, and when.
struct Event {
    std::int64_t at;
    std::uint64_t order;
    std::function<void()> happens;
    bool operator<(const Event& later) const {
        return std::pair(at, order) > std::pair(later.at, later.order);  // the earliest comes first
    }
};

class World {
  public:
    World(const Habits& habits, const std::function<void(const ScriptFrame&)>& take)
        : habits_(habits), take_(take), random_(habits.seed) {}

    void run(std::int64_t duration) {
        send(0, {0x7F});
        for (const std::size_t end : {std::size_t{0}, std::size_t{1}})
            later(second, [this, end] { speak(end); });
        while (!events_.empty() && events_.top().at < duration) {
            const Event event = events_.top();
            events_.pop();
            now_ = event.at;
            event.happens();
        }
    }

  private:
    struct End {
        std::uint8_t sent = 0, expected = 0;
        std::deque<std::uint8_t> onTheWay;  // N(S) that wait for an acknowledgement
        bool owes = false, rejecting = false;
        std::int64_t last = 0;  // when a frame of the link was sent or came
        std::int64_t progress =
            0;  // when a frame was last acknowledged, or the first of those that wait was sent
        bool waitsForFinal = false;
    };

    void later(std::int64_t delay, std::function<void()> happens) {
        events_.push({now_ + delay, ++order_, std::move(happens)});
    }
    std::int64_t upTo(std::int64_t most) {
        return std::uniform_int_distribution<std::int64_t>(1, most)(random_);
    }

    // End 0 is ours, the user. Commands of the user and responses of the network have C/R 0.
    static std::uint8_t address(std::size_t end, bool command) { return command == (end == 1) ? 0x02 : 0x00; }

    void send(std::size_t end, std::vector<std::uint8_t> control, bool command = true,
              std::uint8_t text = 0) {
        std::vector<std::uint8_t> octets{address(end, command), 0x01};
        octets.insert(octets.end(), control.begin(), control.end());
        const bool isInformation = control.size() == 2 && (control[0] & 1U) == 0;
        if (isInformation)
            octets.insert(octets.end(), {0x08, 0x02, 0x00, 0x01, 0x7B, 0x2C, 0x01, text});
        ends_[end].last = now_;
        const bool lost = end == 1 && isInformation && upTo(1000) <= habits_.lossesPerThousand;
        if (end == 0)
            record(octets, true);
        if (lost)
            return;
        later(onTheWay, [this, end, octets] {
            if (end == 1)
                record(octets, false);
            arrive(1 - end, octets);
        });
    }

    void record(const std::vector<std::uint8_t>& octets, bool transmitted) {
        if (habits_.missedPerThousand > 0 && now_ > second && upTo(1000) <= habits_.missedPerThousand)
            return;
        ScriptFrame frame;
        frame.octets = octets;
        frame.frame.transmitted = transmitted;
        frame.frame.clock = capture::Clock::absolute;
        frame.at = now_ / capture::nanosecondsPerTick * capture::nanosecondsPerTick;
        frame.frame.time = frame.at;
        frame.frame.interface = &trunk;
        take_(frame);
    }

    std::uint8_t nrAndPf(const End& end, bool pf) const {
        return static_cast<std::uint8_t>(end.expected << 1 | (pf ? 1U : 0U));
    }

    void speak(std::size_t which) {
        End& end = ends_[which];
        if (up_ && end.onTheWay.size() < habits_.window && !end.waitsForFinal) {
            const std::uint8_t ns = end.sent;
            end.sent = static_cast<std::uint8_t>((ns + 1) & 0x7F);
            if (end.onTheWay.empty())
                end.progress = now_;
            end.onTheWay.push_back(ns);
            end.owes = false;
            sendInformation(which, ns);
        }
        later(upTo(2 * habits_.between), [this, which] { speak(which); });
    }
    void sendInformation(std::size_t which, std::uint8_t ns) {
        send(which, {static_cast<std::uint8_t>(ns << 1), nrAndPf(ends_[which], false)}, true, ns);
    }

    void arrive(std::size_t which, const std::vector<std::uint8_t>& octets) {
        End& end = ends_[which];
        end.last = now_;
        const std::uint8_t control = octets[2];
        if (control == 0x7F)
            return send(which, {0x73}, false);
        if (control == 0x73) {
            up_ = true;
            for (const std::size_t each : {std::size_t{0}, std::size_t{1}})
                watchIdle(each);
            return;
        }
        const std::uint8_t nr = octets[3] >> 1;
        while (!end.onTheWay.empty() && end.onTheWay.front() != nr) {
            end.onTheWay.pop_front();
            end.progress = now_;
        }
        if ((control & 1U) == 0)
            return arriveInformation(which, control >> 1);
        const bool command = octets[0] == address(1 - which, true);
        if ((octets[3] & 1U) != 0 && command)
            return send(which, {0x01, nrAndPf(end, true)}, false);
        const bool final = (octets[3] & 1U) != 0;
        // A poll's answer tells what has not arrived; REJ likewise.
        if (control == 0x09 || (final && std::exchange(end.waitsForFinal, false)))
            for (const std::uint8_t ns : end.onTheWay)
                sendInformation(which, ns);
    }

    void arriveInformation(std::size_t which, std::uint8_t ns) {
        End& end = ends_[which];
        if (ns != end.expected) {
            if (!std::exchange(end.rejecting, true))
                send(which, {0x09, nrAndPf(end, false)}, false);
            return;
        }
        end.rejecting = false;
        end.expected = static_cast<std::uint8_t>((ns + 1) & 0x7F);
        if (std::exchange(end.owes, true))
            return;
        later(upTo(habits_.acknowledgesWithin), [this, which] {
            if (std::exchange(ends_[which].owes, false))
                send(which, {0x01, nrAndPf(ends_[which], false)}, false);
        });
    }

    // A side polls when nothing was sent for a while, and when something waits for its acknowledgement for a
    // second.
    void watchIdle(std::size_t which) {
        End& end = ends_[which];
        const bool waits = !end.onTheWay.empty() && now_ - end.progress >= second;
        const bool idle =
            habits_.idle > 0 && (which == 0 || habits_.bothPoll) && now_ - end.last >= habits_.idle;
        if ((waits || idle) && !end.waitsForFinal) {
            end.waitsForFinal = true;
            end.progress = now_;
            send(which, {0x01, nrAndPf(end, true)}, true);
        }
        later(50 * millisecond, [this, which] { watchIdle(which); });
    }

    Habits habits_;
    const std::function<void(const ScriptFrame&)>& take_;
    std::mt19937 random_;
    std::priority_queue<Event> events_;
    std::array<End, 2> ends_;
    std::int64_t now_ = 0;
    std::uint64_t order_ = 0;
    bool up_ = false;
};

}  // namespace

void runTwoEnds(const Habits& habits, std::int64_t duration,
                const std::function<void(const ScriptFrame&)>& take) {
    World(habits, take).run(duration);
}

}  // namespace calls::testing
