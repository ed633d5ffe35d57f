#include "capture/Sink.h"

#include <poll.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace capture {

void Sink::flush() {
    std::string_view rest = held_;
    while (!rest.empty()) {
        const ssize_t some = ::write(file_, rest.data(), rest.size());
        if (some > 0) {
            rest.remove_prefix(static_cast<std::size_t>(some));
        } else if (some < 0 && errno == EAGAIN) {
            pollfd room{file_, POLLOUT, 0};
            ::poll(&room, 1, -1);
        } else if (some == 0 || errno != EINTR) {
            const int reason = some == 0 ? ENOSPC : errno;
            held_.clear();
            throw WriteError(name_ + ": " + std::strerror(reason), reason);
        }
    }
    held_.clear();
}

}  // namespace capture
