// Frames through an analysis and a redactor, as the program does it.
#ifndef TESTS_REDACTION_REDACTED_H
#define TESTS_REDACTION_REDACTED_H

#include <algorithm>
#include <cstdint>
#include <map>
#include <span>
#include <string>
#include <vector>

#include "calls/Analysis.h"
#include "redaction/Redactor.h"
#include "tests/calls/CallScript.h"

namespace redaction::test {

using Bytes = std::vector<std::uint8_t>;

// Puts the same in the place of everything, so that nothing of the original shows.
class ConstantPseudonyms : public Pseudonyms {
  public:
    void replaceCharacters(std::span<std::uint8_t> octets, std::string& before,
                           Characters /*kind*/) override {
        before.append(octets.begin(), octets.end());
        std::replace_if(
            octets.begin(), octets.end(), [](std::uint8_t octet) { return octet != '*' && octet != '#'; },
            'x');
    }
    void replaceOctets(std::span<std::uint8_t> octets) override {
        std::fill(octets.begin(), octets.end(), std::uint8_t{0xEE});
    }
};

struct Passed {
    Bytes octets;
    bool transmitted = false;
};

inline std::vector<Passed> passedIn(const calls::test::CallScript& script) {
    std::vector<Passed> passed;
    for (const calls::test::Sent& sent : script.frames())
        passed.push_back({sent.octets, sent.frame.transmitted});
    return passed;
}

// The frames come back in their order, each at its place; 40 ms lie between them.
inline std::vector<Passed> redacted(const std::vector<Passed>& frames, Pseudonyms& pseudonyms,
                                    isdn::Variant variant = isdn::Variant::net5, bool blankShort = false) {
    Redactor redactor(pseudonyms, blankShort);
    calls::Options options;
    options.variant = variant;
    calls::Analysis analysis(options, redactor);
    const capture::Interface trunk{"trunk"};
    std::map<std::uint64_t, Bytes> done;
    const auto collect = [&](std::vector<Rebuilt>& rebuilt) {
        for (Rebuilt& each : rebuilt)
            done[each.number] = std::move(each.octets);
        rebuilt.clear();
    };
    std::vector<Rebuilt> rebuilt;
    std::uint64_t number = 0;
    for (const Passed& each : frames) {
        capture::Frame frame;
        frame.octets = each.octets;
        frame.transmitted = each.transmitted;
        frame.role = capture::Role::user;
        frame.clock = capture::Clock::relative;
        frame.time = static_cast<std::int64_t>(number) * 40 * calls::millisecond;
        frame.interface = &trunk;
        redactor.expect(++number);
        const calls::Marks marks = analysis.take(frame, number);
        redactor.take(frame, marks, variant, rebuilt);
        collect(rebuilt);
    }
    redactor.giveUpSegments(rebuilt);
    collect(rebuilt);
    std::vector<Passed> all;
    for (std::size_t i = 0; i < frames.size(); ++i)
        all.push_back({done.at(i + 1), frames[i].transmitted});
    return all;
}

inline Key keyOf(std::uint8_t seed) {
    Key key;
    key.secret.fill(seed);
    return key;
}

inline std::string textOf(const Bytes& octets) {
    constexpr std::string_view digits = "0123456789abcdef";
    std::string text;
    for (const std::uint8_t octet : octets) {
        text += text.empty() ? "" : " ";
        text += {digits[octet >> 4U], digits[octet & 15U]};
    }
    return text;
}

inline bool holds(const Bytes& octets, std::string_view text) {
    return std::search(octets.begin(), octets.end(), text.begin(), text.end(), [](std::uint8_t a, char b) {
               return a == static_cast<std::uint8_t>(b);
           }) != octets.end();
}

}  // namespace redaction::test

#endif
