// A trunk whose frames are told as stories, and what is found on its links.
#ifndef TESTS_CALLS_FOUNDONLINKS_H
#define TESTS_CALLS_FOUNDONLINKS_H

#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "calls/LinkFindings.h"
#include "tests/calls/Script.h"

namespace calls::testing {

class Collected : public FindingSink {
  public:
    void report(Finding finding) override { findings.push_back(std::move(finding)); }
    std::vector<Finding> findings;
};

// A trunk whose frames are told as stories; says at its end what was found, a line a finding:
// "severity identifier frame", and " xN" for more than one.
class Trunk {
  public:
    explicit Trunk(LinkFindings::Options options = {}) : findings_(std::move(options), collected_) {}

    Trunk& tell(std::string_view story, bool network = false) { return take(script(story, network)); }
    Trunk& take(const std::vector<ScriptFrame>& frames) {
        for (const ScriptFrame& scripted : frames) {
            at_ = scripted.at;
            channel_.take(frameOf(scripted), ++number_, at_);
            findings_.take(channel_);
        }
        return *this;
    }
    Trunk& advance(std::int64_t seconds) {
        findings_.advance(seconds * second);
        return *this;
    }
    Trunk& missing() {
        channel_.mayMiss("Frames Lost");
        findings_.lost("Frames Lost: 3");
        return *this;
    }
    Trunk& restarted() {
        channel_.restarted();
        findings_.restarted();
        return *this;
    }
    std::string found() {
        channel_.finish();
        findings_.finish(channel_);
        std::string text;
        for (const Finding& finding : collected_.findings) {
            text.append(nameOf(finding.severity)).append(" ").append(finding.kind->id);
            text += " " + std::to_string(finding.frame);
            if (finding.count > 1)
                text += " x" + std::to_string(finding.count);
            text += "\n";
        }
        return text;
    }
    const std::vector<Finding>& findings() const { return collected_.findings; }

  private:
    Collected collected_;
    DChannel channel_;
    LinkFindings findings_;
    std::uint64_t number_ = 0;
    std::int64_t at_ = 0;
};

inline std::string found(std::string_view story, LinkFindings::Options options = {}) {
    return Trunk(std::move(options)).tell(story).found();
}

// Polls of both sides every ten seconds, from one moment to another; with the N(R) of our side and of the
// other.
inline std::string idle(int from, int to, int ofUs = 0, int ofPeer = 0) {
    const std::string us = " > RR " + std::to_string(ofUs), peer = " < RR " + std::to_string(ofPeer);
    std::string story;
    for (int at = from; at <= to; at += 10) {
        const std::string time = std::to_string(at);
        story.append(time).append(us).append(" P\n").append(time).append(".01").append(peer).append(" F\n");
        story.append(time)
            .append(".5")
            .append(peer)
            .append(" P\n")
            .append(time)
            .append(".51")
            .append(us)
            .append(" F\n");
    }
    return story;
}

inline constexpr std::string_view up = "0 > SABME\n0.01 < UA\n";

}  // namespace calls::testing

#endif
