// Messages of calls on two D channels, in any order and at any time, through the whole analysis and its
// figures. Each message belongs to one call or to none, each call is handed out once with its own frames, and
// the figures add up.
#include <algorithm>
#include <array>
#include <map>
#include <numeric>
#include <set>

#include "calls/Figures.h"
#include "calls/Occupancy.h"
#include "tests/fuzz/fuzz.h"

namespace {

class Checked : public calls::Listener {
  public:
    void heard(const calls::Message& message, const calls::Call* call) override {
        fuzz::require(message.number <= number && heard_.insert(message.number).second,
                      "a frame is heard once, and not before it came");
        figures.heard(message);
        if (call == nullptr)
            return;
        fuzz::require(!gone_.contains(call->number), "a message belongs to a call that is there");
        owner_[message.number] = call->number;
        occupancy.heard(message, *call);
    }
    void ended(const calls::Call& call) override {
        fuzz::require(ended_.insert(call.number).second && call.phase == calls::Phase::ended &&
                          call.endedBy != calls::EndedBy::open,
                      "a call ends once");
        occupancy.ended(call);
    }
    void gone(const calls::Call& call) override {
        fuzz::require(gone_.insert(call.number).second, "a call goes once");
        fuzz::require(call.endedBy == calls::EndedBy::open || ended_.contains(call.number),
                      "a call that has ended was said to");
        std::size_t own = 0;
        for (const std::uint64_t frame : call.frames) {
            const auto owner = owner_.find(frame);
            own += owner != owner_.end() && owner->second == call.number ? 1 : 0;
        }
        fuzz::require(own == call.frames.size() && call.messages >= own && own > 0,
                      "a call has its own frames");
        for (const auto& time :
             {call.firstResponse, call.progress, call.alerting, call.connect, call.duration})
            fuzz::require(!time || *time >= 0, "no time is negative");
        figures.gone(call);
    }
    void found(const calls::Finding& finding) override {
        fuzz::require(finding.kind != nullptr && !finding.sentence.empty() && finding.count > 0 &&
                          finding.frame <= number,
                      "a finding is whole");
        occupancy.found(finding);
    }

    // After the end.
    void check(const calls::Analysis& analysis) {
        for (const auto& [frame, call] : owner_)
            fuzz::require(gone_.contains(call), "every call is handed out");
        occupancy.finish(analysis.spans());
        for (const auto& [index, group] : occupancy.groups()) {
            fuzz::require(group.inUse == 0 && group.most <= group.channels.size() && group.used >= 0,
                          "channels are given back");
        }
        for (const calls::Side side : {calls::Side::us, calls::Side::peer}) {
            const calls::Traffic& traffic = figures.traffic(side);
            fuzz::require(std::accumulate(traffic.byOutcome.begin(), traffic.byOutcome.end(),
                                          std::uint64_t{0}) == traffic.seizures &&
                              traffic.answered <= traffic.reached && traffic.reached <= traffic.seizures,
                          "outcomes add up to the seizures");
        }
    }

    std::uint64_t number = 0;
    calls::Figures figures;
    calls::Occupancy occupancy;

  private:
    std::set<std::uint64_t> heard_, ended_, gone_;
    std::map<std::uint64_t, std::uint64_t> owner_;  // calls by number of the frame
};

// Writes frames whose sequence numbers are right, so that the messages get through layer 2.
class Trunk {
  public:
    Trunk() : analysis_(options(), checked_) {}

    // An octet of what happens, one of time, and what the case takes.
    void step(fuzz::Input& input) {
        const std::uint8_t what = input.octet();
        const std::uint8_t time = input.octet();
        at_ += std::int64_t{time} * time * calls::millisecond;
        transmitted_ = (what & 0x80U) != 0;
        trunk_ = (what & 0x40U) != 0 ? 1 : 0;
        switch (what & 0x1FU) {
            case 31:
                analysis_.restarted(interfaces_[trunk_]);
                break;
            case 30:
                analysis_.mayMiss(interfaces_[trunk_], "Frames Lost");
                break;
            case 29:
                analysis_.advance(std::int64_t{time} * calls::second);
                break;
            case 28:
                at_ = 0;  // the board's clock falls
                break;
            case 27:
            case 26:
                unnumbered(input.octet());
                break;
            case 25:
                take(some(input, 16));
                break;
            default:
                message(input);
        }
    }
    void finish() {
        analysis_.finish();
        checked_.check(analysis_);
    }

  private:
    static calls::Options options() {
        calls::Options options;
        options.groups = {{"first", "second"}};
        return options;
    }
    static fuzz::Octets some(fuzz::Input& input, unsigned most) {
        fuzz::Octets octets(input.octet() % most);
        for (std::uint8_t& octet : octets)
            octet = input.octet();
        return octets;
    }

