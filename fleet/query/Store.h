// The store of a fleet as an input: a capture::Reader for each of its D channels.
#ifndef FLEET_QUERY_STORE_H
#define FLEET_QUERY_STORE_H

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "capture/Reader.h"

namespace fleet {

// What to read. An empty list means all.
struct StoreQuery {
    std::string url;  // "postgresql://...", or anything else that libpq takes
    std::vector<std::string> sites;
    std::vector<std::string> trunks;    // names, or addresses (SITE/HOST/BOARD/DCHANNEL)
    std::optional<std::int64_t> since;  // nanoseconds since 1970
    std::optional<std::int64_t> until;
};

// A connection to the database with one transaction, so that everything that is read through it shows the
// store at one moment. Used by one thread at a time, together with its readers. The class is abstract because
// lapdread takes it from a module that it loads (openStore.h).
class Store {
  public:
    struct Trunk {
        int id = 0;
        std::string address;  // "london/h1/0/1"
        std::string name;     // that of the D channel; its address if another one has the same name
        std::string site;
        std::string group;        // NFAS, of this site; empty: none
        bool isRedacted = false;  // its shipper sends pseudonyms in place of numbers
    };

    virtual ~Store() = default;

    // The D channels that the query chooses, in the order of their addresses.
    virtual const std::vector<Trunk>& trunks() const = 0;

    // The NFAS groups among them: the names of the D channels of each group, at least two.
    virtual std::vector<std::vector<std::string>> groups() const = 0;

    // Makes a reader of the frames of a D channel, run after run. If the query has times, the reader gives
    // whole days (UTC): from the day before `since` to the day after `until`, and further days if a call was
    // alive at `since` or `until`, so that this call is complete. The reader keeps the connection open, also
    // when this object is gone. Its functions throw capture::BadInput.
    virtual std::unique_ptr<capture::Reader> read(const Trunk& trunk) const = 0;
};

// Connects to the store. Throws capture::BadInput if the store cannot be reached, has no schema that this
// program knows, or has no such trunk or site.
std::unique_ptr<Store> connectStore(StoreQuery query);

}  // namespace fleet

#endif
