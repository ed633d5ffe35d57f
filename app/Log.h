// The log file. Text comes as entries, the block of a frame or some lines of the head each, and reaches the
// file in whole entries: what is in the file can be read, whatever becomes of a write.
#ifndef APP_LOG_H
#define APP_LOG_H

#include <cstdio>
#include <string>
#include <string_view>
#include <vector>

namespace app {

// A write that fails is reported on the standard error stream, the first one of a run. What it did not bring
// into the file is dropped, its frames are counted, and later text is tried again; then a line in the log
// says how many frames are missing there. Not locked: whoever writes holds off the others.
class Log {
  public:
    static constexpr std::size_t BlockSize = 4096;  // text is written when as much is held

    Log() = default;
    Log(const Log&) = delete;
    Log& operator=(const Log&) = delete;
    ~Log();

    // Creates or empties the file; waits for the reader of a FIFO. Null, with errno, when it cannot. The
    // stream is the log's own and writes nothing itself.
    std::FILE* open(const char* name);
    // The next entry is a frame, which comes in so many writes.
    void frameFollows(unsigned int writes = 1) { writesOfFrame_ = writes; }
    void write(std::string_view text);  // while it is open
    // Says in the log, behind what was written so far, that this many frames are missing here because they
    // were lost before they came to the log. The caller counts them: lost() and complete() do not change.
    // Call it while the log is open, and not between the writes of one frame.
    void framesMissing(unsigned long frames);
    // Writes what is held. After a write that failed, says how many frames are missing. Nothing the second
    // time.
    void close();

    // False once a write has failed.
    bool complete() const { return complete_; }
    unsigned long lost() const { return lost_; }  // frames

  private:
    struct Entry {
        std::size_t end;  // in held_
        bool isFrame = false;
        bool isBegun = false;       // its beginning is in the file
        unsigned long missing = 0;  // frames that framesMissing was told of
    };

    void endEntry();
    void writeOut();
    std::size_t putHead();
    void writeFailed(std::size_t headSize, std::size_t written, int reason);
    std::size_t settle(std::size_t written);
    bool takeBack(std::size_t octets) const;
    void countLost(std::size_t kept);
    void complain(int reason);

    std::string name_;
    std::FILE* stream_ = nullptr;
    std::string held_;
    std::vector<Entry> entries_;
    std::string rest_;                // of an entry that is in the file in part and could not be taken back
    unsigned int writesOfFrame_ = 0;  // still to come
    bool restIsFrame_ = false;
    bool complete_ = true;
    unsigned long lost_ = 0;
    unsigned long gap_ = 0;  // frames missing since the last text that was written
};

// There for the whole process.
extern Log traceLog;

}  // namespace app

#endif
