// Writes the letters of one partition into the database.
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

// Is called with the name of each step in a transaction and after it: "copied", "assembled", "written",
// "committed", "buried", "acknowledged". Tests throw from it.
using Steps = std::function<void(std::string_view step)>;

// The caller holds the partition's Lease, so nobody else writes this partition. After an exception the object
// can be used again if its connection still works. Used by one thread at a time.
class Partition {
  public:
    // Makes the connection ready for writing, and reads which trunks the partition has, so that their figures
    // begin at 0. The connection must outlive this object. Throws pqxx::failure.
    Partition(
        pqxx::connection_base& connection, unsigned partition, Steps steps = [](std::string_view) {});

    // Writes the frames of the letters, the calls and findings that are made of them, and the place in the
    // stream, in one transaction. Returns the letters that are no parcels of this partition or that the
    // database refuses, after it has added them to the table of dead letters. Throws pqxx::failure.
    std::vector<DeadLetter> take(std::span<const Letter> letters);

    // Figures of what was committed.
    const PartitionFigures& figures() const { return figures_; }
    // The caller says, for the figures, how many letters wait in the stream, or that a fetch gave none.
    void sawWaiting(std::uint64_t letters) { figures_.waiting = letters; }
    void sawNone() { figures_.lag = 0; }

  private:
    struct Known {
        int id = 0;
        std::string name;
        std::string address;
        std::string group;  // NFAS, or empty
        bool isRedacted = false;
    };
    // What one transaction has read and has to write.
    struct Work;

    void store(std::span<const Letter> letters, std::vector<DeadLetter>& dead);
    std::vector<DeadLetter> bury(const Letter& letter, const std::exception& error);
    void forget();
    void beginFigures();
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

// Fetches letters once, stores them, buries those that cannot be stored, and acknowledges all. Returns how
// many there were. Throws what the inbox and the partition throw.
std::size_t moveOnce(Inbox& inbox, Partition& partition, std::chrono::milliseconds wait, const Steps& steps);

}  // namespace fleet

#endif
