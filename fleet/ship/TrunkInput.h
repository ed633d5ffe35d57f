// The interface of an input: the frames of one D channel with their runs and numbers, which never change.
#ifndef FLEET_SHIP_TRUNKINPUT_H
#define FLEET_SHIP_TRUNKINPUT_H

#include <cstdint>
#include <optional>
#include <string>

#include "capture/Item.h"
#include "fleet/Parcel.h"
#include "recording/RecordState.h"

namespace fleet {

struct InputEvent {
    enum class Kind : std::uint8_t {
        item,  // `item` is frame `number`, or what the recorder said before frame `number`
        gap,   // the frames of `gap` are missing for good
        end    // the run has ended; if `gap` is set, frames from `number` on may be missing
    };

    Kind kind = Kind::item;
    std::uint64_t run = 0;
    std::uint64_t number = 0;
    capture::Item item;  // its views are valid until the next event is asked for
    bool isOld = false;  // it was shipped before; redaction must see it, and everybody else passes over it
    std::optional<ParcelGap> gap;
};

// Whether the item is a frame with a number of its own: a whole one, or one that is too long.
inline bool isNumbered(const capture::Item& item) {
    return item.isFrame() || item.kind == capture::Item::Kind::oversized;
}

class TrunkInput {
  public:
    TrunkInput() = default;
    TrunkInput(const TrunkInput&) = delete;
    TrunkInput& operator=(const TrunkInput&) = delete;
    virtual ~TrunkInput() = default;

    // Gives the next event; returns false if there is none just now. Each frame comes once, in the order of
    // runs and numbers. Throws capture::BadInput if the input cannot be read now; the caller may try again.
    virtual bool next(InputEvent& event) = 0;
    // Says what frames will come from and is not there yet, because a name may be spelt wrong. Empty if
    // everything is there.
    virtual std::string lacks() const = 0;
    // The log from which the present run is read, if it is a file that can be read a second time.
    virtual const std::optional<recording::RecordedLog>& log() const = 0;
};

}  // namespace fleet

#endif