    fuzz::Octets address(bool command) const {
        return {static_cast<std::uint8_t>(command == transmitted_ ? 0x00 : 0x02),
                static_cast<std::uint8_t>(tei_ << 1U | 1U)};
    }
    void unnumbered(std::uint8_t which) {
        static constexpr std::array<std::uint8_t, 4> controls{0x7F, 0x53, 0x73, 0x1F};  // SABME, DISC, UA, DM
        fuzz::Octets octets = address(which % 4 < 2);
        octets.push_back(controls[which % 4]);
        if (which % 4 == 0)
            sent_[trunk_] = {};
        take(octets);
    }
    // SETUP and the others, of a few references, with one channel, cause or progress among other elements.
    void message(fuzz::Input& input) {
        static constexpr std::array<std::uint8_t, 32> types{
            0x05, 0x05, 0x02, 0x0D, 0x01, 0x03, 0x07, 0x0F, 0x45, 0x4D, 0x5A, 0x7B, 0x7D, 0x75, 0x46, 0x4E,
            0x24, 0x28, 0x30, 0x31, 0x33, 0x25, 0x2D, 0x26, 0x2E, 0x22, 0x64, 0x60, 0x62, 0x6E, 0x05, 0x00};
        const std::uint8_t kind = input.octet();
        const std::uint8_t reference = input.octet();
        tei_ = (reference & 0x40U) != 0 ? 64 : 0;
        fuzz::Octets octets = address(true);
        if ((reference & 0x30U) == 0x30U) {
            octets[1] = 0xFF;
            octets.push_back(0x03);
        } else {
            std::array<std::uint8_t, 2>& sent = sent_[trunk_][tei_];
            const std::size_t side = transmitted_ ? 0 : 1;
            octets.push_back(static_cast<std::uint8_t>(sent[side]++ << 1U));
            octets.push_back(static_cast<std::uint8_t>(sent[1 - side] << 1U));
        }
        const std::uint8_t protocol = kind >= 0xF0 ? 0x03 : 0x08;
        octets.insert(octets.end(),
                      {protocol, 0x01, static_cast<std::uint8_t>((reference & 0x80U) | (reference % 5)),
                       types[kind % types.size()]});
        const std::uint8_t elements = input.octet();
        const std::uint8_t value = input.octet();
        const auto bit8 = [](unsigned octet) { return static_cast<std::uint8_t>(0x80U | octet); };
        if ((elements & 1U) != 0)
            octets.insert(octets.end(), {0x04, 0x03, 0x80, 0x90, 0xA3});
        if ((elements & 2U) != 0)
            octets.insert(octets.end(), {0x08, 0x02, bit8(value % 11), bit8(value)});
        if ((elements & 4U) != 0)
            octets.insert(octets.end(),
                          {0x18, 0x03, bit8(0x20U | (value & 0x0CU) | 1U), 0x83, bit8(value % 4)});
        if ((elements & 8U) != 0)
            octets.insert(octets.end(), {0x1E, 0x02, 0x82, bit8(value % 11)});
        if ((elements & 16U) != 0)
            octets.insert(octets.end(), {0x79, 0x01, bit8(value % 8)});
        if ((elements & 32U) != 0)
            octets.insert(octets.end(), {0x00, 0x02, value, 0x05});
        if ((elements & 64U) != 0) {
            const fuzz::Octets more = some(input, 12);
            octets.insert(octets.end(), more.begin(), more.end());
        }
        take(octets);
    }
    void take(const fuzz::Octets& octets) {
        capture::Frame frame;
        frame.octets = octets;
        frame.transmitted = transmitted_;
        frame.clock = capture::Clock::absolute;
        frame.time = at_;
        frame.ticks = static_cast<std::uint32_t>(at_ / capture::nanosecondsPerTick);
        frame.interface = &interfaces_[trunk_];
        analysis_.take(frame, ++checked_.number);
    }

    Checked checked_;
    std::array<capture::Interface, 2> interfaces_{capture::Interface{"first"}, capture::Interface{"second"}};
    calls::Analysis analysis_;
    std::array<std::map<std::uint8_t, std::array<std::uint8_t, 2>>, 2> sent_;  // by D channel, TEI and side
    std::int64_t at_ = 0;
    std::uint8_t tei_ = 0;
    std::size_t trunk_ = 0;
    bool transmitted_ = false;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    fuzz::Input input(data, size);
    Trunk trunk;
    while (!input.atEnd())
        trunk.step(input);
    trunk.finish();
    return 0;
}
