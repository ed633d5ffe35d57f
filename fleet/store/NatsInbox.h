// An Inbox over NATS JetStream.
#ifndef FLEET_STORE_NATSINBOX_H
#define FLEET_STORE_NATSINBOX_H

#include <optional>
#include <vector>

#include "fleet/NatsConsumer.h"
#include "fleet/store/Inbox.h"

namespace fleet {

// Uses the durable consumer "lapdstore-17" of the centre's stream for partition 17. Letters that this object
// has fetched and not acknowledged come again with the next fetch; if the object is destroyed before, they
// come again after `againAfter`. Throws NatsError. The connection must outlive this object.
class NatsInbox : public Inbox {
  public:
    NatsInbox(NatsConnection& connection, unsigned partition, std::chrono::seconds againAfter);

    std::vector<Letter> fetch(std::size_t most, std::chrono::milliseconds wait) override;
    void bury(const DeadLetter& dead) override;
    void acknowledge() override;

    // How many letters wait in the stream; nothing if somebody has deleted the consumer. No letter comes any
    // more then. A new NatsInbox makes the consumer anew, and gets all letters that the stream has.
    std::optional<std::uint64_t> waiting() { return consumer_.waiting(); }

  private:
    NatsConnection& connection_;
    NatsConsumer consumer_;
    std::vector<NatsMessage> held_;
};

// Deletes the consumer of the partition. Returns false if there was none. Throws NatsError.
bool rewind(NatsConnection& connection, unsigned partition);

}  // namespace fleet

#endif
