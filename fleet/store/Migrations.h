// The store's schema, as numbered steps that are applied once each.
#ifndef FLEET_STORE_MIGRATIONS_H
#define FLEET_STORE_MIGRATIONS_H

#include <pqxx/pqxx>
#include <span>
#include <string_view>
#include <vector>

namespace fleet {

struct Migration {
    int version;
    std::string_view name;  // of its file: "001_tables"
    std::string_view sql;
};

// All steps in their order. The build makes them from the files in fleet/store/migrations.
std::span<const Migration> migrations();

// The highest version that has been applied; 0 for an empty database. Throws pqxx::sql_error.
int schemaVersion(pqxx::transaction_base& work);

// Applies the missing steps in one transaction and returns their names. If two programs migrate at once, the
// second waits for the first. Throws pqxx::sql_error; then nothing has changed.
std::vector<std::string_view> migrate(pqxx::connection_base& connection);

}  // namespace fleet

#endif
