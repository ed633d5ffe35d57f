#include "fleet/query/module.h"

#include <type_traits>
#include <utility>

extern "C" __attribute__((visibility("default"))) void lapdread_connect_store(
    fleet::StoreQuery query, std::unique_ptr<fleet::Store>& store) {
    store = fleet::connectStore(std::move(query));
}

static_assert(std::is_same_v<decltype(lapdread_connect_store), fleet::StoreModule>);
