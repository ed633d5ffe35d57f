// A parcel: the message that carries consecutive frames of one D channel and one run from a shipper to the
// store.
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

// An item of a recording with its octets: a frame, or what the recorder said between frames (capture::Item).
struct ParcelItem {
    capture::Item::Kind kind = capture::Item::Kind::frame;
    std::optional<std::int64_t> time;     // nanoseconds since 1970, UTC; every frame has one
    std::optional<std::uint32_t> ticks;   // as in capture::Frame
    std::optional<std::int64_t> written;  // as in capture::Frame
    bool transmitted = false;
    capture::Role role = capture::Role::unknown;
    std::vector<std::uint8_t> octets;  // empty unless `kind` is frame or cut
    std::uint64_t count = 0;           // 0 in frames
    std::string text;                  // empty in frames; UTF-8, at most Parcel::longestText octets
    capture::Variant variant = capture::Variant::unknown;  // unknown unless `kind` is run

    bool operator==(const ParcelItem&) const = default;
};

// A frame, or an oversized one, with what the recorder said between the frame before it and this one.
struct ParcelFrame {
    ParcelItem item;
    std::vector<ParcelItem> before;

    bool operator==(const ParcelFrame&) const = default;
};

// Frames of the run that are missing for good: numbers `first` to `last`. If there is no `last`, an unknown
// number of frames is missing from `first` on, and the run has ended.
struct ParcelGap {
    std::uint64_t first = 1;
    std::optional<std::uint64_t> last;
    std::string why;  // in words

    bool operator==(const ParcelGap&) const = default;
};

// docs/user/fleet-parcel.md describes the text. D channel, run and number identify a frame. The shipper may
// send a frame several times, in parcels of different sizes; it is the same frame each time.
struct Parcel {
    static constexpr std::size_t mostFrames = 1000;
    static constexpr std::size_t mostNotes = 1000;  // before one frame, and at the end
    static constexpr std::size_t mostGaps = 1000;
    static constexpr std::size_t mostOctets = 4096;    // of one frame
    static constexpr std::size_t longestText = 1000;   // octets of a text, or of the D channel's name
    static constexpr std::size_t largest = 1'000'000;  // octets of a parcel's text
    static constexpr std::int64_t latest = 7'258'118'399'000'000'000;       // time: the end of the year 2199
    static constexpr std::uint64_t mostNumber = 9'223'372'036'854'775'807;  // what the store can hold

    Address address;
    std::string trunk;  // the D channel's name, as commands show it
    std::string group;  // NFAS group, a name (isName), or empty
    capture::Variant variant = capture::Variant::unknown;
    bool isRedacted = false;          // at the source
    std::uint64_t run = 0;            // runs of a D channel grow with time; 1 at least
    std::uint64_t first = 1;          // number of the first frame; without frames, of the next one to come
    std::vector<ParcelFrame> frames;  // numbered first, first + 1, ...
    std::vector<ParcelGap> gaps;      // in their order, all of them before the frames
    // If set, the run ends with this parcel. It holds what the recorder said after the run's last frame.
    std::optional<std::vector<ParcelItem>> end;

    bool operator==(const Parcel&) const = default;

    // The message's id (Nats-Msg-Id): "london/h1/0/1/1795260333000001/17/3" for frames 17 to 19. "/gap" or
    // "/end" is added for a parcel that reports these.
    std::string id() const;
    Subject subject() const { return {partitionOf(address, group), address}; }
};

// Thrown for a text that is no parcel, and for a parcel that cannot be written. what() says which part is
// wrong, in at most 200 printable characters.
class BadParcel : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// Writes the parcel as one line of JSON. The D channel's name and all texts pass through cleanUtf8. Throws
// BadParcel if the parcel is empty or too large, or if its numbers contradict each other.
std::string toText(const Parcel& parcel);
// Reads what toText writes. The text may hold any octets. Throws BadParcel.
Parcel parcelIn(std::string_view text);

// Writes only what the recorder said, as the list that "before" or "end" holds in a parcel's text. The store
// keeps the list in this form.
std::string toText(const std::vector<ParcelItem>& notes);
// Reads such a list. Throws BadParcel.
std::vector<ParcelItem> notesInText(std::string_view text);

}  // namespace fleet

#endif
