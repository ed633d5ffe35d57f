#include "fleet/store/Partition.h"

#include <algorithm>
#include <iterator>
#include <tuple>
#include <utility>

#include "fleet/metrics/process.h"
#include "fleet/store/sql_text.h"

namespace fleet {

namespace {

constexpr std::size_t lettersAtOnce = 500;
constexpr std::size_t longestSubject = 300;
constexpr std::size_t longestReason = 300;

using FrameRow = Row<12>;

const StagedTable<std::tuple_size_v<FrameRow>>& framesTable() {
    static const StagedTable<std::tuple_size_v<FrameRow>> table{
        "frames",
        {"trunk", "run", "number", "day", "time", "sent", "role", "ticks", "written", "variant", "octets",
         "before"},
        "DO NOTHING"};
    return table;
}

template <class Number>
Field numberOf(const std::optional<Number>& number) {
    return number ? Field(std::to_string(*number)) : std::nullopt;
}

FrameRow rowOf(const RunKey& key, std::uint64_t number, const ParcelFrame& frame, capture::Variant variant) {
    const ParcelItem& item = frame.item;
    return {std::to_string(key.trunk),
            std::to_string(key.run),
            std::to_string(number),
            dayText(item.time.value_or(0)),
            std::to_string(item.time.value_or(0)),
            item.transmitted ? "t" : "f",
            std::to_string(static_cast<int>(item.role)),
            numberOf(item.ticks),
            numberOf(item.written),
            std::string(capture::variantName(variant)),
            item.kind == capture::Item::Kind::frame ? Field(octetsText(item.octets)) : std::nullopt,
            frame.before.empty() ? std::nullopt : Field(toText(frame.before))};
}

// Whether the values have caused the error, and not the connection or the server: SQLSTATE classes 22 (data)
// and 23 (constraints).
bool isAboutData(const pqxx::sql_error& error) {
    return error.sqlstate().starts_with("22") || error.sqlstate().starts_with("23");
}

// Sees to it that the server says "committed" only once the transaction is in its log. Otherwise a server
// that is killed could lose letters that were acknowledged to the stream.
void commitForGood(pqxx::connection_base& connection) {
    pqxx::nontransaction work(connection);
    work.exec(
        "SELECT set_config('synchronous_commit', 'on', false) "
        "WHERE current_setting('synchronous_commit') = 'off'");
}

Parcel parcelOf(const Letter& letter, unsigned partition) {
    const Subject subject = subjectIn(letter.subject);
    Parcel parcel = parcelIn(letter.text);
    if (subject != parcel.subject())
        throw BadParcel("it is about another D channel than its subject");
    if (subject.partition != partition)
        throw BadParcel("it is of another partition");
    return parcel;
}

}  // namespace

struct Partition::Work {
    explicit Work(pqxx::connection_base& connection) : transaction(connection) {}

