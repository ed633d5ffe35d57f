// One connection: a host, and the queue of the transport library that it has opened.
#ifndef RELAY_CLIENT_H
#define RELAY_CLIENT_H

#include <atomic>
#include <functional>
#include <string>
#include <thread>

#include "relay/forwarder.h"
#include "relay/log.h"
#include "relay/stream.h"
#include "relay/transport_queue.h"

namespace relay {

// Has a thread of its own, and one more while a queue is open. Nothing that a host sends, or does not send,
// ends more than its connection; then the queue and every buffer go back to the library.
class Client {
  public:
    // `ended` is called on the client's thread, last of all.
    Client(Descriptor socket, std::string name, Patience patience, Log log, std::function<void()> ended);
    ~Client();  // ends the connection at once
    Client(const Client&) = delete;
    Client& operator=(const Client&) = delete;

    // Takes no more frames; sends the host what its queue holds, and that the relay closes.
    void drain();
    void abort();
    bool ended() const { return ended_; }

  private:
    void run(const std::function<void()>& ended);
    void serve();
    Octets converse(TransportQueue& queue, Forwarder& forwarder);
    std::uint32_t takeMessages(TransportQueue& queue, Forwarder& forwarder);

    Stream host_;
    std::string name_;
    Log log_;
    std::atomic<bool> draining_{false};
    std::atomic<bool> ended_{false};
    std::thread thread_;
};

}  // namespace relay

#endif
