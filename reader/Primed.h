// A stream whose beginning can be looked at before anybody takes from it.
#ifndef READER_PRIMED_H
#define READER_PRIMED_H

#include <atomic>
#include <memory>
#include <optional>

#include "capture/Reader.h"

namespace reader {

// Gives what the reader behind it gives. Used by one thread at a time.
class Primed : public capture::Reader {
  public:
    explicit Primed(std::unique_ptr<capture::Reader> reader) : reader_(std::move(reader)) {}

    // Waits for the first item or the end, which next() gives afterwards. False if `stopped` was set before
    // that. Throws what next() throws: capture::BadInput for an input of no known form, for example.
    bool awaitFirst(const std::atomic<bool>& stopped);

    Next next(capture::Item& item) override;
    void wait(std::chrono::milliseconds most) override { reader_->wait(most); }
    Progress progress() const override { return reader_->progress(); }

  private:
    std::unique_ptr<capture::Reader> reader_;
    capture::Item first_;
    std::optional<Next> held_;  // what came with `first_`, until next() has given it
};

}  // namespace reader

#endif
