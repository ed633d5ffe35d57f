// What stories about calls consist of. Our side is the user.
#ifndef TESTS_CALLS_CALLSTORIES_H
#define TESTS_CALLS_CALLSTORIES_H

#include <string>

#include "calls/Analysis.h"
#include "tests/calls/CallScript.h"

namespace calls::test {

namespace m = isdn::message;

class Identifiers : public Listener {
  public:
    void found(const Finding& finding) override { lines.append(finding.kind->id).append("\n"); }
    std::string lines;
};

// `after` seconds pass behind the last frame.
inline std::string found(const CallScript& script, std::int64_t after = 0, const Options& options = {}) {
    Identifiers identifiers;
    Analysis analysis(options, identifiers);
    std::uint64_t number = 0;
    for (const Sent& sent : script.frames())
        analysis.take(sent.frame, ++number);
    analysis.advance(after * second);
    analysis.finish();
    return identifiers.lines;
}

// A link that is up and has carried a call.
inline CallScript begun() {
    CallScript script;
    script.at(0).linkUp().at(100).us(m::setup, 1, false, {bearerSpeech()});
    script.at(105).peer(m::releaseComplete, 1, true, {cause(17)});
    script.acknowledge(Side::us);
    return script;
}

// A call of our side, answered.
inline void talk(CallScript& s, std::int64_t at, std::uint16_t ref, std::uint8_t number) {
    s.at(at).us(m::setup, ref, false, {bearerSpeech(), channel(number), called("4021")});
    s.at(at + 20).peer(m::callProceeding, ref, true, {channel(number)});
    s.at(at + 40).peer(m::connect, ref, true);
    s.at(at + 60).us(m::connectAcknowledge, ref, false).acknowledge(Side::peer);
}

inline void clear(CallScript& s, std::int64_t at, std::uint16_t ref) {
    s.at(at).us(m::disconnect, ref, false, {cause(16)});
    s.at(at + 20).peer(m::release, ref, true);
    s.at(at + 40).us(m::releaseComplete, ref, false).acknowledge(Side::peer);
}

// A SETUP that is refused with a cause.
inline void refused(CallScript& s, std::int64_t at, std::uint16_t ref, std::uint8_t value,
                    const std::string& number = "4021") {
    s.at(at).us(m::setup, ref, false, {bearerSpeech(), called(number)});
    s.at(at + 20).peer(m::releaseComplete, ref, true, {cause(value, 2)});
}

}  // namespace calls::test

#endif