    pqxx::work transaction;
    std::vector<FrameRow> frames;
    std::set<RunKey> touched;
    std::map<std::string, std::set<RunKey>> days;  // the days of the frames, each with the runs of its frames
    PartitionFigures figures;                      // what the transaction adds to them
    Results results;
};

Partition::Partition(pqxx::connection_base& connection, unsigned partition, Steps steps)
    : connection_(connection), partition_(partition), steps_(std::move(steps)) {
    framesTable().prepare(connection);
    callsTable().prepare(connection);
    findingsTable().prepare(connection);
    commitForGood(connection);
    beginFigures();
}

// A trunk that is known has its figures from now on. If they began with its next frames, a finding in these
// would be no increase, and raise no alert.
void Partition::beginFigures() {
    pqxx::nontransaction work(connection_);
    for (const pqxx::row& row : work.exec_params(
             "SELECT trunk, name, nfas, site, host, board, dchannel FROM lapd.trunks WHERE partition = $1",
             partition_)) {
        const Address at{row[3].c_str(), row[4].c_str(), row[5].c_str(), row[6].c_str()};
        TrunkFigures& figures = figures_.trunks[toText(at)];
        figures.trunk = row[0].as<int>();
        figures.name = row[1].c_str();
        figures.group = row[2].c_str();
        figures.site = at.site;
        figures.address = toText(at);
    }
}

std::vector<DeadLetter> Partition::take(std::span<const Letter> letters) {
    std::vector<DeadLetter> dead;
    try {
        store(letters, dead);
        figures_.deadLetters += dead.size();
        return dead;
    } catch (const pqxx::sql_error& error) {
        forget();
        if (!isAboutData(error))
            throw;
        if (letters.size() == 1)
            return bury(letters.front(), error);
    } catch (...) {
        forget();
        throw;
    }
    // One of the letters has caused the error. Store each alone, so that only that one becomes a dead letter.
    dead.clear();
    for (const Letter& letter : letters) {
        std::vector<DeadLetter> one = take({&letter, 1});
        std::move(one.begin(), one.end(), std::back_inserter(dead));
    }
    return dead;
}

// Forgets what a transaction that has failed has left in memory. The next one reads the tables again.
void Partition::forget() {
    days_.clear();
    trunks_.clear();
    runs_.clear();
}

std::vector<DeadLetter> Partition::bury(const Letter& letter, const std::exception& error) {
    const std::string reason = "the database does not take it: " + std::string(error.what());
    std::vector<DeadLetter> dead{{letter, printable(reason, longestReason)}};
    Work work(connection_);
    writePlace(work, {&letter, 1}, dead);
    work.transaction.commit();
    ++figures_.deadLetters;
    return dead;
}

void Partition::store(std::span<const Letter> letters, std::vector<DeadLetter>& dead) {
    Work work(connection_);
    for (const Letter& letter : letters) {
        try {
            takeParcel(work, parcelOf(letter, partition_));
        } catch (const BadParcel& error) {
            dead.push_back({letter, printable(error.what(), longestReason)});
        } catch (const BadSubject& error) {
            dead.push_back({letter, printable(error.what(), longestReason)});
        }
    }
    writeFrames(work);
    steps_("copied");
    assemble(work);
    writePlace(work, letters, dead);
    steps_("written");
    work.transaction.commit();
    count(work, letters);
    steps_("committed");
}

void Partition::takeParcel(Work& work, const Parcel& parcel) {
    const Known& trunk = trunkOf(work.transaction, parcel);
    const RunKey key{trunk.id, parcel.run};
    beginRun(work.transaction, key, trunk);
    work.touched.insert(key);
    TrunkFigures& figures = work.figures.trunks[trunk.address];
    figures.trunk = trunk.id;
    figures.site = parcel.address.site;
    figures.address = trunk.address;
    figures.name = parcel.trunk;
    figures.group = parcel.group;
    figures.frames += parcel.frames.size();
    capture::Variant variant = parcel.variant;
    std::uint64_t number = parcel.first;
    for (const ParcelFrame& frame : parcel.frames) {
        for (const ParcelItem& note : frame.before)
            variant = note.kind == capture::Item::Kind::run ? note.variant : variant;
        std::int64_t& newest = figures.newest[frame.item.transmitted ? 1 : 0];
        newest = std::max(newest, frame.item.time.value_or(0));
        work.frames.push_back(rowOf(key, number++, frame, variant));
        work.days[*work.frames.back()[3]].insert(key);
    }
    for (const ParcelGap& gap : parcel.gaps)
        figures.gaps += static_cast<std::uint64_t>(
            work.transaction
                .exec_params0("INSERT INTO lapd.gaps (trunk, run, first, last, reason) VALUES ($1, $2, $3, "
                              "$4, $5) ON CONFLICT DO NOTHING",
                              key.trunk, key.run, gap.first, gap.last, gap.why)
                .affected_rows());
    if (!parcel.end)
        return;
    const bool isOpenGap = !parcel.gaps.empty() && !parcel.gaps.back().last;
    work.transaction.exec_params0(
        "UPDATE lapd.runs SET ended = $3, behind = $4 WHERE trunk = $1 AND run = $2", key.trunk, key.run,
        isOpenGap ? parcel.gaps.back().first : number,
        parcel.end->empty() ? nullptr : toText(*parcel.end).c_str());
}

const Partition::Known& Partition::trunkOf(pqxx::transaction_base& work, const Parcel& parcel) {
    if (const auto known = trunks_.find(parcel.address);
        known != trunks_.end() && known->second.name == parcel.trunk && known->second.group == parcel.group &&
        known->second.isRedacted == parcel.isRedacted)
        return known->second;
    const Address& at = parcel.address;
    pqxx::result found = work.exec_params(
        "SELECT trunk FROM lapd.trunks WHERE site = $1 AND host = $2 AND board = $3 AND dchannel = $4 "
        "AND name = $5 AND nfas = $6 AND partition = $7 AND redacted = $8",
        at.site, at.host, at.board, at.dChannel, parcel.trunk, parcel.group, partition_, parcel.isRedacted);
    if (found.empty())
        found = work.exec_params(
            "INSERT INTO lapd.trunks (site, host, board, dchannel, name, nfas, partition, redacted) "
            "VALUES ($1, $2, $3, $4, $5, $6, $7, $8) ON CONFLICT (site, host, board, dchannel) DO UPDATE SET "
            "name = EXCLUDED.name, nfas = EXCLUDED.nfas, partition = EXCLUDED.partition, "
            "redacted = EXCLUDED.redacted RETURNING trunk",
            at.site, at.host, at.board, at.dChannel, parcel.trunk, parcel.group, partition_,
            parcel.isRedacted);
    return trunks_[at] = {found[0][0].as<int>(), parcel.trunk, toText(at), parcel.group, parcel.isRedacted};
}

void Partition::beginRun(pqxx::transaction_base& work, const RunKey& key, const Known& trunk) {
    std::unique_ptr<Assembly>& run = runs_[key];
    if (run != nullptr)
        return;
    work.exec_params0("INSERT INTO lapd.runs (trunk, run) VALUES ($1, $2) ON CONFLICT DO NOTHING", key.trunk,
                      key.run);
    run = std::make_unique<Assembly>(key, trunk.name, trunk.address, !trunk.group.empty());
}

void Partition::writeFrames(Work& work) {
    for (const auto& [day, runs] : work.days) {
        if (days_.insert(day).second)
            work.transaction.exec_params("SELECT lapd.make_day($1)", day);
        for (const RunKey& key : runs)
            runs_[key]->expect(day);
    }
    const std::size_t added = framesTable().put(work.transaction, work.frames);
    work.figures.frames = added;
    work.figures.doubles = work.frames.size() - added;
}

void Partition::assemble(Work& work) {
    for (const RunKey& key : work.touched)
        runs_[key]->advance(work.transaction, work.results);
    steps_("assembled");
    work.figures.calls = callsTable().put(work.transaction, work.results.calls);
    work.figures.findings = findingsTable().put(work.transaction, work.results.findings);
    std::erase_if(runs_, [](const auto& run) { return run.second->isFinished(); });
}

// Adds up the figures. Called when the transaction is committed.
void Partition::count(Work& work, std::span<const Letter> letters) {
    figures_.frames += work.figures.frames;
    figures_.doubles += work.figures.doubles;
    figures_.calls += work.figures.calls;
    figures_.findings += work.figures.findings;
    figures_.holes = static_cast<std::uint64_t>(std::count_if(
        runs_.begin(), runs_.end(), [](const auto& run) { return run.second->hole().has_value(); }));
    std::chrono::nanoseconds oldest = std::chrono::nanoseconds::max();
    for (const Letter& letter : letters)
        oldest = std::min(oldest, letter.storedAt);
    figures_.lag = oldest.count() == 0 ? 0 : std::max<std::int64_t>(nanosecondsNow() - oldest.count(), 0);
    for (auto& [address, more] : work.figures.trunks) {
        more.outcomes = work.results.outcomes[more.trunk];
        figures_.trunks[address].add(more);
    }
}

void Partition::writePlace(Work& work, std::span<const Letter> letters, const std::vector<DeadLetter>& dead) {
    for (const DeadLetter& each : dead)
        work.transaction.exec_params0(
            "INSERT INTO lapd.dead_letters (sequence, subject, reason) VALUES ($1, $2, $3) ON CONFLICT DO "
            "NOTHING",
            each.letter.sequence, printable(each.letter.subject, longestSubject), each.reason);
    std::uint64_t last = 0;
    for (const Letter& letter : letters)
        last = std::max(last, letter.sequence);
    work.transaction.exec_params0(
        "INSERT INTO lapd.positions AS p (partition, sequence) VALUES ($1, $2) ON CONFLICT (partition) DO "
        "UPDATE "
        "SET sequence = greatest(p.sequence, EXCLUDED.sequence), at = now()",
        partition_, last);
}

std::size_t moveOnce(Inbox& inbox, Partition& partition, std::chrono::milliseconds wait, const Steps& steps) {
    const std::vector<Letter> letters = inbox.fetch(lettersAtOnce, wait);
    if (letters.empty())
        return 0;
    for (const DeadLetter& dead : partition.take(letters))
        inbox.bury(dead);
    steps("buried");
    inbox.acknowledge();
    steps("acknowledged");
    return letters.size();
}

}  // namespace fleet
