// The road from a queue to its host.
#ifndef RELAY_FORWARDER_H
#define RELAY_FORWARDER_H

#include <atomic>
#include <condition_variable>
#include <mutex>
#include <string>
#include <thread>

#include "relay/stream.h"
#include "relay/transport_queue.h"

namespace relay {

// A thread that sends every message of the queue to the host. When it cannot go on, it shuts the connection
// down, so that whoever reads it notices too.
class Forwarder {
  public:
    Forwarder(TransportQueue& queue, Stream& host);
    // Ends at once; what the queue holds is left. Shuts the connection down unless finish() has been called.
    ~Forwarder();
    Forwarder(const Forwarder&) = delete;
    Forwarder& operator=(const Forwarder&) = delete;

    // Returns when the host has been sent all that was in the queue. Throws Ended when it cannot be.
    void catchUp();
    // Catches up and ends the thread; the connection stays.
    void finish();
    // Throws Ended with what has ended the thread, if something has.
    void check();

  private:
    void run();
    bool forward(Message msg);
    void fail(const std::string& why);
    bool met();
    void stop();

    TransportQueue& queue_;
    Stream& host_;
    std::atomic<bool> stopping_{false};

    std::mutex lock_;  // over the following
    std::condition_variable changed_;
    unsigned marks_ = 0;  // not met yet
    std::string failure_;

    std::thread thread_;
};

}  // namespace relay

#endif
