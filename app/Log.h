// The log file. Text comes as entries, the block of a frame or some lines of the head each, and reaches the
// file in whole entries: what is in the file can be read, whatever becomes of a write.
#ifndef APP_LOG_H
#define APP_LOG_H

#include <chrono>
#include <cstdio>
#include <string>
#include <string_view>

#include "app/LogBlock.h"
#include "app/LogFile.h"

namespace app {

// A write that fails is reported on the standard error stream, the first one of a run. What it did not bring
// into the file is dropped, its frames are counted, and later text is tried again; then a line in the log
// says how many frames are missing there. Not locked: whoever writes holds off the others.
class Log {
  public:
    static constexpr std::size_t BlockSize = 4096;            // octets; text is written when so much is held
    static constexpr std::chrono::milliseconds DueAfter{10};  // of the last write

    Log() = default;
    Log(const Log&) = delete;
    Log& operator=(const Log&) = delete;
    ~Log();

    // Opens the file as LogFile does: null, with errno, when it cannot be opened, EWOULDBLOCK when another
    // trace writes to it. The stream is the log's own and writes nothing itself.
    std::FILE* open(const char* name);
    // The next entry is a frame, which comes in so many writes.
    void frameFollows(unsigned int writes = 1) { writesOfFrame_ = writes; }
    void write(std::string_view text);  // while it is open
    // Says in the log, behind what was written so far, that this many frames are missing here because they
    // were lost before they came to the log. The caller counts them: lost() and complete() do not change.
    // Call it while the log is open, and not between the writes of one frame.
    void framesMissing(unsigned long frames);

    // Both write what is held, for the time when no frame waits to be shown. `flushIfDue` does so only when
    // the last write is longer ago than DueAfter, so that it may be called after each frame; whoever calls it
    // calls `flush` when nothing has come for a while.
    void flush();
    void flushIfDue();

    // Writes what is held. After a write that failed, says how many frames are missing. Nothing the second
    // time.
    void close();

    // From here on nothing waits until the file takes more; a write that waits returns. What the file does
    // not take at once is lost and counted. From any thread, and from a signal handler.
    void giveUp() { file_.giveUp(); }

    // False once a write has failed.
    bool complete() const { return complete_; }
    unsigned long lost() const { return lost_; }  // frames

  private:
    bool holdsSomethingNew() const;
    void writeOut();
    void complain(int reason);

    std::string name_;
    LogFile file_;
    LogBlock block_;
    unsigned int writesOfFrame_ = 0;  // still to come
    std::chrono::steady_clock::time_point lastWrite_;
    bool complete_ = true;
    unsigned long lost_ = 0;
    unsigned long gap_ = 0;  // frames missing since the last text that was written
};

// There for the whole process.
extern Log traceLog;

}  // namespace app

#endif
