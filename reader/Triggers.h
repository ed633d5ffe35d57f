// Finds the triggers around which `record` keeps frames: findings, and frames that a filter would show.
#ifndef READER_TRIGGERS_H
#define READER_TRIGGERS_H

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "calls/Analysis.h"
#include "reader/Filter.h"
#include "reader/Options.h"
#include "reader/Seen.h"

namespace reader {

// Adds a value of --on to the options: "check:warning", "cause:34,38", "number:112". Throws UsageError.
void readTrigger(const std::string& value, RecordOptions& to);

// Sees every item of a run. Its headers must have been read. Used by one thread.
class Triggers : private calls::Listener {
  public:
    struct Fired {
        std::string dChannel;
        std::string why;  // "cause:34 (frame 17)", for a person
    };

    explicit Triggers(const Options& options);

    // Whether anything can trigger. If not, the functions below need not be called.
    bool areThere() const { return analysis_ != nullptr || !wanted_.empty(); }

    // Returns the triggers of this item: filters that it passes, findings that it shows. Valid until the next
    // call.
    std::span<const Fired> look(const Seen& seen);
    // So many nanoseconds have passed without an item. Returns the triggers that this shows.
    std::span<const Fired> advance(std::int64_t nanoseconds);

  private:
    struct Wanted {
        std::string words;  // the words as the user typed them
        Filter filter;
    };

    void found(const calls::Finding& finding) override;

    std::optional<calls::Severity> severity_;
    std::unique_ptr<calls::Analysis> analysis_;  // null if no finding is asked for
    std::vector<Wanted> wanted_;
    std::vector<Fired> fired_;
};

}  // namespace reader

#endif
