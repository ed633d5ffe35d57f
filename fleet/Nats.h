// A connection to NATS, and its errors.
#ifndef FLEET_NATS_H
#define FLEET_NATS_H

#include <chrono>
#include <cstdint>
#include <memory>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace fleet {

// Thrown when NATS refuses something or does not do it in time. what() says what was wanted, and why it
// failed.
class NatsError : public std::runtime_error {
  public:
    enum class Reason : std::uint8_t {
        unreachable,  // no server answers now
        refused,      // a server does not accept the certificate or the permission is missing
        full,         // the stream has no room
        timeout,      // no answer came; the stream may have stored the message
        other
    };

    NatsError(Reason why, const std::string& what) : std::runtime_error(what), reason(why) {}
    Reason reason;
};

struct NatsOptions {
    std::vector<std::string> servers;  // "tls://host:4222" or "nats://host:4222"; one suffices
    std::string name;                  // the program's name in the servers' monitoring
    // Files in PEM. Empty: no TLS, for a test on one machine.
    std::string authority;    // certificates of the authority that signs those of the servers
    std::string certificate;  // the client's own
    std::string key;
    std::chrono::milliseconds timeout{5000};  // of each request
};

// A connection that lasts as long as the object. If a server is lost, the library looks for a server again,
// without limit. Used by one thread at a time. The library has its own threads, which call none of our
// functions.
class NatsConnection {
  public:
    // Throws NatsError if no server takes the connection within the time.
    explicit NatsConnection(const NatsOptions& options);
    ~NatsConnection();
    NatsConnection(const NatsConnection&) = delete;
    NatsConnection& operator=(const NatsConnection&) = delete;

    bool isConnected() const;
    // "tls://127.0.0.1:4222"; empty while there is no connection.
    std::string server() const;
    // The server's name for its own process, a new one whenever it is started; empty while there is no
    // connection.
    std::string serverProcess() const;
    // What the server has said most recently when it did not permit something: "Permissions Violation for
    // Publish to ..."; empty if it has permitted everything on this connection. It does not answer such a
    // request.
    std::string refusal() const;

    using Headers = std::span<const std::pair<std::string, std::string>>;
    // Sends a message to the stream that takes the subject, and waits until the stream has stored it. Throws
    // NatsError.
    void publish(const std::string& subject, std::string_view text, const std::string& id,
                 Headers headers = {});

    // The library's objects, for the classes that use the connection.
    struct Handles;
    Handles& handles() const { return *handles_; }

  private:
    std::unique_ptr<Handles> handles_;
};

}  // namespace fleet

#endif
