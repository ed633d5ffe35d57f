// Messages out of a stream, each until it is acknowledged.
#ifndef FLEET_NATSCONSUMER_H
#define FLEET_NATSCONSUMER_H

#include <chrono>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "fleet/Nats.h"

namespace fleet {

// A message that was fetched. It owns what its views look into. One that is destroyed without a word to the
// stream is delivered again, once the consumer's time for acknowledging is over.
class NatsMessage {
  public:
    struct Handle;
    explicit NatsMessage(std::unique_ptr<Handle> handle);
    ~NatsMessage();
    NatsMessage(NatsMessage&&) noexcept;
    NatsMessage& operator=(NatsMessage&&) noexcept;

    std::string_view subject() const;
    std::string_view text() const;              // any octets
    std::string id() const;                     // Nats-Msg-Id, or empty
    std::uint64_t sequence() const;             // in the stream
    std::uint64_t deliveries() const;           // 1 when it is delivered for the first time
    std::chrono::nanoseconds storedAt() const;  // when the stream took it, since 1970

    // Each tells the stream, and throws NatsError if that cannot be sent. acknowledge() is done once it
    // returns: the server has confirmed it. The others are not confirmed.
    void acknowledge();
    void acknowledgeLater();                             // without waiting
    void deliverAgain(std::chrono::milliseconds delay);  // not before the delay is over
    void keepWaiting();                                  // starts the time for acknowledging anew
    void giveUp();                                       // never deliver it again

  private:
    std::unique_ptr<Handle> handle_;
};

struct ConsumerRules {
    std::string stream;
    std::string durable;  // its name, which no "." is in
    std::string filter;   // the subjects, "lapd.17.>"
    std::chrono::milliseconds forAcknowledging{30'000};
    std::uint32_t mostUnacknowledged = 10'000;
};

// A durable consumer that is asked for messages. Used by one thread at a time, the one that uses the
// connection.
class NatsConsumer {
  public:
    // Makes the consumer unless it is there with the same rules. The connection outlives it. Throws
    // NatsError.
    NatsConsumer(NatsConnection& connection, const ConsumerRules& rules);
    ~NatsConsumer();
    NatsConsumer(const NatsConsumer&) = delete;
    NatsConsumer& operator=(const NatsConsumer&) = delete;

    // At least one message, at most `most`; none if none comes within the time. Throws NatsError.
    std::vector<NatsMessage> fetch(std::size_t most, std::chrono::milliseconds wait);
    // How many messages the stream has for it that were not delivered yet. Throws NatsError.
    std::uint64_t waiting();

  private:
    struct Handle;
    std::unique_ptr<Handle> handle_;
};

}  // namespace fleet

#endif
