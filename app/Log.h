// The log. It takes text in entries: an entry is the text of a frame, or some lines of the head. The file
// holds only whole entries, whatever happens to a write.
#ifndef APP_LOG_H
#define APP_LOG_H

#include <chrono>
#include <cstdio>
#include <string>
#include <string_view>

#include "app/LogBlock.h"
#include "app/LogFile.h"

namespace app {

// The first write that fails in a run is reported on the standard error stream. Entries that could not be
// written are dropped, and their frames are counted. Later text is tried again; a line in the log then says
// how many frames are missing there.
//
// The class has no lock. Callers must see to it that only one thread at a time uses it, except for giveUp.
class Log {
  public:
    static constexpr std::size_t blockSize = 4096;            // text is written when so many octets are held
    static constexpr std::chrono::milliseconds dueAfter{10};  // least time between writes of flushIfDue

    Log() = default;
    Log(const Log&) = delete;
    Log& operator=(const Log&) = delete;
    ~Log();

    // Opens the file as LogFile::open does. Returns null, with errno set, when it cannot be opened; errno is
    // EWOULDBLOCK when another trace writes to it. The log owns the stream, which writes nothing itself.
    std::FILE* open(const char* name);
    // Announces that the next entry is a frame.
    void frameFollows() { isFrame_ = true; }
    void write(std::string_view entry);  // call it only while the log is open
    // Says in the log that this many frames are missing at this place because they were lost before they came
    // to the log. The caller counts them: lost() and complete() do not change. Call it while the log is open.
    void framesMissing(unsigned long frames);

    // Both write the text that is held; call them when no frame waits to be shown. flushIfDue writes only if
    // the last write was more than dueAfter ago, so that it may be called after each frame. Its caller must
    // call flush when nothing has come for a while.
    void flush();
    void flushIfDue();

    // Writes the text that is held and closes the file. If frames are missing, reports on the standard error
    // stream how many. A second call does nothing.
    void close();

    // From now on no write waits until the file takes more text, and a write that waits returns. Text that
    // the file does not take at once is lost, and its frames are counted. Any thread and a signal handler may
    // call it.
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
    bool isFrame_ = false;  // whether the next entry is a frame
    std::chrono::steady_clock::time_point lastWrite_;
    bool complete_ = true;
    unsigned long lost_ = 0;
    unsigned long gap_ = 0;  // frames missing since the last text that was written
};

// The log of the trace. The object exists as long as the process.
extern Log traceLog;

}  // namespace app

#endif
