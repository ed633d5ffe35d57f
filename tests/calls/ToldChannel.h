// D channels that are told as stories, and what the machine says of each frame.
#ifndef TESTS_CALLS_TOLDCHANNEL_H
#define TESTS_CALLS_TOLDCHANNEL_H

#include <gtest/gtest.h>

#include <sstream>
#include <string>

#include "calls/DChannel.h"
#include "tests/calls/Script.h"

namespace calls::testing {

inline std::string wordsOf(const Marks& marks) {
    std::string words;
    const auto add = [&](bool is, const std::string& word) {
        if (is)
            words += " " + word;
    };
    add(marks.role == capture::Role::user, "user");
    add(marks.role == capture::Role::network, "network");
    add(marks.command.has_value(), marks.command.value_or(false) ? "command" : "response");
    add(marks.accepted.has_value(), marks.accepted.value_or(false) ? "accepted" : "refused");
    add(marks.retransmitted, "again");
    add(marks.outOfSequence, "early");
    add(marks.pollUnanswered, "poll-unanswered");
    add(marks.linkUp, "link-up");
    add(marks.linkDown, "link-down");
    add(marks.unseenSetUp, "unseen-set-up");
    add(marks.contradictsRole, "contradicts");
    add(marks.keepAlive, "keep-alive");
    add(marks.answers.has_value(), "answers " + std::to_string(marks.answers.value_or(0)));
    return words + " " + std::string(nameOf(marks.state));
}

inline std::string wordsOf(const LinkEvent& event) {
    static constexpr const char* kinds[] = {"hole",         "nr-invalid",    "unseen-set-up",
                                            "set-up-again", "refused",       "unsolicited-answer",
                                            "frame-reject", "contradiction", "same-role"};
    static constexpr const char* losers[] = {"line", "recorder", "unknown"};
    std::ostringstream out;
    out << " [" << kinds[static_cast<std::size_t>(event.kind)] << " at " << event.frame;
    if (event.kind == LinkEvent::Kind::hole)
        out << ": " << event.hole.count << " from " << int{event.hole.first} << " by "
            << losers[static_cast<std::size_t>(event.by)];
    if (event.kind == LinkEvent::Kind::nrInvalid)
        out << ": " << int{event.number};
    out << "]";
    return out.str();
}

// What the machine says of each frame of a story, a line a frame: its number, late frames, marks, state,
// events.
class Told {
  public:
    explicit Told(DChannel& channel) : channel_(channel) {}

    std::string operator()(std::string_view story, bool network = false) {
        std::ostringstream out;
        for (const ScriptFrame& scripted : script(story, network)) {
            const Marks& marks = channel_.take(frameOf(scripted), ++number_, scripted.at);
            out << number_;
            for (const KeptFrame& late : channel_.late())
                out << " late " << late.number;
            out << wordsOf(marks);
            for (const LinkEvent& event : channel_.events())
                out << wordsOf(event);
            out << "\n";
        }
        return out.str();
    }
    std::string atEnd() {
        channel_.finish();
        std::string text;
        for (const LinkEvent& event : channel_.events())
            text += wordsOf(event);
        return text;
    }

  private:
    DChannel& channel_;
    std::uint64_t number_ = 0;
};

class DChannelTest : public ::testing::Test {
  protected:
    DChannel channel;
    Told told{channel};
};

}  // namespace calls::testing

#endif
