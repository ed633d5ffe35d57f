// A stream that a test plays.
#ifndef TESTS_FLEET_FAKECARRIER_H
#define TESTS_FLEET_FAKECARRIER_H

#include <deque>
#include <string>

#include "fleet/Carrier.h"
#include "fleet/Nats.h"

namespace fleet_tests {

// Keeps what it is given, and answers what it is told to.
class FakeCarrier : public fleet::Carrier {
  public:
    void send(const std::string&, std::string_view, const std::string& id, std::uint64_t token) override {
        if (isDown)
            throw fleet::NatsError(fleet::NatsError::Reason::unreachable, "down");
        sent += id.substr(id.rfind('/', id.rfind('/') - 1) + 1) + ";";
        tokens.push_back(token);
    }
    std::optional<Answer> answer(std::chrono::milliseconds) override {
        if (answers.empty())
            return std::nullopt;
        const Answer next = answers.front();
        answers.pop_front();
        return next;
    }
    void accept(std::uint64_t token) { answers.push_back({token, true, false, false, ""}); }
    void refuse(std::uint64_t token) {
        answers.push_back({token, false, false, true, "maximum bytes exceeded", true});
    }

    bool isDown = false;
    std::string sent;  // first number and count of each parcel
    std::deque<std::uint64_t> tokens;
    std::deque<Answer> answers;
};

}  // namespace fleet_tests

#endif
