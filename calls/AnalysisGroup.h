// The part of the analysis that follows calls; links are followed elsewhere. Internal to calls/.
#ifndef CALLS_ANALYSISGROUP_H
#define CALLS_ANALYSISGROUP_H

#include <algorithm>
#include <array>
#include <cstdint>
#include <limits>
#include <string>
#include <utility>
#include <vector>

#include "calls/Analysis.h"
#include "calls/CallFindings.h"
#include "calls/CallTable.h"
#include "calls/Carriers.h"
#include "calls/Channels.h"
#include "calls/FindingKinds.h"
#include "calls/FindingSink.h"
#include "calls/LinkWitness.h"
#include "calls/Maintenance.h"
#include "calls/Patterns.h"
#include "calls/Waits.h"
#include "calls/findingOf.h"

namespace calls {

// The calls of one D channel, or of several that share their calls, and all that makes findings from them.
class Analysis::Group : public CallObserver, public LinkWitnesses, public FindingSink {
  public:
    Group(const Timers& timers, CallNumbers& numbers, Listener& listener)
        : listener_(listener),
          table_(timers, numbers, *this),
          waits_(timers, *this, *this),
          findings_(timers, *this, *this),
          maintenance_(timers, *this, *this),
          stuck_(timers, *this),
          channels_(timers, maintenance_, stuck_, *this),
          patterns_(stuck_, *this) {}

    // The time of `message` is on the group's clock.
    void take(const Message& message, const LinkWitness& link, Carriers& carriers) {
        links_[message.layer2.tei] = &link;
        maintenance_.take(message);
        const Call* const call = table_.take(message);
        const isdn::Layer3& layer3 = message.layer3;
        if (layer3.discriminator == isdn::callControl && layer3.hasCallReference &&
            layer3.callReference.global() && layer3.type == isdn::message::restartAcknowledge) {
            table_.restarted(message);
            channels_.restarted(message);
        }
        if (call == nullptr)
            findings_.heardWithoutCall(message);
        else
            noteChangeover(message);
        carriers.heard(message, call, carried_);
        listener_.heard(message, call);
    }
    const Carriers::Tell& carried() const { return carried_; }
    // The clock of one of its D channels has come to `at`. The clocks of several differ a little; the group's
    // own is the latest of them, so that it never goes back.
    void advance(std::int64_t at) {
        now_ = std::max(now_, at);
        waits_.advance(now_);
        findings_.advance();
        maintenance_.advance(now_);
        patterns_.advance(now_);
        channels_.advance(now_);
        stuck_.advance(now_);
        table_.advance(now_);
    }
    std::int64_t now() const { return now_; }
    // `mayCallsGoOn` says whether one of the group's D channels has a link now.
    void linkChanged(std::uint8_t tei, const Moment& moment, const std::string& dChannel, bool isUp,
                     bool mayCallsGoOn) {
        patterns_.linkChanged(moment, dChannel, isUp);
        if (mayCallsGoOn)
            table_.linkUp(tei);
        else
            table_.linkDown(tei, moment.at);
    }
    void finish() {
        waits_.finish();
        maintenance_.finish();
        patterns_.finish();
        stuck_.finish();
        table_.finish();
    }
    // Messages of the link of a TEI are missing in the trace.
    void framesLost(std::uint8_t tei) {
        table_.framesLost(tei);
        channels_.framesLost();
        stuck_.forget();
    }
    // The board of one of its D channels restarted.
    void boardRestarted() {
        table_.boardRestarted();
        waits_.boardRestarted();
        findings_.boardRestarted();
        maintenance_.boardRestarted();
        channels_.boardRestarted();
        stuck_.forget();
    }
    CallTable& table() { return table_; }
    const CallTable& table() const { return table_; }
    const Maintenance& maintenance() const { return maintenance_; }

    void heard(Call& call, const Message& message) override {
        waits_.heard(call, message);
        findings_.heard(call, message);
        channels_.heard(call, message);
    }
    void ended(Call& call, const Message* by) override {
        waits_.ended(call, by);
        findings_.ended(call, by);
        channels_.ended(call, by);
        patterns_.ended(call, by);
        if (call.endedBy != EndedBy::open)
            listener_.ended(call);
    }
    void gone(const Call& call) override {
        findings_.gone(call);
        channels_.gone(call);
        listener_.gone(call);
    }
    void replaced(Call& old, Call& by, const Message& message) override {
        findings_.replaced(old, by, message);
    }
    void stray(const Message& message) override { findings_.stray(message); }

    // cppcheck-suppress CastIntegerToAddressAtReturn; it takes the pointer for a number
    const LinkWitness* witness(std::uint8_t tei) const override { return links_[tei & 127U]; }
    void report(Finding finding) override {
        patterns_.linkFault(finding, now_);
        listener_.found(finding);
    }

  private:
    // The calls of a group are signalled on one of its D channels at a time.
    void noteChangeover(const Message& message) {
        const std::string& name = message.frame->interface->name;
        if (name == active_)
            return;
        if (const std::string before = std::exchange(active_, name); !before.empty()) {
            std::vector<std::string> alive;
            for (const Call* const call : table_.open())
                alive.push_back(std::to_string(call->number));
            report(findingOf(findings::changeover, message, nullptr,
                             "calls are signalled on " + name + " and not on " + before +
                                 " any more; alive: " + (alive.empty() ? "none" : listOf(alive))));
        }
    }

    Listener& listener_;
    std::int64_t now_ = std::numeric_limits<std::int64_t>::min();
    std::string active_;  // the D channel on which a call was heard last
    Carriers::Tell carried_ = [this](const Message& message, const Call* call) {
        listener_.carried(message, call);
    };
    std::array<const LinkWitness*, 128> links_{};  // by TEI, of the D channel that was used last
    CallTable table_;
    Waits waits_;
    CallFindings findings_;
    Maintenance maintenance_;
    StuckChannels stuck_;
    Channels channels_;
    Patterns patterns_;
};

}  // namespace calls

#endif
