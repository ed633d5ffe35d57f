// Writes rows into a table through COPY and a staging table, so that rows which are there already are passed
// over or replaced.
#ifndef FLEET_STORE_COPYINTO_H
#define FLEET_STORE_COPYINTO_H

#include <array>
#include <cstddef>
#include <pqxx/pqxx>
#include <string>
#include <vector>

#include "fleet/store/sql_text.h"

namespace fleet {

// A table of the schema, and its staging table, which exists as long as the connection and is empty between
// transactions.
template <std::size_t width>
struct StagedTable {
    std::string name;                        // without the schema
    std::array<std::string, width> columns;  // of the rows
    std::string onConflict;                  // "DO NOTHING", "(key) DO UPDATE SET ..."

    // Makes the staging table. Call this once for each connection, outside a transaction. Throws
    // pqxx::failure.
    void prepare(pqxx::connection_base& connection) const;
    // Writes the rows. Call this at most once in a transaction. Returns how many rows were added or replaced.
    // Throws pqxx::failure.
    std::size_t put(pqxx::transaction_base& work, const std::vector<Row<width>>& rows) const;
};

template <std::size_t width>
void StagedTable<width>::prepare(pqxx::connection_base& connection) const {
    pqxx::work work(connection);
    work.exec0("SET LOCAL client_min_messages = warning");
    work.exec0("CREATE TEMPORARY TABLE IF NOT EXISTS new_" + name + " (LIKE lapd." + name +
               " INCLUDING DEFAULTS) ON COMMIT DELETE ROWS");
    work.commit();
}

template <std::size_t width>
std::size_t StagedTable<width>::put(pqxx::transaction_base& work, const std::vector<Row<width>>& rows) const {
    if (rows.empty())
        return 0;
    pqxx::stream_to stream(work, "new_" + name, columns);
    // The stream escapes each value, and writes null pointers as NULL.
    for (const Row<width>& row : rows) {
        std::array<const char*, width> values{};
        for (std::size_t i = 0; i < width; ++i)
            values[i] = row[i] ? row[i]->c_str() : nullptr;
        stream << values;
    }
    stream.complete();
    const std::string list = pqxx::separated_list(", ", columns.begin(), columns.end());
    return work
        .exec("INSERT INTO lapd." + name + " (" + list + ") SELECT " + list + " FROM new_" + name +
              " ON CONFLICT " + onConflict)
        .affected_rows();
}

}  // namespace fleet

#endif
