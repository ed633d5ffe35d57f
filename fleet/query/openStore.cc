#include "fleet/query/openStore.h"

#include <dlfcn.h>

#include <filesystem>
#include <system_error>
#include <utility>

#include "fleet/query/module.h"

namespace fleet {

namespace {

std::string modulePath() {
    std::error_code unknown;
    const std::filesystem::path program = std::filesystem::read_symlink("/proc/self/exe", unknown);
    return (program.parent_path() / ".." / LAPDREAD_MODULES / "store.so").lexically_normal();
}

StoreModule* load() {
    const std::string path = modulePath();
    void* const library = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
    void* const found = library == nullptr ? nullptr : dlsym(library, storeModuleName);
    if (found == nullptr)
        throw capture::BadInput(std::string("the store cannot be read: ") + dlerror());
    return reinterpret_cast<StoreModule*>(found);
}

}  // namespace

std::unique_ptr<Store> openStore(StoreQuery query) {
    static StoreModule* const connect = load();
    std::unique_ptr<Store> store;
    connect(std::move(query), store);
    return store;
}

}  // namespace fleet
