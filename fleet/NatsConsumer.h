// Fetches messages from a stream, which delivers each again until it is acknowledged.
#ifndef FLEET_NATSCONSUMER_H
#define FLEET_NATSCONSUMER_H

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "fleet/Nats.h"

namespace fleet {

// A message that was fetched. It owns the octets of its views. If it is destroyed without an answer to the
// stream, the stream delivers it again after the consumer's time for acknowledging.
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

    // Answers to the stream. They throw NatsError if the answer cannot be sent. acknowledge() waits for the
    // server's confirmation; the others do not.
    void acknowledge();
    void acknowledgeLater();                             // without waiting
    void deliverAgain(std::chrono::milliseconds delay);  // not before the delay is over
    void keepWaiting();                                  // restarts the time for acknowledging
    void giveUp();                                       // never deliver it again

  private:
    std::unique_ptr<Handle> handle_;
};

struct ConsumerRules {
    std::string stream;
    std::string durable;  // the consumer's name, without "."
    std::string filter;   // the subjects of its messages, "lapd.17.>"
    std::chrono::milliseconds forAcknowledging{30'000};
    std::uint32_t mostUnacknowledged = 10'000;
};

// A durable consumer from which messages are fetched. Used only by the thread that uses the connection.
class NatsConsumer {
  public:
    // Makes the consumer in the server, unless it exists with the same rules. The connection must outlive
    // this object. Throws NatsError.
    NatsConsumer(NatsConnection& connection, const ConsumerRules& rules);
    ~NatsConsumer();
    NatsConsumer(const NatsConsumer&) = delete;
    NatsConsumer& operator=(const NatsConsumer&) = delete;

    // Waits for messages and returns at least one and at most `most`; returns none if none comes within the
    // time, or if somebody has deleted the consumer: NATS does not tell these apart, but waiting() does.
    // Throws NatsError.
    std::vector<NatsMessage> fetch(std::size_t most, std::chrono::milliseconds wait);
    // How many messages of the stream have not been delivered to this consumer yet; nothing if somebody has
    // deleted it. Throws NatsError.
    std::optional<std::uint64_t> waiting();

  private:
    struct Handle;
    std::unique_ptr<Handle> handle_;
};

// Deletes a durable consumer, so that the next one of this name gets again all messages that the stream
// has. Returns false if there was none. Throws NatsError.
bool deleteConsumer(NatsConnection& connection, const std::string& stream, const std::string& durable);

}  // namespace fleet

#endif
