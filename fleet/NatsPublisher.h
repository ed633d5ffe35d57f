// Publishes messages over NATS without waiting for the answer to each.
#ifndef FLEET_NATSPUBLISHER_H
#define FLEET_NATSPUBLISHER_H

#include <functional>
#include <map>
#include <memory>
#include <string>

#include "fleet/Carrier.h"
#include "fleet/Nats.h"

namespace fleet {

// The answers are those of the stream that takes the subject. If the server does not permit a subject, an
// answer without a token says so, once for each subject. Used only by the thread that uses the connection.
class NatsPublisher final : public Carrier {
  public:
    // The connection must outlive this object. Throws NatsError.
    explicit NatsPublisher(NatsConnection& connection);
    ~NatsPublisher() override;

    void send(const std::string& subject, std::string_view text, const std::string& id,
              std::uint64_t token) override;
    std::optional<Answer> answer(std::chrono::milliseconds wait) override;

  private:
    std::optional<Answer> refused();

    struct Inbox;
    NatsConnection& connection_;
    std::unique_ptr<Inbox> inbox_;
    std::map<std::string, bool, std::less<>> subjects_;  // that were sent to; true: was told to be refused
};

}  // namespace fleet

#endif
