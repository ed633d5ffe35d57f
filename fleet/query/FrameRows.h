// Rows of lapd.frames as the items of a recording.
#ifndef FLEET_QUERY_FRAMEROWS_H
#define FLEET_QUERY_FRAMEROWS_H

#include <cstdint>
#include <optional>
#include <pqxx/pqxx>
#include <string>
#include <vector>

#include "capture/Form.h"
#include "capture/Item.h"
#include "fleet/Parcel.h"

namespace fleet {

// The columns that a SELECT must ask for, in this order.
inline constexpr char frameColumns[] =
    "run, number, time, sent, role, ticks, written, variant, octets, before";

// Takes the rows of one D channel in the order of runs and numbers, and gives the items of each row: what the
// recorder said before the frame, then the frame. Used by one thread at a time.
class FrameRows {
  public:
    // `name` is the D channel's name. `place` names the input in messages. The first row may have any number.
    FrameRows(std::string name, std::string place);
    FrameRows(const FrameRows&) = delete;
    FrameRows& operator=(const FrameRows&) = delete;

    // Takes a row and drops items of the row before that next() has not given. A row whose frame was taken
    // already, with another day, gives nothing. If numbers are missing before the frame, and the recorder has
    // not said so itself, an item of kind `lost` with their count comes first; a new run begins with an item
    // of kind `replaced`.
    void take(const pqxx::row& row);
    // Takes what the recorder said after a run's last frame, as the column `behind` of lapd.runs has it.
    // Drops items as take() does.
    void takeNotes(std::string_view json);

    // Gives the next item of what was taken; false if there is no more. The item's views are valid until the
    // next call, its interface as long as this object.
    bool next(capture::Item& item);

    // Run and number of the last row; 0 before the first one.
    std::uint64_t run() const { return run_; }
    std::uint64_t number() const { return number_; }

  private:
    void add(capture::Item::Kind kind, std::uint64_t count = 0);

    std::string name_;
    std::string place_;
    capture::Interfaces interfaces_;
    const capture::Interface* interface_;
    std::vector<ParcelItem> items_;
    std::size_t given_ = 0;
    std::uint64_t run_ = 0;
    std::uint64_t number_ = 0;
};

}  // namespace fleet

#endif
