// The right to write a partition: one lapdstore has it at a time.
#ifndef FLEET_STORE_LEASE_H
#define FLEET_STORE_LEASE_H

#include <pqxx/pqxx>

namespace fleet {

// An advisory lock of the database. It ends with the connection, however that ends; so what is written
// through this connection is written by whoever has the lease. The connection must outlive it.
class Lease {
  public:
    // Does not wait. Throws pqxx::failure.
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
