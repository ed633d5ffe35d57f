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

// What a SELECT must ask for, in this order.
inline constexpr char frameColumns[] =
    "run, number, time, sent, role, ticks, written, variant, octets, before";

// Takes the rows of one D channel in the order of runs and numbers. Gives a row as the recorder's notes in
// front of the frame, then the frame. Used by one thread at a time.
class FrameRows {
  public:
    // `name` is that of the D channel, `place` what messages call the input. The frame numbered `next` of
    // `run` is expected first; without them whatever comes first is.
    FrameRows(std::string name, std::string place);
    FrameRows(const FrameRows&) = delete;
    FrameRows& operator=(const FrameRows&) = delete;

    // A frame that came before, on another day, is passed over. Frames that are missing between the one
    // before and this one are an item of their own (lost); a new run begins with one as well (replaced).
    void take(const pqxx::row& row);
    // What the recorder said behind the last frame of a run: the text of a column.
    void takeNotes(std::string_view json);

    // The next item of what was taken; false if there is no more. Valid until the next call of this class;
    // interfaces as long as this.
    bool next(capture::Item& item);

    // Of the last row.
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
