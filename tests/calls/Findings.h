// Runs a script through the call machine and those who look for faults, and collects what they find.
#ifndef TESTS_CALLS_FINDINGS_H
#define TESTS_CALLS_FINDINGS_H

#include <limits>
#include <string>
#include <vector>

#include "calls/CallFindings.h"
#include "calls/Waits.h"
#include "tests/calls/CallScript.h"

namespace calls::test {

// "12 setup-unanswered", a line each: the frame and the identifier.
class Found : public FindingSink {
  public:
    void report(Finding finding) override {
        lines += std::to_string(finding.frame) + " " + std::string(finding.kind->id) + "\n";
        findings.push_back(std::move(finding));
    }
    std::string lines;
    std::vector<Finding> findings;
};

// A link that has always been up and acknowledges everything, unless a test changes it.
class HealthyLink : public LinkWitnesses {
  public:
    HealthyLink() {
        own.heard = {true, true};
        own.acknowledged = {~0ULL, ~0ULL};
        own.wholeUntil = {std::numeric_limits<std::int64_t>::max(), std::numeric_limits<std::int64_t>::max()};
    }
    const LinkWitness* witness(std::uint8_t) const override { return &own; }
    LinkWitness own;
};

// Both observers, in the order in which the program has them.
class Watched : public CallObserver {
  public:
    Watched(const Timers& timers, const LinkWitnesses& links, FindingSink& sink)
        : waits(timers, links, sink), findings(timers, links, sink) {}
    void heard(Call& call, const Message& message) override {
        waits.heard(call, message);
        findings.heard(call, message);
    }
    void ended(Call& call, const Message* by) override {
        waits.ended(call, by);
        findings.ended(call, by);
    }
    void gone(const Call& call) override { findings.gone(call); }
    void replaced(Call& old, Call& by, const Message& message) override {
        findings.replaced(old, by, message);
    }
    void stray(const Message& message) override { findings.stray(message); }

    Waits waits;
    CallFindings findings;
};

// The findings of a script whose trace ends at `until` milliseconds.
inline std::string findingsOf(const CallScript& script, std::int64_t until,
                              const LinkWitnesses& link = HealthyLink()) {
    const Timers timers;
    Found found;
    CallNumbers numbers;
    Watched watched(timers, link, found);
    CallTable table(timers, numbers, watched);
    for (const Sent& sent : script.frames()) {
        const Message message = script.toMessage(sent);
        watched.waits.advance(message.at);
        if (table.take(message) == nullptr)
            watched.findings.heardWithoutCall(message);
    }
    watched.waits.advance(until * millisecond);
    table.advance(until * millisecond);
    watched.waits.finish();
    table.finish();
    return found.lines;
}

}  // namespace calls::test

#endif
