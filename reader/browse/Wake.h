// Lets another thread or a signal handler end a poll() that waits.
#ifndef READER_BROWSE_WAKE_H
#define READER_BROWSE_WAKE_H

namespace reader::browse {

class Wake {
  public:
    // Throws std::system_error.
    Wake();
    ~Wake();
    Wake(const Wake&) = delete;
    Wake& operator=(const Wake&) = delete;

    // For poll(): readable from call() until heard().
    int descriptor() const { return descriptor_; }
    // May be called in a signal handler.
    void call() const noexcept;
    // Makes the descriptor unreadable until the next call().
    void heard() const;

  private:
    int descriptor_;
};

}  // namespace reader::browse

#endif
