// The interface of all outputs for a stream of frames.
#ifndef CAPTURE_WRITER_H
#define CAPTURE_WRITER_H

#include <stdexcept>

#include "capture/Item.h"

namespace capture {

// Thrown when an output cannot be written. what() names the file and the reason. `reason` is the errno, so
// that callers can distinguish a pipe without a reader (EPIPE) from a full disk.
class WriteError : public std::runtime_error {
  public:
    WriteError(const std::string& what, int errnoOfIt) : std::runtime_error(what), reason(errnoOfIt) {}
    int reason;
};

// Takes every kind of item, and leaves out what its form has no place for. Used by one thread at a time. Each
// function throws WriteError.
class Writer {
  public:
    Writer() = default;
    Writer(const Writer&) = delete;
    Writer& operator=(const Writer&) = delete;
    virtual ~Writer() = default;

    virtual void write(const Item& item) = 0;
    // Writes what was composed so far to the system, as whole records. A live output calls this after each
    // item or batch.
    virtual void flush() = 0;
    // Completes the output and flushes it. Nothing may be written afterwards. If a writer is destroyed
    // without this call, the end of its output may be missing.
    virtual void finish() = 0;
};

}  // namespace capture

#endif
