// Sends a host the messages that its queue receives.
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

// A thread that reads every message of the queue and sends it to the host. When the thread cannot go on, it
// shuts the connection down, so that the thread that reads the connection ends as well.
//
// The other functions are called by that other thread, the client's.
class Forwarder {
  public:
    Forwarder(TransportQueue& queue, Stream& host);
    // Unless finish() has been called, shuts the connection down and ends the thread at once; messages that
    // are still in the queue are not sent.
    ~Forwarder();
    Forwarder(const Forwarder&) = delete;
    Forwarder& operator=(const Forwarder&) = delete;

    // Returns when every message that was in the queue has been sent to the host. Throws Ended when that is
    // not possible.
    void catchUp();
    // Catches up, then ends the thread. The connection stays open.
    void finish();
    // Throws Ended with the reason if the thread could not go on.
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

    std::mutex lock_;  // guards marks_ and failure_
    std::condition_variable changed_;
    unsigned marks_ = 0;   // marks (TransportQueue::mark) that the thread has not read yet
    std::string failure_;  // why the thread could not go on; empty: it goes on

    std::thread thread_;
};

}  // namespace relay

#endif
