// Accepts hosts and keeps track of them.
#ifndef RELAY_SERVER_H
#define RELAY_SERVER_H

#include <chrono>
#include <functional>
#include <list>
#include <memory>
#include <vector>

#include "relay/cidr.h"
#include "relay/client.h"

namespace relay {

struct Options {
    Endpoint listen{0x7F000001, 6554};
    std::vector<Cidr> allow{};  // empty: this machine alone
    unsigned maxClients = 128;
    Patience patience{};
};

class Server {
  public:
    // Listens. Throws std::system_error.
    Server(const Options& options, Log log);
    ~Server();  // ends every connection
    Server(const Server&) = delete;
    Server& operator=(const Server&) = delete;

    Endpoint endpoint() const;  // with the port that the system chose

    // Serves until `stop` can be read; what is read from it is dropped. Then, having called `stopping`, lets
    // every connection drain, for no longer than the patience for a frame, or until `stop` can be read again.
    void run(
        int stop, const std::function<void()>& stopping = [] {});

  private:
    void awaitChange(int stop, int timeoutMs);
    void accept();
    bool admit(const Endpoint& peer);
    void reap();
    void drain(int stop);

    Options options_;
    Log log_;
    Descriptor listener_;
    Descriptor ended_;  // counts connections that have ended
    std::list<std::unique_ptr<Client>> clients_;
    bool stopped_ = false;
    bool full_ = false;  // no descriptors for more connections
};

}  // namespace relay

#endif
