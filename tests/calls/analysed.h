// What the whole analysis finds in a script.
#ifndef TESTS_CALLS_ANALYSED_H
#define TESTS_CALLS_ANALYSED_H

#include <string>
#include <vector>

#include "calls/Analysis.h"
#include "tests/calls/CallScript.h"

namespace calls::test {

class Collected : public Listener {
  public:
    void gone(const Call& call) override { calls.push_back(call); }
    void found(const Finding& finding) override {
        lines += std::to_string(finding.frame) + " " + std::string(finding.kind->id) + "\n";
        findings.push_back(finding);
    }
    std::string lines;  // "12 setup-unanswered", a line each
    std::vector<Finding> findings;
    std::vector<Call> calls;
};

// Hands the script to an analysis. The trace ends `quiet` milliseconds after the last frame.
inline void analyse(const CallScript& script, Listener& listener, std::int64_t quiet = 0) {
    Analysis analysis({}, listener);
    std::uint64_t number = 0;
    for (const Sent& sent : script.frames())
        analysis.take(sent.frame, ++number);
    analysis.advance(quiet * millisecond);
    analysis.finish();
}

inline std::string findingsIn(const CallScript& script, std::int64_t quiet = 0) {
    Collected collected;
    analyse(script, collected, quiet);
    return collected.lines;
}

}  // namespace calls::test

#endif
