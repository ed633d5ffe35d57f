// A file descriptor with an owner.
#ifndef RELAY_DESCRIPTOR_H
#define RELAY_DESCRIPTOR_H

#include <unistd.h>

#include <utility>

namespace relay {

// Owns a file descriptor and closes it at its end; -1 is no descriptor.
class Descriptor {
  public:
    explicit Descriptor(int fd = -1) : fd_(fd) {}
    Descriptor(Descriptor&& other) noexcept : fd_(std::exchange(other.fd_, -1)) {}
    Descriptor& operator=(Descriptor&& other) noexcept {
        std::swap(fd_, other.fd_);
        return *this;
    }
    ~Descriptor() {
        if (fd_ >= 0)
            ::close(fd_);
    }

    int get() const { return fd_; }

  private:
    int fd_;
};

}  // namespace relay

#endif
