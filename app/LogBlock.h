// The text of the log that waits to be written, and where its entries end.
#ifndef APP_LOGBLOCK_H
#define APP_LOGBLOCK_H

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "app/LogFile.h"

namespace app {

struct LogEntry {
    std::size_t end;            // in the block's text
    bool isFrame = false;       // otherwise lines of the head, or the line of a gap
    bool isBegun = false;       // its beginning is in the file already
    unsigned long missing = 0;  // how many frames the line of a gap says are missing
};

class LogBlock {
  public:
    const std::string& text() const { return text_; }
    const std::vector<LogEntry>& entries() const { return entries_; }

    // Adds to the entry that is being made.
    void append(std::string_view text) { text_ += text; }
    // Nothing when no text was added since the last entry.
    void endEntry(bool isFrame);
    // Adds the line that says so. Two of them in a row become one.
    void addGap(unsigned long frames);
    // Puts that line first, or behind the rest of an entry that is begun.
    void putGapFirst(unsigned long frames);

    bool holdsOnlyARest() const { return entries_.size() == 1 && entries_.front().isBegun; }
    void clear();
    // Keeps the octets between `begin` and `end`, the rest of an entry whose beginning is in the file.
    void keepRest(std::size_t begin, std::size_t end, bool isFrame);

  private:
    std::size_t sizeOfRest() const;

    std::string text_;
    std::vector<LogEntry> entries_;
};

// What a write that ended early has cost.
struct LogLoss {
    unsigned long frames = 0;   // of the block, that are not in the file
    unsigned long missing = 0;  // frames that the file ought to say are missing, beside those
};

// Brings file and block in order after a write of the block that ended after `written` octets: the file holds
// whole entries, or the block holds the rest of the one that the file has in part. Behind a gap (`behindGap`:
// the block begins with its line) a file that can be shortened keeps all of the block or nothing, so that a
// nearly full disk does not fill up with the lines of gaps.
LogLoss repair(const LogFile& file, LogBlock& block, std::size_t written, bool behindGap);

}  // namespace app

#endif
