// Calls and findings as rows of the store.
#ifndef FLEET_STORE_CALLROW_H
#define FLEET_STORE_CALLROW_H

#include <cstdint>
#include <optional>
#include <tuple>

#include "calls/Call.h"
#include "calls/Finding.h"
#include "fleet/store/CopyInto.h"

namespace fleet {

// A run of a D channel, as the tables know it.
struct RunKey {
    int trunk = 0;
    std::uint64_t run = 0;

    auto operator<=>(const RunKey&) const = default;
};

// The row of a call. It replaces the earlier row of the same call.
using CallRow = Row<35>;
const StagedTable<std::tuple_size_v<CallRow>>& callsTable();
CallRow rowOf(const RunKey& run, const calls::Call& call);

using FindingRow = Row<10>;
const StagedTable<std::tuple_size_v<FindingRow>>& findingsTable();
// `ordinal` distinguishes findings of one kind at one frame. `firstFrame` is the first frame of the call that
// the finding is about; nothing if it is about none.
FindingRow rowOf(const RunKey& run, const calls::Finding& finding, std::uint32_t ordinal,
                 std::optional<std::uint64_t> firstFrame);

}  // namespace fleet

#endif
