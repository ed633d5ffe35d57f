// A reader that can wait for its first item without giving it away.
#ifndef READER_PRIMED_H
#define READER_PRIMED_H

#include <atomic>
#include <memory>
#include <optional>

#include "capture/Reader.h"

namespace reader {

// Gives the items of another reader. Used by one thread at a time.
class Primed : public capture::Reader {
  public:
    explicit Primed(std::unique_ptr<capture::Reader> reader) : reader_(std::move(reader)) {}

    // Waits for the first item or the end, which next() gives afterwards. False if `stopped` was set before
    // that. Throws what next() throws: capture::BadInput for an input of no known form, for example.
    bool awaitFirst(const std::atomic<bool>& stopped);
    // The item that awaitFirst() has waited for, valid until next(); null if there is none.
    const capture::Item* first() const { return held_ == Next::item ? &first_ : nullptr; }

    Next next(capture::Item& item) override;
    void wait(std::chrono::milliseconds most) override { reader_->wait(most); }
    Progress progress() const override { return reader_->progress(); }

  private:
    std::unique_ptr<capture::Reader> reader_;
    capture::Item first_;
    std::optional<Next> held_;  // the result that belongs to `first_`, until next() has returned it
};

}  // namespace reader

#endif
