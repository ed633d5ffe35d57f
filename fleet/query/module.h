// What lapdread and its module store.so agree on. Both are built together, from the same headers.
#ifndef FLEET_QUERY_MODULE_H
#define FLEET_QUERY_MODULE_H

#include <memory>

#include "fleet/query/Store.h"

namespace fleet {

// connectStore(), with its result in `store`. Throws what that throws.
using StoreModule = void(StoreQuery query, std::unique_ptr<Store>& store);
inline constexpr char storeModuleName[] = "lapdread_connect_store";

}  // namespace fleet

#endif
