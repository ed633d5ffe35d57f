// Who takes messages and answers when they are safe.
#ifndef FLEET_CARRIER_H
#define FLEET_CARRIER_H

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace fleet {

class Carrier {
  public:
    // What became of a message.
    struct Answer {
        // That send() was given. Nothing if no stream takes the subject, or none is reachable: the carrier
        // does not know which message that was.
        std::optional<std::uint64_t> token;
        bool isKept = false;  // the stream has it, also if it had it before
        bool isDuplicate = false;
        bool isFull = false;  // not kept, since the stream takes no more
        std::string error;    // why it is not kept
    };

    Carrier() = default;
    Carrier(const Carrier&) = delete;
    Carrier& operator=(const Carrier&) = delete;
    virtual ~Carrier() = default;

    // Sends a message and does not wait. Its answer may never come: whoever sends waits for a time and sends
    // again. A token may be used again. Throws NatsError if it cannot be sent now.
    virtual void send(const std::string& subject, std::string_view text, const std::string& id,
                      std::uint64_t token) = 0;
    // The next answer, in the order in which they come; nothing if none comes within the time. Throws
    // NatsError if there is no connection any more.
    virtual std::optional<Answer> answer(std::chrono::milliseconds wait) = 0;
};

}  // namespace fleet

#endif
