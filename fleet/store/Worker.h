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
    std::vector<unsigned> partitions;  // those that this thread looks after, as far as it can lease them
    std::chrono::seconds againAfter;   // what a dead lapdstore has fetched comes again after this time
    StoreFigures* figures = nullptr;   // where to tell what is done; outlives the worker
    unsigned number = 0;               // of the thread, there
};

// Says a line about what went wrong or went well. Called on the worker's thread.
using Say = std::function<void(const std::string& line)>;

// Works until `stopped`, with a connection to each of the two engines. If one of them is lost, or refuses, it
// says so and begins anew a second later. Partitions that another lapdstore has leased are tried every two
// seconds.
void work(const WorkerOptions& options, const std::atomic<bool>& stopped, const Say& say);

}  // namespace fleet

#endif
