// From the events of a D channel to parcels.
#ifndef FLEET_SHIP_PACKER_H
#define FLEET_SHIP_PACKER_H

#include <cstdint>
#include <deque>
#include <string>

#include "fleet/Parcel.h"
#include "fleet/ship/TrunkInput.h"

namespace fleet {

// What stands in every parcel of a D channel.
struct ParcelHead {
    Address address;
    std::string trunk;
    std::string group;  // may be empty
    bool isRedacted = false;
};

// A parcel is closed when it is full, when the run or the variant changes, and when the caller has nothing
// more to put into it just now.
class Packer {
  public:
    explicit Packer(ParcelHead head) : head_(std::move(head)) {}

    // Frames and what the recorder said; old ones are passed over.
    void take(const InputEvent& event);
    // Nothing more comes just now: the frames there are make a parcel.
    void close();

    // Closed parcels, in their order. Whoever takes them pops them.
    std::deque<Parcel>& parcels() { return closed_; }

  private:
    void takeItem(const InputEvent& event);
    void takeNote(ParcelItem item);
    void open(std::uint64_t run, std::uint64_t first, capture::Variant variant);

    // Of a parcel's text, roughly; what one frame can bring with it still fits.
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

// The frame or what the recorder said, with its octets. A frame of a trace without dates gets a time that
// depends on nothing but the run and the frame, so that it has the same one whenever it is read.
ParcelItem parcelItem(const capture::Item& item, std::uint64_t run, std::uint64_t number);

}  // namespace fleet

#endif
