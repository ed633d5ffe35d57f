// The file that the log is written to: opened, locked, appended to, shortened. Nothing is held back here.
#ifndef APP_LOGFILE_H
#define APP_LOGFILE_H

#include <atomic>
#include <cstddef>
#include <cstdio>
#include <string_view>

namespace app {

// May be a regular file, a FIFO or a device. One thread at a time uses it; giveUp alone may come from any
// thread, and from a signal handler.
class LogFile {
  public:
    LogFile() = default;
    LogFile(const LogFile&) = delete;
    LogFile& operator=(const LogFile&) = delete;
    ~LogFile();

    // Creates the file, or locks the one that exists and only then empties it. Waits for the reader of a
    // FIFO. FIFOs and devices are not locked; a file system that cannot lock is reported on the standard
    // error stream, and the file is used unlocked. Null, with errno, when the file cannot be opened:
    // EWOULDBLOCK when another process has locked it. The stream belongs to the LogFile and writes nothing
    // itself.
    std::FILE* open(const char* name);
    bool isOpen() const { return stream_ != nullptr; }

    // Waits for as long as the file takes nothing. Returns how many octets were written: fewer than there
    // are, with errno, when a write failed; ECANCELED after giveUp, when the file takes nothing at the
    // moment.
    std::size_t append(std::string_view text) const;
    // Removes the octets that were written last. False where that cannot be done, as in a FIFO.
    bool takeBack(std::size_t octets) const;
    // False, with errno, when the system reports that something was not written after all.
    bool close();

    // From here on append waits no more, and the one that waits returns.
    void giveUp();

  private:
    bool lockAndEmpty(const char* name) const;
    bool awaitRoom() const;

    std::FILE* stream_ = nullptr;
    std::atomic<int> wakeUp_ = -1;  // an eventfd
    std::atomic<bool> givenUp_ = false;
};

}  // namespace app

#endif
