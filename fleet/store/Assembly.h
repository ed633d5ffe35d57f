// The calls and findings of one run, made of its frames as they are in the store.
#ifndef FLEET_STORE_ASSEMBLY_H
#define FLEET_STORE_ASSEMBLY_H

#include <cstdint>
#include <map>
#include <optional>
#include <pqxx/pqxx>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "calls/Analysis.h"
#include "fleet/query/FrameRows.h"
#include "fleet/store/CallRow.h"
#include "fleet/store/Figures.h"

namespace fleet {

// The rows that the transaction has to write next.
struct Results {
    std::vector<CallRow> calls;
    std::vector<FindingRow> findings;
    std::map<int, Outcomes> outcomes;  // by trunk, to be counted once the rows are written
};

// Reads the frames of a run in the order of their numbers, up to the first that is missing, and hands them to
// the analysis that `lapdread calls` and `check` use. The rows are always those of one reading of the whole
// run, also when the program was started again meanwhile: a new Assembly reads the run from its beginning,
// and gives no rows for frames that an earlier one has assembled. If a transaction in which an Assembly was
// used is not committed, destroy the Assembly and make a new one. Used by one thread at a time.
class Assembly : private calls::Listener {
  public:
    // `isGrouped`: the D channel is one of an NFAS group, so it may be the standby, and its calls may go on
    // over another one. Those that end with its link are not counted in the outcomes.
    Assembly(const RunKey& key, std::string trunkName, std::string place, bool isGrouped);

    // Says that a frame of this day ("2026-11-21") was stored since the last advance(). The first advance()
    // reads frames of all days, later ones only frames of the days that were named here, or later days.
    void expect(const std::string& day);
    // Reads and analyses the frames that can be read now, adds rows to `results`, and notes in lapd.runs how
    // far it came. Throws pqxx::failure.
    void advance(pqxx::transaction_base& work, Results& results);

    // Whether the run has ended and all of it is assembled, so that nothing of it will change.
    bool isFinished() const { return isFinished_; }
    // The number of the first frame that is missing, while there are later ones.
    std::optional<std::uint64_t> hole() const { return hole_; }

  private:
    void heard(const calls::Message& message, const calls::Call* call) override;
    void ended(const calls::Call& call) override;
    void gone(const calls::Call& call) override;
    void found(const calls::Finding& finding) override;

    void readState(pqxx::transaction_base& work);
    std::size_t readFrames(pqxx::transaction_base& work);
    bool mayPass(pqxx::transaction_base& work, std::uint64_t number);
    void feedItems();
    void finishIfEnded(pqxx::transaction_base& work);
    void remember(const calls::Call& call);
    void put(const calls::Call& call);
    void putOpen();
    void collect(Results& results);
    std::optional<bool> isLinkUp() const;

    RunKey key_;
    std::string name_;
    bool isGrouped_;
    FrameRows rows_;
    calls::Analysis analysis_;
    std::uint64_t next_ = 1;            // the frame that is analysed next
    std::uint64_t assembled_ = 0;       // those below it are in the tables; 0: not known yet
    bool isAnyDay_ = true;              // frames that were not read may be of any day
    std::optional<std::string> since_;  // else of this day or later; empty: there are none
    bool isFinished_ = false;
    std::optional<std::uint64_t> hole_;

    std::map<std::uint64_t, CallRow> changed_;  // calls, by their first frame
    std::map<std::uint64_t, CallRow> open_;     // as they were put last, by their first frame
    std::vector<std::pair<calls::Finding, std::uint32_t>> findings_;  // with their ordinals
    Outcomes outcomes_;
    std::map<std::uint64_t, std::uint64_t> firstFrames_;  // by number of the call
    std::map<std::pair<std::uint64_t, std::string_view>, std::uint32_t> ordinals_;
};

}  // namespace fleet

#endif
