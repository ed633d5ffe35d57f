// One connection: a host, and the transport library's queue that it has opened.
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

// A client has a thread that reads what the host sends, and, while a queue is open, a second one that sends
// what the queue receives (Forwarder). Whatever the host does ends at most this connection. At the end the
// queue and all message buffers go back to the library.
class Client {
  public:
    // Starts the client's thread. That thread calls `ended` as the last thing it does. `name` begins the
    // client's lines in the log.
    Client(Descriptor socket, std::string name, Patience patience, Log log, std::function<void()> ended);
    ~Client();  // ends the connection at once and waits for the client's thread
    Client(const Client&) = delete;
    Client& operator=(const Client&) = delete;

    // Reads no more frames. The client's thread then sends the host what its queue holds and tells it that
    // the relay closes. Returns at once; any thread may call it.
    void drain();
    // Ends the connection. Returns at once; any thread may call it.
    void abort();
    // True once the client's thread has nothing more to do but to call `ended`.
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
