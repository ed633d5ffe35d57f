// Publishes messages over NATS without waiting for the answer to each.
#ifndef FLEET_NATSPUBLISHER_H
#define FLEET_NATSPUBLISHER_H

#include <memory>

#include "fleet/Carrier.h"
#include "fleet/Nats.h"

namespace fleet {

// The answers are those of the stream that takes the subject. Used only by the thread that uses the
// connection.
class NatsPublisher final : public Carrier {
  public:
    // The connection must outlive this object. Throws NatsError.
    explicit NatsPublisher(NatsConnection& connection);
    ~NatsPublisher() override;

    void send(const std::string& subject, std::string_view text, const std::string& id,
              std::uint64_t token) override;
    std::optional<Answer> answer(std::chrono::milliseconds wait) override;

  private:
    struct Inbox;
    NatsConnection& connection_;
    std::unique_ptr<Inbox> inbox_;
};

}  // namespace fleet

#endif
