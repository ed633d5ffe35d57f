// Accepts the connections of hosts and owns them.
#ifndef RELAY_SERVER_H
#define RELAY_SERVER_H

#include <chrono>
#include <functional>
#include <list>
#include <memory>
#include <vector>

#include "relay/cidr.h"
#include "relay/client.h"
#include "service/notify.h"

namespace relay {

struct Options {
    Endpoint listen{0x7F000001, 6554};
    std::vector<Cidr> allow{};  // who may connect; empty: only this machine
    unsigned maxClients = 128;
    Patience patience{};
};

// The functions are called on one thread.
class Server {
  public:
    // Begins to listen. Throws std::system_error when it cannot.
    Server(const Options& options, Log log);
    ~Server();  // ends every connection
    Server(const Server&) = delete;
    Server& operator=(const Server&) = delete;

    Endpoint endpoint() const;  // where it listens, with the port that the system chose

    // Accepts connections until the descriptor `stop` can be read, and reads from it. Then calls `stopping`,
    // lets every connection drain, and returns when all have ended, when the patience for a frame is over, or
    // when `stop` can be read again. Connections that are left are ended at once. All the while it tells a
    // service manager that asks for it that it still serves.
    void run(
        int stop, const std::function<void()>& stopping = [] {});

  private:
    void awaitChange(int stop, int timeoutMs);
    int orNextBeat(int timeoutMs) const;
    void accept();
    bool admit(const Endpoint& peer);
    void reap();
    void drain(int stop);

    Options options_;
    Log log_;
    service::Heartbeat heartbeat_;
    Descriptor listener_;
    Descriptor ended_;  // an event counter: clients count it up as they end
    std::list<std::unique_ptr<Client>> clients_;
    bool stopped_ = false;  // `stop` could be read
    bool full_ = false;     // the system has no descriptor for another connection
};

}  // namespace relay

#endif
