#include "reader/browse/Wake.h"

#include <sys/eventfd.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <system_error>

namespace reader::browse {

Wake::Wake() : descriptor_(eventfd(0, EFD_NONBLOCK | EFD_CLOEXEC)) {
    if (descriptor_ < 0)
        throw std::system_error(errno, std::generic_category(), "eventfd");
}

Wake::~Wake() { close(descriptor_); }

void Wake::call() const noexcept {
    const int before = errno;
    const std::uint64_t one = 1;
    // It fails only if nobody has read for so long that the count is full. Then the reader wakes anyway.
    static_cast<void>(!write(descriptor_, &one, sizeof one));
    errno = before;
}

void Wake::heard() const {
    std::uint64_t count = 0;
    static_cast<void>(!read(descriptor_, &count, sizeof count));
}

}  // namespace reader::browse
