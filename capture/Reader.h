// The interface of all inputs: a stream of frames and other items, from which the caller takes one item after
// another.
#ifndef CAPTURE_READER_H
#define CAPTURE_READER_H

#include <chrono>
#include <cstdint>
#include <stdexcept>

#include "capture/Item.h"

namespace capture {

// Thrown for an input that cannot be opened, or whose form is not known. what() names the file, the place and
// the reason.
class BadInput : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// Reads one input in constant memory, and gives its items in the order of the input. Used by one thread at a
// time. Damage inside an input is reported as an item, not by an exception.
class Reader {
  public:
    enum class Next : std::uint8_t {
        item,   // `item` holds the next item
        pause,  // a pipe, or a file that is followed, has nothing more just now; see wait()
        end     // for good
    };
    // How many octets have been read, and of how many. `of` is 0 if the length is not known, as for a pipe.
    struct Progress {
        std::uint64_t octets = 0;
        std::uint64_t of = 0;
        // A file that is followed was emptied, cut back or replaced since it was opened. Frames that were
        // given stood in it; anything else that is given then may come from the cut.
        bool isReplaced = false;
    };

    Reader() = default;
    Reader(const Reader&) = delete;
    Reader& operator=(const Reader&) = delete;
    virtual ~Reader() = default;

    // What it puts into `item` is valid until the next call. Throws BadInput when the system refuses a read.
    virtual Next next(Item& item) = 0;
    // To be called after `pause`. Returns when there may be more to read, when a signal came, or after
    // `most`.
    virtual void wait(std::chrono::milliseconds most) = 0;
    virtual Progress progress() const = 0;
};

}  // namespace capture

#endif
