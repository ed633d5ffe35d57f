// The interface through which a shipper sends messages to a stream and gets the stream's answers.
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
        // The token that send() was given with the message. Empty if no stream took a message: the carrier
        // does not know then which message it was.
        std::optional<std::uint64_t> token;
        bool isKept = false;         // the stream has the message
        bool isDuplicate = false;    // the stream had it before
        bool isFull = false;         // not kept, because the stream has no room
        std::string error;           // why it is not kept
        bool isAtLimit = false;      // not kept, because the stream's own limit is reached
        std::uint64_t sequence = 0;  // its number in the stream, if it is kept; 0: not known
    };

    Carrier() = default;
    Carrier(const Carrier&) = delete;
    Carrier& operator=(const Carrier&) = delete;
    virtual ~Carrier() = default;

    // Sends a message and does not wait for its answer. The answer may never come. The caller then sends the
    // message again, with the same `id`, which the stream recognises, and the same `token`. Throws NatsError
    // if the message cannot be sent now.
    virtual void send(const std::string& subject, std::string_view text, const std::string& id,
                      std::uint64_t token) = 0;
    // Returns the next answer, or nothing if none comes within `wait`. Answers come in any order. Throws
    // NatsError if there is no connection any more.
    virtual std::optional<Answer> answer(std::chrono::milliseconds wait) = 0;
};

}  // namespace fleet

#endif
