#include "recording/files.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

namespace recording {

namespace {

// A descriptor that does not block (a terminal that another program has left so) is waited for.
void awaitRoom(int descriptor) {
    pollfd room{descriptor, POLLOUT, 0};
    poll(&room, 1, -1);
}

}  // namespace

int writeAll(int descriptor, std::string_view text) {
    while (!text.empty()) {
        const ssize_t written = ::write(descriptor, text.data(), text.size());
        if (written >= 0)
            text.remove_prefix(static_cast<std::size_t>(written));
        else if (errno == EAGAIN)
            awaitRoom(descriptor);
        else if (errno != EINTR)
            return errno;
    }
    return 0;
}

bool giveRoomBack(int descriptor) {
    struct stat status {};
    return fstat(descriptor, &status) == 0 && ftruncate(descriptor, status.st_size) == 0;
}

std::optional<std::string> replaceFile(const std::string& path, std::string_view text,
                                       Durability durability) {
    const std::string fresh = path + ".new";
    const auto failed = [&](int reason) {
        unlink(fresh.c_str());
        return "cannot write " + path + ": " + std::strerror(reason);
    };
    const int descriptor = open(fresh.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (descriptor < 0)
        return failed(errno);
    int unwritten = writeAll(descriptor, text);
    if (unwritten == 0 && durability == Durability::onDisk && fsync(descriptor) != 0)
        unwritten = errno;
    const int unclosed = close(descriptor) == 0 ? 0 : errno;
    if (unwritten != 0 || unclosed != 0)
        return failed(unwritten != 0 ? unwritten : unclosed);
    if (rename(fresh.c_str(), path.c_str()) != 0)
        return failed(errno);
    return std::nullopt;
}

}  // namespace recording
