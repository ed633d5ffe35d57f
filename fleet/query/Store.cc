#include "fleet/query/Store.h"

#include <algorithm>
#include <map>
#include <pqxx/pqxx>
#include <utility>

#include "fleet/inOneLine.h"
#include "fleet/query/FrameRows.h"
#include "fleet/subjects.h"

namespace fleet {

namespace {

constexpr int schemaNeeded = 1;
constexpr char rowsAtOnce[] = "2000";
constexpr std::int64_t nanosecondsPerSecond = 1'000'000'000;

[[noreturn]] void fail(const std::exception& error) {
    throw capture::BadInput("the store: " + inOneLine(error.what()));
}

bool isNamed(const std::vector<std::string>& names, const std::string& name) {
    return std::find(names.begin(), names.end(), name) != names.end();
}

// The transaction is open as long as the object lives.
class Snapshot {
  public:
    using Trunk = Store::Trunk;

    explicit Snapshot(StoreQuery query)
        : query_(std::move(query)), connection_(query_.url), work_(connection_) {
        checkSchema();
        findTrunks();
        checkNames();
    }

    const StoreQuery& query() const { return query_; }
    const std::vector<Trunk>& trunks() const { return trunks_; }
    pqxx::transaction_base& work() { return work_; }
    std::string newCursor() { return "frames_" + std::to_string(++cursors_); }

  private:
    void checkSchema() {
        const bool isThere = work_.exec1("SELECT to_regclass('lapd.migrations') IS NOT NULL")[0].as<bool>();
        if (!isThere || work_.exec1("SELECT max(version) FROM lapd.migrations")[0].as<int>() < schemaNeeded)
            throw capture::BadInput(
                "the store: it has no tables of lapdstore (lapdstore migrate makes them)");
    }

    void findTrunks() {
        std::map<std::string, int> count;
        for (const pqxx::row& row :
             work_.exec("SELECT trunk, site, host, board, dchannel, name, nfas, redacted FROM "
                        "lapd.trunks ORDER BY 2, 3, 4, 5")) {
            const Address address{row[1].c_str(), row[2].c_str(), row[3].c_str(), row[4].c_str()};
            Trunk trunk{row[0].as<int>(), toText(address), row[5].c_str(),
                        address.site,     row[6].c_str(),  row[7].as<bool>()};
            ++count[trunk.name];
            all_.push_back({address.site, trunk});
            if ((query_.sites.empty() || isNamed(query_.sites, address.site)) &&
                (query_.trunks.empty() || isNamed(query_.trunks, trunk.name) ||
                 isNamed(query_.trunks, trunk.address)))
                trunks_.push_back(std::move(trunk));
        }
        for (Trunk& trunk : trunks_) {
            if (count[trunk.name] > 1)
                trunk.name = trunk.address;
        }
    }

    // Refuses unknown names, because a misspelt name would look like a trunk on which nothing has happened.
    void checkNames() const {
        const auto refuse = [](const char* what, const std::string& name) {
            throw capture::BadInput("the store: it has no " + std::string(what) + " " + name);
        };
        for (const std::string& site : query_.sites) {
            if (std::none_of(all_.begin(), all_.end(), [&](const auto& each) { return each.first == site; }))
                refuse("site", site);
        }
        for (const std::string& name : query_.trunks) {
            if (std::none_of(all_.begin(), all_.end(), [&](const auto& each) {
                    return (query_.sites.empty() || isNamed(query_.sites, each.first)) &&
                           (each.second.name == name || each.second.address == name);
                }))
                refuse(query_.sites.empty() ? "trunk" : "trunk of these sites:", name);
        }
    }

    StoreQuery query_;
    pqxx::connection connection_;
    pqxx::transaction<pqxx::repeatable_read, pqxx::read_only> work_;
    std::vector<std::pair<std::string, Trunk>> all_;  // with their sites
    std::vector<Trunk> trunks_;
    unsigned cursors_ = 0;
};

// Reads the frames of whole days, and what the recorder said after the last frame of each run.
class TrunkReader : public capture::Reader {
  public:
    TrunkReader(std::shared_ptr<void> keeps, pqxx::transaction_base& work, const Store::Trunk& trunk,
                std::string cursor, const StoreQuery& query)
        : keeps_(std::move(keeps)),
          work_(work),
          id_(std::to_string(trunk.id)),
          cursor_(std::move(cursor)),
          rows_(trunk.name, trunk.address),
          isWhole_(!query.until) {
        work_.exec0("DECLARE " + cursor_ + " NO SCROLL CURSOR FOR SELECT " + frameColumns +
                    " FROM lapd.frames WHERE trunk = " + id_ + days(query) + " ORDER BY run, number");
    }

