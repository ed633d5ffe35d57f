// One partition of the stream, written into the store.
#ifndef FLEET_STORE_PARTITION_H
#define FLEET_STORE_PARTITION_H

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <pqxx/pqxx>
#include <set>
#include <span>
#include <string_view>
#include <vector>

#include "fleet/Parcel.h"
#include "fleet/store/Assembly.h"
#include "fleet/store/Figures.h"
#include "fleet/store/Inbox.h"

namespace fleet {

// Called at each step of a transaction and behind it, by name: "copied", "assembled", "written", "committed",
// "buried", "acknowledged". Tests throw from it.
using Steps = std::function<void(std::string_view step)>;

// Nobody else writes this partition: see Lease. After an exception it can be used again while its connection
// lives. Used by one thread at a time.
class Partition {
  public:
    // Makes the connection ready for writing. Throws pqxx::failure.
    Partition(
        pqxx::connection_base& connection, unsigned partition, Steps steps = [](std::string_view) {});

    // Writes the frames of the letters, the calls and findings that they complete, and the place in the
    // stream, in one transaction. Letters that are no parcels of this partition, or that the database does
    // not take, are the result; they are in the table of dead letters. Throws pqxx::failure.
    std::vector<DeadLetter> take(std::span<const Letter> letters);

    // Of what was committed.
    const PartitionFigures& figures() const { return figures_; }
    // For those who watch: how many letters wait in the stream; and that none came when some were asked for.
    void sawWaiting(std::uint64_t letters) { figures_.waiting = letters; }
    void sawNone() { figures_.lag = 0; }

  private:
    struct Known {
        int id = 0;
        std::string name;
        std::string address;
    };
    // What one transaction is about.
    struct Work;

    void store(std::span<const Letter> letters, std::vector<DeadLetter>& dead);
    std::vector<DeadLetter> bury(const Letter& letter, const std::exception& error);
    void forget();
    void takeParcel(Work& work, const Parcel& parcel);
    const Known& trunkOf(pqxx::transaction_base& work, const Parcel& parcel);
    void beginRun(pqxx::transaction_base& work, const RunKey& key, const Known& trunk);
    void writeFrames(Work& work);
    void assemble(Work& work);
    void count(Work& work, std::span<const Letter> letters);
    void writePlace(Work& work, std::span<const Letter> letters, const std::vector<DeadLetter>& dead);

    pqxx::connection_base& connection_;
    unsigned partition_;
    Steps steps_;
    PartitionFigures figures_;
    std::set<std::string> days_;  // that have a partition
    std::map<Address, Known> trunks_;
    std::map<RunKey, std::unique_ptr<Assembly>> runs_;  // that have not finished
};

// Fetches once, stores, buries, acknowledges. Returns how many letters there were.
std::size_t moveOnce(Inbox& inbox, Partition& partition, std::chrono::milliseconds wait, const Steps& steps);

}  // namespace fleet

#endif
