// Gathers the octets of an output and writes them in whole records.
#ifndef CAPTURE_SINK_H
#define CAPTURE_SINK_H

#include <string>
#include <string_view>

#include "capture/Writer.h"

namespace capture {

// Writes to an open descriptor, which the caller opens and closes. Functions that write throw WriteError.
class Sink {
  public:
    // The name is for messages.
    Sink(int file, std::string name) : file_(file), name_(std::move(name)) {}
    Sink(const Sink&) = delete;
    Sink& operator=(const Sink&) = delete;

    // The text that waits to be written. Append a record to it, then call endRecord().
    std::string& record() { return held_; }
    // Ends a record. Writes everything that waits if that has become 256 kB.
    void endRecord() {
        if (held_.size() >= most)
            flush();
    }
    // Writes everything that waits, with one write(), or with more if the system takes less.
    void flush();

  private:
    static constexpr std::size_t most = std::size_t{1} << 18;

    int file_;
    std::string name_;
    std::string held_;
};

}  // namespace capture

#endif
