// Answers GET /metrics, and nothing else.
#ifndef FLEET_METRICS_HTTPANSWERER_H
#define FLEET_METRICS_HTTPANSWERER_H

#include <chrono>
#include <functional>
#include <memory>
#include <stdexcept>
#include <string>
#include <thread>

namespace fleet {

// The most that clients can cost this program.
struct HttpLimits {
    std::size_t mostConnections = 32;          // a further one ends the oldest
    std::size_t mostOctets = 8192;             // of a request
    std::chrono::milliseconds patience{5000};  // from a connection's beginning to its end
};

// An address that cannot be listened on. what() says which, and why.
class BadListenAddress : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// "127.0.0.1:9470", "[::1]:9470", or "9470" on 127.0.0.1. Names are not looked up. Port 0: the system
// chooses.
bool isListenAddress(const std::string& text);

// Owns a thread that listens and answers, one request for each connection. Whatever clients do, they cost no
// more than the limits allow, and delay neither each other nor the rest of the program.
class HttpAnswerer {
  public:
    // `compose` makes the text; it is called on the answerer's thread, and what it throws becomes an answer
    // with status 500. Throws BadListenAddress.
    HttpAnswerer(const std::string& address, std::function<std::string()> compose,
                 const HttpLimits& limits = {});
    ~HttpAnswerer();  // ends all connections
    HttpAnswerer(const HttpAnswerer&) = delete;
    HttpAnswerer& operator=(const HttpAnswerer&) = delete;

    // Where it listens, with the port that the system chose: "127.0.0.1:9470".
    const std::string& address() const { return address_; }

  private:
    class Loop;
    std::unique_ptr<Loop> loop_;
    std::string address_;
    std::jthread thread_;
};

}  // namespace fleet

#endif
