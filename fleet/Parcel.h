// What travels from a shipper to the store: consecutive frames of one D channel and one run.
#ifndef FLEET_PARCEL_H
#define FLEET_PARCEL_H

#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "capture/Item.h"
#include "fleet/subjects.h"

namespace fleet {

// A frame, or what the recorder had to say (capture::Item), with its octets.
struct ParcelItem {
    capture::Item::Kind kind = capture::Item::Kind::frame;
    std::optional<std::int64_t> time;     // nanoseconds since 1970, UTC; every frame has one
    std::optional<std::uint32_t> ticks;   // as in capture::Frame
    std::optional<std::int64_t> written;  // as in capture::Frame
    bool transmitted = false;
    capture::Role role = capture::Role::unknown;
    std::vector<std::uint8_t> octets;  // of frame and cut
    std::uint64_t count = 0;           // not of frames
    std::string text;                  // not of frames; UTF-8, at most Parcel::longestText octets
    capture::Variant variant = capture::Variant::unknown;  // of run

    bool operator==(const ParcelItem&) const = default;
};

// A frame, or an oversized one, with what the recorder said between the frame before it and this one.
struct ParcelFrame {
    ParcelItem item;
    std::vector<ParcelItem> before;

    bool operator==(const ParcelFrame&) const = default;
};

// Frames of the run that nobody will ever get: numbers `first` to `last`, or from `first` on an unknown
// number if there is no `last`; then the run has ended.
struct ParcelGap {
    std::uint64_t first = 1;
    std::optional<std::uint64_t> last;
    std::string why;  // in words

    bool operator==(const ParcelGap&) const = default;
};

// docs/user/fleet-parcel.md describes the text. A frame is known by D channel, run and number: the shipper
// may send it several times, in parcels of other sizes, and it is the same frame.
struct Parcel {
    static constexpr std::size_t mostFrames = 1000;
    static constexpr std::size_t mostNotes = 1000;  // before one frame, and at the end
    static constexpr std::size_t mostGaps = 1000;
    static constexpr std::size_t mostOctets = 4096;    // of one frame
    static constexpr std::size_t longestText = 1000;   // octets of a text, or of the D channel's name
    static constexpr std::size_t largest = 1'000'000;  // octets of a parcel's text

    Address address;
    std::string trunk;  // the D channel's name, as commands show it
    std::string group;  // NFAS group, a name (isName), or empty
    capture::Variant variant = capture::Variant::unknown;
    bool isRedacted = false;          // at the source
    std::uint64_t run = 0;            // runs of a D channel grow with time; 1 at least
    std::uint64_t first = 1;          // number of the first frame; without frames, of the next one to come
    std::vector<ParcelFrame> frames;  // numbered first, first + 1, ...
    std::vector<ParcelGap> gaps;      // in their order, all of them before the frames
    // The run has ended behind the frames; nothing of it follows. What the recorder said behind the last one.
    std::optional<std::vector<ParcelItem>> end;

    bool operator==(const Parcel&) const = default;

    // The message's id (Nats-Msg-Id): "london/h1/0/1/1795260333000001/17/3" for frames 17 to 19. "/gap" or
    // "/end" is added for a parcel that reports these.
    std::string id() const;
    Subject subject() const { return {partitionOf(address, group), address}; }
};

// A text that is no parcel. what() says which part of it is wrong, in at most 200 printable characters.
class BadParcel : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// JSON in one line. Texts in words, and the D channel's name, are made fit for it (cleanUtf8). Throws
// BadParcel for a parcel that is empty or too large, and for numbers that do not fit each other.
std::string toText(const Parcel& parcel);
// Takes any text at all. Throws BadParcel.
Parcel parcelIn(std::string_view text);

// What the recorder said, alone: the list that stands under "before" or "end" of a parcel. The store keeps it
// so.
std::string toText(const std::vector<ParcelItem>& notes);
// Throws BadParcel.
std::vector<ParcelItem> notesInText(std::string_view text);

}  // namespace fleet

#endif
