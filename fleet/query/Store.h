// The store of a fleet as an input: the frames of its D channels, each a capture::Reader.
#ifndef FLEET_QUERY_STORE_H
#define FLEET_QUERY_STORE_H

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "capture/Reader.h"

namespace fleet {

// What to read. Empty lists: all.
struct StoreQuery {
    std::string url;  // "postgresql://...", or what else libpq takes
    std::vector<std::string> sites;
    std::vector<std::string> trunks;    // names, or addresses (SITE/HOST/BOARD/DCHANNEL)
    std::optional<std::int64_t> since;  // nanoseconds since 1970
    std::optional<std::int64_t> until;
};

// A connection with one snapshot of the store: all that is read through it is of one moment. Used by one
// thread at a time.
class Store {
  public:
    struct Trunk {
        int id = 0;
        std::string address;  // "london/h1/0/1"
        std::string name;     // that of the D channel; its address if another one has the same name
        std::string site;
        std::string group;  // NFAS, of this site; empty: none
    };

    // Throws capture::BadInput if the store cannot be reached, has no schema that this program knows, or has
    // no such trunk or site.
    explicit Store(StoreQuery query);
    ~Store();
    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    // Those that the query names, by address.
    const std::vector<Trunk>& trunks() const;

    // Of these, the names of D channels that share their calls (NFAS): two at least in each group.
    std::vector<std::vector<std::string>> groups() const;

    // Reads the frames of a D channel, run after run. With times in the query it reads whole days (UTC), the
    // day in front of the first, and besides the days of the calls that were alive at its ends, so that these
    // calls are complete. Keeps the store open. Its functions throw capture::BadInput.
    std::unique_ptr<capture::Reader> read(const Trunk& trunk) const;

  private:
    class Snapshot;
    std::shared_ptr<Snapshot> snapshot_;
};

}  // namespace fleet

#endif
