// A text that one thread makes and another hands out.
#ifndef FLEET_METRICS_PUBLISHED_H
#define FLEET_METRICS_PUBLISHED_H

#include <mutex>
#include <string>
#include <utility>

namespace fleet {

// Used by any threads.
class Published {
  public:
    void set(std::string text) {
        const std::lock_guard guard(lock_);
        text_ = std::move(text);
    }
    std::string get() const {
        const std::lock_guard guard(lock_);
        return text_;
    }

  private:
    mutable std::mutex lock_;
    std::string text_;
};

}  // namespace fleet

#endif
