// Where a stream of frames goes.
#ifndef CAPTURE_WRITER_H
#define CAPTURE_WRITER_H

#include <stdexcept>

#include "capture/Item.h"

namespace capture {

// An output that cannot be written. what() names the file and the reason; `reason` is the errno, so that a
// reader that has gone (EPIPE) can be told from a full disk.
class WriteError : public std::runtime_error {
  public:
    WriteError(const std::string& what, int errnoOfIt) : std::runtime_error(what), reason(errnoOfIt) {}
    int reason;
};

// Takes every kind of item. What its form has no place for is left out. A writer is used by one thread at a
// time. Each function throws WriteError.
class Writer {
  public:
    Writer() = default;
    Writer(const Writer&) = delete;
    Writer& operator=(const Writer&) = delete;
    virtual ~Writer() = default;

    virtual void write(const Item& item) = 0;
    // Hands over all that was composed, in one write() of whole records: a live output flushes after each
    // item or batch.
    virtual void flush() = 0;
    // Ends the output, flushes it, and reports what closing reports. Nothing is written afterwards. A writer
    // that is destroyed without it leaves an output that may lack its end.
    virtual void finish() = 0;
};

}  // namespace capture

#endif
