// A nats-server of the test's own, on a port and in a folder of its own.
#ifndef TESTS_FLEET_NATSSERVER_H
#define TESTS_FLEET_NATSSERVER_H

#include <sys/types.h>

#include <filesystem>
#include <string>

#include "fleet/Nats.h"

namespace fleet_tests {

// Certificates for all tests of a process: those of the fleet, and in a folder of another authority a client
// that calls itself by the same name.
class Certificates {
  public:
    static const Certificates& get();
    std::string file(const std::string& name) const { return folder_ / name; }
    std::string strangersFile(const std::string& name) const { return strangers_ / name; }

  private:
    Certificates();
    ~Certificates();
    std::filesystem::path folder_;
    std::filesystem::path strangers_;
};

class NatsServer {
  public:
    enum class Security { none, certificates };

    // With certificates, "admin" may do all, "shipper" may publish below "lapd." only, "leeds" may publish
    // frames of the site leeds only, and "store" may do what lapdstore does. Throws std::runtime_error if the
    // server does not start.
    explicit NatsServer(Security security = Security::none);
    // Kills it.
    ~NatsServer();
    NatsServer(const NatsServer&) = delete;
    NatsServer& operator=(const NatsServer&) = delete;

    // Kills the server as kill -9 does. What it has stored stays.
    void kill();
    // Removes all that the killed server has stored.
    void lose() const;
    // Starts it again on the same port, and returns when it takes connections.
    void start();
    // Stops the server's process until thaw().
    void freeze();
    void thaw();

    fleet::NatsOptions options(const std::string& user = "admin") const;

  private:
    void writeConfiguration() const;

    Security security_;
    std::filesystem::path folder_;
    pid_t process_ = -1;
    int said_ = -1;  // its standard error stream
    int port_ = -1;  // -1: the server chooses one
};

}  // namespace fleet_tests

#endif
