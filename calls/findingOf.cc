#include "calls/findingOf.h"

#include <utility>

namespace calls {

Finding findingOf(const FindingKind& kind, const Moment& moment, const std::string& dChannel,
                  std::string sentence) {
    Finding finding;
    finding.kind = &kind;
    finding.severity = kind.severity;
    finding.clause = kind.clause;
    finding.frame = moment.frame;
    finding.clock = moment.clock;
    finding.time = moment.time;
    finding.dChannel = dChannel;
    finding.sentence = std::move(sentence);
    return finding;
}

Finding findingOf(const FindingKind& kind, const Message& message, const Call* call, std::string sentence) {
    const capture::Interface* const interface = message.frame->interface;
    Finding finding = findingOf(kind, momentOf(message),
                                interface == nullptr ? std::string() : interface->name, std::move(sentence));
    if (call != nullptr)
        finding.call = call->number;
    return finding;
}

Finding findingOf(const FindingKind& kind, const Moment& moment, const Call& call, std::string sentence) {
    Finding finding = findingOf(kind, moment, call.dChannel, std::move(sentence));
    finding.call = call.number;
    return finding;
}

std::string listOf(std::span<const std::string> words) {
    constexpr std::size_t most = 32;
    std::string list;
    for (std::size_t i = 0; i < words.size() && i < most; ++i)
        list += (i == 0 ? "" : ", ") + words[i];
    if (words.size() > most)
        list += " and " + std::to_string(words.size() - most) + " more";
    return list;
}

}  // namespace calls
