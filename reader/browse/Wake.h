// Ends a poll() that waits, from another thread or a signal handler.
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

    // Readable once call() was called.
    int descriptor() const { return descriptor_; }
    // May be called in a signal handler.
    void call() const noexcept;
    // Takes the calls so far.
    void heard() const;

  private:
    int descriptor_;
};

}  // namespace reader::browse

#endif
