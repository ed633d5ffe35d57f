// Passes a text from the thread that makes it to the thread that hands it out.
#ifndef FLEET_METRICS_PUBLISHED_H
#define FLEET_METRICS_PUBLISHED_H

#include <mutex>
#include <string>
#include <utility>

namespace fleet {

// Any thread may call any function; the lock guards the text.
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
