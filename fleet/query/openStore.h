// Opens a fleet's store without linking the database's libraries into the program.
#ifndef FLEET_QUERY_OPENSTORE_H
#define FLEET_QUERY_OPENSTORE_H

#include <memory>

#include "fleet/query/Store.h"

namespace fleet {

// Loads the module store.so, which stays loaded, and has it connect to the store. The libraries of the
// database and what they load in turn take as long to start as all the rest of lapdread, so only readers of a
// store wait for them. The module is found from the program's own path: ../lib/lapdread/store.so beside its
// folder. Throws capture::BadInput if it cannot be loaded, and what connectStore() throws. The returned
// object's functions are in the module.
std::unique_ptr<Store> openStore(StoreQuery query);

}  // namespace fleet

#endif
