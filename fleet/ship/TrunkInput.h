// The frames of one D channel as they are recorded, with the numbers that they have for ever.
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
        item,  // `item`: a frame that has `number`, or what the recorder said before the frame with it
        gap,   // frames that nobody will ever get, those of `gap`
        end    // the run has ended; frames behind `number` may be missing if `gap` is set
    };

    Kind kind = Kind::item;
    std::uint64_t run = 0;
    std::uint64_t number = 0;
    capture::Item item;  // its views are valid until the next event is asked for
    bool isOld = false;  // was shipped before; for those who must see what precedes the first new frame
    std::optional<ParcelGap> gap;
};

// Whether it is a frame that has a number of its own.
inline bool isNumbered(const capture::Item& item) {
    return item.isFrame() || item.kind == capture::Item::Kind::oversized;
}

class TrunkInput {
  public:
    TrunkInput() = default;
    TrunkInput(const TrunkInput&) = delete;
    TrunkInput& operator=(const TrunkInput&) = delete;
    virtual ~TrunkInput() = default;

    // False if there is nothing just now. Frames come once each, in the order of their numbers, runs in the
    // order of time. Throws capture::BadInput for an input that cannot be read now; it may be asked again.
    virtual bool next(InputEvent& event) = 0;
    // The log of the run that is read now, if it is one that can be read a second time.
    virtual const std::optional<recording::RecordedLog>& log() const = 0;
};

}  // namespace fleet

#endif
