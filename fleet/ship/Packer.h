// Packs the events of a D channel into parcels.
#ifndef FLEET_SHIP_PACKER_H
#define FLEET_SHIP_PACKER_H

#include <cstdint>
#include <deque>
#include <string>

#include "fleet/Parcel.h"
#include "fleet/ship/TrunkInput.h"

namespace fleet {

// The fields that are the same in every parcel of a D channel.
struct ParcelHead {
    Address address;
    std::string trunk;
    std::string group;  // may be empty
    bool isRedacted = false;
};

// Closes a parcel when it is full, when the run or the variant changes, and when close() is called.
class Packer {
  public:
    explicit Packer(ParcelHead head) : head_(std::move(head)) {}

    // Takes an event; passes over old items.
    void take(const InputEvent& event);
    // Closes the parcel that has been begun. Call this when there is no event just now.
    void close();

    // The closed parcels, in their order. The caller removes those that it takes.
    std::deque<Parcel>& parcels() { return closed_; }

  private:
    void takeItem(const InputEvent& event);
    void takeNote(ParcelItem item);
    void open(std::uint64_t run, std::uint64_t first, capture::Variant variant);

    // When a parcel is full: octets of its text, estimated, and frames. One more frame with all that the
    // recorder said before it still fits into Parcel::largest.
    static constexpr std::size_t full = 100'000;
    static constexpr std::size_t mostFrames = 500;
    static constexpr std::size_t mostNoteText = 100'000;

    ParcelHead head_;
    Parcel open_;
    std::size_t size_ = 0;
    std::vector<ParcelItem> notes_;  // wait for the frame behind them
    std::size_t noteText_ = 0;
    std::deque<Parcel> closed_;
};

// Copies an item with its octets. A frame of a trace without dates gets a time that depends only on the run
// and the frame, so that it has the same time whenever it is read.
ParcelItem parcelItem(const capture::Item& item, std::uint64_t run, std::uint64_t number);

}  // namespace fleet

#endif
