#include "reader/report/Summary.h"

#include <string_view>

#include "reader/TimeText.h"
#include "reader/text.h"

namespace reader {

namespace {

using calls::LinkState;

// A few links have a sentence each; the others are counted.
constexpr std::size_t mostLinksNamed = 8;

std::string counted(std::uint64_t number, std::string_view word) {
    return std::to_string(number) + " " + std::string(word) + (number == 1 ? "" : "s");
}

std::string trace(const Overview& overview) {
    std::string sentence = "The trace has " + counted(overview.frames, "frame");
    if (overview.from.clock == capture::Clock::none)
        return sentence + (overview.frames == 0 ? "." : ", and no times.");
    sentence += ", from " + textOf(overview.from) + " to " + textOf(overview.until);
    return sentence + (overview.from.clock == capture::Clock::relative ? " seconds." : ".");
}

std::string link(const calls::LinkHistory::Key& key, const calls::LinkHistory::Standing& standing) {
    std::string sentence = "The link of " + safe(key.first);
    if (key.second != 0)
        sentence += ", TEI " + std::to_string(key.second) + ",";
    std::string since = textOf({standing.since.clock, standing.since.time});
    since = since.empty() ? " since frame " + std::to_string(standing.since.frame) : " since " + since;
    switch (standing.state) {
        case LinkState::up:
            sentence += standing.sawSetUp ? " has been up" + since : " has been up at least" + since;
            break;
        case LinkState::down:
        case LinkState::releasing:
            sentence += " has been down" + since;
            break;
        case LinkState::establishing:
            sentence += " has not come up: its set-up waits for an answer" + since;
            break;
        case LinkState::unknown:
            sentence += " may be up or down: nothing in the trace tells";
            break;
    }
    if (standing.downs != 0)
        sentence += "; it went down " + counted(standing.downs, "time");
    return sentence + ".";
}

void addLinks(std::vector<std::string>& sentences, const calls::LinkHistory& history) {
    std::size_t named = 0;
    std::uint64_t up = 0;
    std::uint64_t others = 0;
    for (const auto& [key, standing] : history.links()) {
        if (named++ < mostLinksNamed)
            sentences.push_back(link(key, standing));
        else
            ++(standing.state == LinkState::up ? up : others);
    }
    if (up + others != 0)
        sentences.push_back("Of " + counted(up + others, "more link") + ", " + std::to_string(up) +
                            (up == 1 ? " is up." : " are up."));
}

std::string were(std::uint64_t number) { return std::to_string(number) + (number == 1 ? " was" : " were"); }

void addCalls(std::vector<std::string>& sentences, const Overview& overview) {
    const calls::Traffic& us = overview.figures.traffic(calls::Side::us);
    const calls::Traffic& peer = overview.figures.traffic(calls::Side::peer);
    const std::uint64_t all = us.seizures + peer.seizures;
    std::string sentence = overview.filtered ? "Of the calls that the filters let through: " : "";
    if (all == 0)
        sentence += "There is no call whose beginning and result are in the trace.";
    else
        sentence += counted(all, "call") + ", " + std::to_string(us.seizures) + " begun by us and " +
                    std::to_string(peer.seizures) + " by the peer; " + were(us.answered + peer.answered) +
                    " answered, " + std::to_string(us.failed + peer.failed) + " failed.";
    sentences.push_back(sentence);
    const auto addRest = [&](std::uint64_t number, std::string_view words) {
        if (number != 0)
            sentences.push_back("Besides, not counted: " + counted(number, "call") + " " +
                                std::string(words) + ".");
    };
    addRest(us.beforeTrace + peer.beforeTrace, "from before the trace");
    addRest(us.open + peer.open, "still being set up at its end");
    addRest(us.gaveWay + peer.gaveWay, "that gave way to a crossing one");
    addRest(us.signalling + peer.signalling, "without a B channel");
}

std::string findings(const Overview& overview) {
    using enum calls::Severity;
    if (!overview.worst)
        return "There are no findings.";
    const calls::Finding& worst = *overview.worst;
    std::string sentence;
    for (const calls::Severity severity : {error, warning, note}) {
        sentence += sentence.empty() ? "" : ", ";
        sentence += counted(overview.findings[static_cast<std::size_t>(severity)], nameOf(severity));
    }
    sentence += "; the worst finding: " + std::string(nameOf(worst.severity)) + " " +
                std::string(worst.kind->id) + ", " + safe(worst.sentence) + " (frame " +
                std::to_string(worst.frame);
    if (worst.clock != capture::Clock::none)
        sentence += ", " + textOf({worst.clock, worst.time});
    return sentence + ").";
}

}  // namespace

std::vector<std::string> summaryOf(const Overview& overview) {
    std::vector<std::string> sentences{trace(overview)};
    if (overview.links.losses() != 0)
        sentences.push_back("Frames may be missing: the input says so " +
                            counted(overview.links.losses(), "time") + ".");
    addLinks(sentences, overview.links);
    addCalls(sentences, overview);
    sentences.push_back(findings(overview));
    return sentences;
}

}  // namespace reader
