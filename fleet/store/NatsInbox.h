// The letters of one partition out of JetStream.
#ifndef FLEET_STORE_NATSINBOX_H
#define FLEET_STORE_NATSINBOX_H

#include <vector>

#include "fleet/NatsConsumer.h"
#include "fleet/store/Inbox.h"

namespace fleet {

// A durable consumer of the centre's stream, "lapdstore-17". Letters that were fetched and not acknowledged
// are given again by the next fetch. Throws NatsError. The connection outlives it.
class NatsInbox : public Inbox {
  public:
    NatsInbox(NatsConnection& connection, unsigned partition, std::chrono::seconds againAfter);

    std::vector<Letter> fetch(std::size_t most, std::chrono::milliseconds wait) override;
    void bury(const DeadLetter& dead) override;
    void acknowledge() override;

    // How many letters wait in the stream.
    std::uint64_t waiting() { return consumer_.waiting(); }

  private:
    NatsConnection& connection_;
    NatsConsumer consumer_;
    std::vector<NatsMessage> held_;
};

}  // namespace fleet

#endif
