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

// Rows that a transaction has yet to write.
struct Results {
    std::vector<CallRow> calls;
    std::vector<FindingRow> findings;
    std::map<int, Outcomes> outcomes;  // by trunk, to be counted once the rows are written
};

// Reads frames in the order of their numbers, as far as none is missing, and hands them to the analysis that
// `lapdread calls` and `check` use. Whatever happened to its process, the rows are those of one reading of
// the whole run: a new Assembly first reads again what the one before it has read, and writes nothing while
// it does. Valid as long as every transaction that it was used in is committed. Used by one thread at a time.
class Assembly : private calls::Listener {
  public:
    Assembly(const RunKey& key, std::string trunkName, std::string place);

    // A frame of this day has come in since advance() read last. Days that were not told are not looked at,
    // but for the first time.
    void expect(const std::string& day);
    // Takes what can be taken now, and notes in lapd.runs how far it came.
    void advance(pqxx::transaction_base& work, Results& results);

    // The run has ended and nothing of it will change.
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
