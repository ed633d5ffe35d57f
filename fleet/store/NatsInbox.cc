#include "fleet/store/NatsInbox.h"

#include <array>
#include <string>
#include <utility>

#include "fleet/streams.h"
#include "fleet/subjects.h"

namespace fleet {

namespace {

std::string consumerOf(unsigned partition) { return "lapdstore-" + std::to_string(partition); }

ConsumerRules rulesOf(unsigned partition, std::chrono::seconds againAfter) {
    ConsumerRules rules;
    rules.stream = centreStream;
    rules.durable = consumerOf(partition);
    rules.filter = subjectsOf(partition);
    rules.forAcknowledging = againAfter;
    return rules;
}

}  // namespace

NatsInbox::NatsInbox(NatsConnection& connection, unsigned partition, std::chrono::seconds againAfter)
    : connection_(connection), consumer_(connection, rulesOf(partition, againAfter)) {}

std::vector<Letter> NatsInbox::fetch(std::size_t most, std::chrono::milliseconds wait) {
    if (held_.empty())
        held_ = consumer_.fetch(most, wait);
    std::vector<Letter> letters;
    letters.reserve(held_.size());
    for (const NatsMessage& message : held_)
        letters.push_back({std::string(message.subject()), std::string(message.text()), message.sequence(),
                           message.storedAt()});
    return letters;
}

void NatsInbox::bury(const DeadLetter& dead) {
    const std::array<std::pair<std::string, std::string>, 1> reason{{{"Lapd-Reason", dead.reason}}};
    connection_.publish(deadSubjectOf(dead.letter.subject), dead.letter.text,
                        "dead/" + std::to_string(dead.letter.sequence), reason);
}

// Waits only until the server confirms the last acknowledgement. The connection keeps their order, so the
// server has taken all of them by then.
void NatsInbox::acknowledge() {
    for (std::size_t i = 0; i < held_.size(); ++i) {
        if (i + 1 < held_.size())
            held_[i].acknowledgeLater();
        else
            held_[i].acknowledge();
    }
    held_.clear();
}

bool rewind(NatsConnection& connection, unsigned partition) {
    return deleteConsumer(connection, centreStream, consumerOf(partition));
}

}  // namespace fleet
