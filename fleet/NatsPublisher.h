// Messages into a stream, many of them on their way at a time.
#ifndef FLEET_NATSPUBLISHER_H
#define FLEET_NATSPUBLISHER_H

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "fleet/Nats.h"

namespace fleet {

// Used by one thread at a time, the one that uses the connection.
class NatsPublisher {
  public:
    // What became of a message.
    struct Answer {
        // That send() was given. Nothing if no stream takes the subject, or none is reachable: the library
        // does not say which message that was.
        std::optional<std::uint64_t> token;
        bool isKept = false;  // the stream has it, also if it had it before
        bool isDuplicate = false;
        bool isFull = false;  // not kept, since the stream takes no more
        std::string error;    // why it is not kept
    };

    // The connection outlives it. Throws NatsError.
    explicit NatsPublisher(NatsConnection& connection);
    ~NatsPublisher();
    NatsPublisher(const NatsPublisher&) = delete;
    NatsPublisher& operator=(const NatsPublisher&) = delete;

    // Sends a message and does not wait. Its answer may never come if the connection is lost: whoever sends
    // waits for a time and sends again. A token may be used again. Throws NatsError if it cannot be sent now.
    void send(const std::string& subject, std::string_view text, const std::string& id, std::uint64_t token);
    // The next answer, in the order in which they come; nothing if none comes within the time. Throws
    // NatsError if the connection is closed for good.
    std::optional<Answer> answer(std::chrono::milliseconds wait);

  private:
    struct Inbox;
    NatsConnection& connection_;
    std::unique_ptr<Inbox> inbox_;
};

}  // namespace fleet

#endif
