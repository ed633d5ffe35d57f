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

// In order. They are the files of fleet/store/migrations, built in.
std::span<const Migration> migrations();

// The highest version that has been applied; 0 for an empty database. Throws pqxx::sql_error.
int schemaVersion(pqxx::transaction_base& work);

// Applies those that are missing, all in one transaction, and returns their names. Two that run at once wait
// for each other. Throws pqxx::sql_error; nothing has changed then.
std::vector<std::string_view> migrate(pqxx::connection_base& connection);

}  // namespace fleet

#endif