    Next next(capture::Item& item) override {
        try {
            while (!rows_.next(item)) {
                if (!takeMore())
                    return Next::end;
            }
            return Next::item;
        } catch (const capture::BadInput&) {
            throw;
        } catch (const std::exception& error) {
            fail(error);
        }
    }
    void wait(std::chrono::milliseconds /*most*/) override {}
    Progress progress() const override { return {}; }

  private:
    bool takeMore() {
        if (at_ == fetched_.size() && !isFetched_) {
            fetched_ = work_.exec(std::string("FETCH ") + rowsAtOnce + " FROM " + cursor_);
            at_ = 0;
            isFetched_ = fetched_.empty();
        }
        const bool isEnd = at_ == fetched_.size();
        const bool isNewRun = !isEnd && fetched_[at_][0].as<std::uint64_t>() != rows_.run();
        if ((isEnd || isNewRun) && takeBehind())
            return true;
        if (isEnd)
            return false;
        rows_.take(fetched_[at_++]);
        return true;
    }

    // Gives, once, what the recorder said after the last frame of a run. Returns false if that is nothing.
    bool takeBehind() {
        if (rows_.run() == told_ || (!isWhole_ && isFetched_))
            return false;
        told_ = rows_.run();
        const pqxx::result found = work_.exec_params(
            "SELECT behind FROM lapd.runs WHERE trunk = $1 AND run = $2 AND behind IS NOT NULL", id_, told_);
        if (found.empty())
            return false;
        rows_.takeNotes(found[0][0].c_str());
        return true;
    }

    // Returns " AND day >= ... AND day <= ...". Adds a day at each end, or more if a call was alive at that
    // moment, so that the call is read whole.
    std::string days(const StoreQuery& query) {
        std::string condition;
        const auto bound = [&](std::int64_t time, const char* compared, const char* least,
                               const char* instead) {
            const std::string at = "to_timestamp(" + std::to_string(time / nanosecondsPerSecond) + ")";
            condition += std::string(" AND day ") + compared + " (SELECT " + least + "((" + at +
                         " AT TIME ZONE 'UTC')::date" + instead + ", (SELECT " +
                         (*compared == '<' ? "max(coalesce(ended, last_at))" : "min(began)") +
                         " AT TIME ZONE 'UTC' FROM lapd.calls WHERE trunk = " + id_ + " AND began < " + at +
                         " AND (ended IS NULL OR ended > " + at + "))::date))";
        };
        if (query.since)
            bound(*query.since, ">=", "least", " - 1");
        if (query.until)
            bound(*query.until, "<=", "greatest", " + 1");
        return condition;
    }

    std::shared_ptr<void> keeps_;
    pqxx::transaction_base& work_;
    std::string id_;
    std::string cursor_;
    FrameRows rows_;
    bool isWhole_;  // up to the last frame there is
    pqxx::result fetched_;
    pqxx::result::size_type at_ = 0;
    bool isFetched_ = false;  // all rows were
    std::uint64_t told_ = 0;  // the run whose end was told
};

class Database : public Store {
  public:
    explicit Database(StoreQuery query) : snapshot_(std::make_shared<Snapshot>(std::move(query))) {}

    const std::vector<Trunk>& trunks() const override { return snapshot_->trunks(); }

    std::vector<std::vector<std::string>> groups() const override {
        std::map<std::pair<std::string, std::string>, std::vector<std::string>> byName;
        for (const Trunk& trunk : trunks()) {
            if (!trunk.group.empty())
                byName[{trunk.site, trunk.group}].push_back(trunk.name);
        }
        std::vector<std::vector<std::string>> groups;
        for (auto& [name, members] : byName) {
            if (members.size() > 1)
                groups.push_back(std::move(members));
        }
        return groups;
    }

    std::unique_ptr<capture::Reader> read(const Trunk& trunk) const override {
        try {
            return std::make_unique<TrunkReader>(snapshot_, snapshot_->work(), trunk, snapshot_->newCursor(),
                                                 snapshot_->query());
        } catch (const pqxx::failure& error) {
            fail(error);
        }
    }

  private:
    std::shared_ptr<Snapshot> snapshot_;
};

}  // namespace

std::unique_ptr<Store> connectStore(StoreQuery query) {
    try {
        return std::make_unique<Database>(std::move(query));
    } catch (const pqxx::failure& error) {
        fail(error);
    }
}

}  // namespace fleet
