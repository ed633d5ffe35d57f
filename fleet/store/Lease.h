// The right to write a partition. Only one lapdstore has it at a time.
#ifndef FLEET_STORE_LEASE_H
#define FLEET_STORE_LEASE_H

#include <pqxx/pqxx>

namespace fleet {

// An advisory lock of the database, held by a connection until this object is destroyed or the connection
// ends in any way. So write the partition only through this connection: no other lapdstore can then have the
// lease at the same time. The connection must outlive this object.
class Lease {
  public:
    // Tries to take the lease and does not wait; isHeld() says whether it has it. Throws pqxx::failure.
    Lease(pqxx::connection_base& connection, unsigned partition);
    ~Lease();
    Lease(const Lease&) = delete;
    Lease& operator=(const Lease&) = delete;

    bool isHeld() const { return isHeld_; }

  private:
    pqxx::connection_base& connection_;
    unsigned partition_;
    bool isHeld_;
};

}  // namespace fleet

#endif
