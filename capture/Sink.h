// The octets of an output, gathered and written in whole records.
#ifndef CAPTURE_SINK_H
#define CAPTURE_SINK_H

#include <string>
#include <string_view>

#include "capture/Writer.h"

namespace capture {

// Writes to an open descriptor, which stays whoever opened it. Each function throws WriteError.
class Sink {
  public:
    // The name is for messages.
    Sink(int file, std::string name) : file_(file), name_(std::move(name)) {}
    Sink(const Sink&) = delete;
    Sink& operator=(const Sink&) = delete;

    // Where a record is composed; endRecord() follows.
    std::string& record() { return held_; }
    // Writes what is held, if it is much.
    void endRecord() {
        if (held_.size() >= most)
            flush();
    }
    // Writes what is held with one write(), or more if the system takes less.
    void flush();

  private:
    static constexpr std::size_t most = std::size_t{1} << 18;

    int file_;
    std::string name_;
    std::string held_;
};

}  // namespace capture

#endif
