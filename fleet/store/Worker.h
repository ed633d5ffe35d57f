// One thread's share of the partitions: leases them, and moves their parcels into the store.
#ifndef FLEET_STORE_WORKER_H
#define FLEET_STORE_WORKER_H

#include <atomic>
#include <chrono>
#include <functional>
#include <string>
#include <vector>

#include "fleet/Nats.h"
#include "fleet/store/Figures.h"

namespace fleet {

struct WorkerOptions {
    std::string database;  // a URL for libpq
    NatsOptions nats;
    std::vector<unsigned> partitions;  // the partitions that this thread tries to lease
    std::chrono::seconds againAfter;   // letters that a dead lapdstore had fetched come again after this time
    StoreFigures* figures = nullptr;   // gets the figures unless it is null; must outlive the worker
    unsigned number = 0;               // this thread's number in the figures
    // How often the stream is asked how many letters of a partition wait, and whether its consumer is there.
    std::chrono::milliseconds betweenQuestions{10'000};
};

// Says a line about what went wrong or went well. Called on the worker's thread.
using Say = std::function<void(const std::string& line)>;

// Works until `stopped` is set, with a connection to PostgreSQL and one to NATS. If one of them fails, says
// so, gives all leases back and connects again a second later. Says each kind of trouble once until all is
// well. If only the stream refuses one partition, or if the partition's consumer was deleted, gives back that
// one. Tries every two seconds to lease the partitions that it does not have.
void work(const WorkerOptions& options, const std::atomic<bool>& stopped, const Say& say);

}  // namespace fleet

#endif
