#include "calls/TeiWatch.h"

#include <string>
#include <utility>

#include "calls/FindingKinds.h"

namespace calls {

namespace {

// Message types of Q.921 table 8.
constexpr std::uint8_t assigned = 2, denied = 3, checkRequest = 4, checkResponse = 5, removed = 6;

}  // namespace

void TeiWatch::take(const Sample& sample, std::int64_t longest, std::vector<Observation>& found) {
    const isdn::TeiMessage message = isdn::parseTeiMessage(sample.layer2.information);
    if (message.problem != isdn::Problem::none)
        return;
    const auto observe = [&](const FindingKind& kind, std::string sentence) {
        found.push_back({&kind, kind.severity, sample.number, sample.at, std::move(sentence)});
    };
    const std::string tei = std::to_string(message.action);
    switch (message.type) {
        case denied:
            observe(findings::teiDenied, message.action == isdn::groupTei
                                             ? "the network has no TEI to give: every one is taken"
                                             : "the network denied TEI " + tei);
            break;
        case removed:
            observe(findings::teiRemoved, message.action == isdn::groupTei
                                              ? "the network removed the TEIs of all terminals"
                                              : "the network removed TEI " + tei);
            break;
        case assigned:
            if (!assigned_ && !assignedReported_)
                assigned_ = Observation{&findings::teiAssigned, findings::teiAssigned.severity, sample.number,
                                        sample.at, "the network assigned TEI " + tei + " on a primary rate"};
            break;
        case checkRequest:
            if (message.action == isdn::groupTei)
                answers_ = {};
            else
                answers_[message.action] = {};
            break;
        case checkResponse:
            answers(sample, message, longest, found);
            break;
        default:
            break;
    }
}

// A terminal chooses Ri at random for each answer. So two values for one TEI in the answers to one check show
// two terminals.
void TeiWatch::answers(const Sample& sample, const isdn::TeiMessage& message, std::int64_t longest,
                       std::vector<Observation>& found) {
    Answer& answer = answers_[message.action];
    if (answer.there && answer.reference != message.reference && sample.at - answer.at <= longest)
        found.push_back({&findings::teiDoubled, findings::teiDoubled.severity, sample.number, sample.at,
                         "two terminals answered a check for TEI " + std::to_string(message.action)});
    answer = {sample.at, message.reference, true};
}

std::optional<Observation> TeiWatch::isPrimary() {
    if (assigned_)
        assignedReported_ = true;
    return std::exchange(assigned_, std::nullopt);
}

}  // namespace calls
