#include "fleet/store/Lease.h"

#include <string>

namespace fleet {

namespace {

// Two numbers name a lock. The first one distinguishes our locks from those of other programs.
std::string lockOf(unsigned partition) {
    return "(hashtext('lapdstore'), " + std::to_string(partition) + ")";
}

}  // namespace

Lease::Lease(pqxx::connection_base& connection, unsigned partition)
    : connection_(connection), partition_(partition), isHeld_(false) {
    pqxx::nontransaction work(connection_);
    isHeld_ = work.exec1("SELECT pg_try_advisory_lock" + lockOf(partition_))[0].as<bool>();
}

Lease::~Lease() {
    try {
        if (isHeld_) {
            pqxx::nontransaction work(connection_);
            work.exec("SELECT pg_advisory_unlock" + lockOf(partition_));
        }
    } catch (const std::exception&) {
        // The connection is gone, and the lock with it.
        isHeld_ = false;
    }
}

}  // namespace fleet
