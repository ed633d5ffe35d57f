#include "fleet/store/Migrations.h"

#include <string>

namespace fleet {

namespace {

// clang-format off
constexpr Migration steps[] = {
#include "fleet_migrations.inc"
};
// clang-format on

}  // namespace

std::span<const Migration> migrations() { return steps; }

int schemaVersion(pqxx::transaction_base& work) {
    if (work.exec1("SELECT to_regclass('lapd.migrations') IS NULL")[0].as<bool>())
        return 0;
    return work.exec1("SELECT coalesce(max(version), 0) FROM lapd.migrations")[0].as<int>();
}

std::vector<std::string_view> migrate(pqxx::connection_base& connection) {
    pqxx::work work(connection);
    work.exec0("SET LOCAL client_min_messages = warning");
    work.exec1("SELECT pg_advisory_xact_lock(hashtext('lapd.migrate'))");
    const int applied = schemaVersion(work);
    std::vector<std::string_view> done;
    for (const Migration& step : migrations()) {
        if (step.version <= applied)
            continue;
        work.exec(std::string(step.sql));
        if (step.version == 1)
            work.exec0(
                "CREATE TABLE lapd.migrations (version integer PRIMARY KEY, name text NOT NULL, "
                "at timestamptz NOT NULL DEFAULT now())");
        work.exec_params0("INSERT INTO lapd.migrations (version, name) VALUES ($1, $2)", step.version,
                          std::string(step.name));
        done.push_back(step.name);
    }
    work.commit();
    return done;
}

}  // namespace fleet
