#include "reader/Seen.h"

namespace reader {

namespace {

using calls::Marks;

// clang-format off
constexpr MarkRow rows[] = {
    {"retransmitted",        [](const Seen& seen) { return seen.marks.retransmitted; }},
    {"out of sequence",      [](const Seen& seen) { return seen.marks.outOfSequence; }},
    {"not accepted",
     [](const Seen& seen) {
         return seen.marks.accepted == false && !seen.marks.outOfSequence && !seen.marks.retransmitted;
     }},
    {"REJ",                  [](const Seen& seen) { return seen.link.type == isdn::FrameType::REJ; }},
    {"poll unanswered",      [](const Seen& seen) { return seen.marks.pollUnanswered; }},
    {"link up",              [](const Seen& seen) { return seen.marks.linkUp; }},
    {"link down",            [](const Seen& seen) { return seen.marks.linkDown; }},
    {"set-up not recorded",  [](const Seen& seen) { return seen.marks.unseenSetUp; }},
    {"time goes back",       [](const Seen& seen) { return seen.timeGoesBack; }},
    {"contradicts the role", [](const Seen& seen) { return seen.marks.contradictsRole; }},
};
// clang-format on

}  // namespace

std::span<const MarkRow> markRows() { return rows; }

void appendMarks(std::string& to, const Seen& seen) {
    bool first = true;
    for (const MarkRow& row : rows) {
        if (!row.holds(seen))
            continue;
        if (!first)
            to += ", ";
        to += row.word;
        first = false;
    }
}

std::string_view direction(const Seen& seen) {
    if (seen.role == capture::Role::unknown)
        return "?>?";
    return seen.frame().transmitted == (seen.role == capture::Role::user) ? "U>N" : "N>U";
}

}  // namespace reader
