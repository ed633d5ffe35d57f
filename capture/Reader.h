// A stream of frames that is pulled, an item at a time.
#ifndef CAPTURE_READER_H
#define CAPTURE_READER_H

#include <chrono>
#include <cstdint>
#include <stdexcept>

#include "capture/Item.h"

namespace capture {

// An input that cannot be opened or is of no known form. what() names the file, the place and the reason.
class BadInput : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// Reads one input in constant memory. Items come in the order in which they stand there. A reader is used by
// one thread at a time. Damage inside an input is no exception but an item.
class Reader {
  public:
    enum class Next : std::uint8_t {
        item,   // `item` holds the next one
        pause,  // nothing more is there just now: a pipe, or a file that is followed; see wait()
        end     // for good
    };
    // How far reading has come, in octets; `of` is 0 when the length is unknown (a pipe).
    struct Progress {
        std::uint64_t octets = 0;
        std::uint64_t of = 0;
    };

    Reader() = default;
    Reader(const Reader&) = delete;
    Reader& operator=(const Reader&) = delete;
    virtual ~Reader() = default;

    // What it puts into `item` is valid until the next call. Throws BadInput when the system refuses a read.
    virtual Next next(Item& item) = 0;
    // After `pause`: returns when more may be there, when a signal came, or after `most`.
    virtual void wait(std::chrono::milliseconds most) = 0;
    virtual Progress progress() const = 0;
};

}  // namespace capture

#endif
