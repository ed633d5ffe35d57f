// The file of the log: opens, locks, appends, shortens. It keeps no text back.
#ifndef APP_LOGFILE_H
#define APP_LOGFILE_H

#include <atomic>
#include <cstddef>
#include <cstdio>
#include <string_view>

namespace app {

// The file may be a regular file, a FIFO or a device. Only one thread at a time may use the object, except
// for giveUp, which any thread and a signal handler may call.
class LogFile {
  public:
    LogFile() = default;
    LogFile(const LogFile&) = delete;
    LogFile& operator=(const LogFile&) = delete;
    ~LogFile();

    // Creates the file, or locks the existing file and then empties it. Waits until a FIFO has a reader. Does
    // not lock FIFOs and devices. If the file system cannot lock, reports that on the standard error stream
    // and uses the file without a lock. Returns null, with errno set, when the file cannot be opened; errno
    // is EWOULDBLOCK when another process has locked it. The LogFile owns the stream, which writes nothing
    // itself.
    std::FILE* open(const char* name);
    bool isOpen() const { return stream_ != nullptr; }

    // Writes the text, and waits as long as the file takes nothing. Returns how many octets were written.
    // They are fewer, with errno set, when a write has failed; errno is ECANCELED when the file takes nothing
    // at the moment and giveUp was called.
    std::size_t append(std::string_view text) const;
    // Removes so many octets from the end of the file. Returns false when that is not possible, for example
    // in a FIFO.
    bool takeBack(std::size_t octets) const;
    // Returns false, with errno set, when the system reports that something was not written after all.
    bool close();

    // From now on append does not wait, and an append that waits returns.
    void giveUp();

  private:
    bool lockAndEmpty(const char* name) const;
    bool awaitRoom() const;

    std::FILE* stream_ = nullptr;
    std::atomic<int> wakeUp_ = -1;  // an eventfd that wakes append
    std::atomic<bool> givenUp_ = false;
};

}  // namespace app

#endif
