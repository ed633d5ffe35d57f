// Writes the recordings of one D channel, one file after another.
#ifndef READER_ROTATING_FILE_H
#define READER_ROTATING_FILE_H

#include <chrono>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "capture/Writer.h"
#include "reader/Chatter.h"
#include "reader/HeldItem.h"
#include "reader/forms.h"
#include "recording/recordings.h"

namespace reader {

struct RotationRules {
    std::string folder;
    const Form* form = nullptr;  // the form of the files; it must have a writer
    std::uint64_t size = 0;      // a file that has so many octets is finished; 0: no limit
    std::int64_t period = 0;     // seconds; a new file at each multiple of it in local time; 0: never
    unsigned kept = 0;           // how many finished files stay; 0: all
    std::int64_t span = 0;       // seconds; files that hold only what is older than this are removed; 0: none
    std::string mark{};          // a word in the names of the files; may be empty
};

// Writes TRUNK.START.FORM, which is named TRUNK.START.FORM.part until it is finished. START is the time of
// its first item, in UTC: 20261121T112533Z. A record is never split between files. What cannot be written is
// counted; once writing works again, the file says how many frames are missing. A file is locked (flock) as
// long as it is written, so that nobody takes it for one that was left behind.
class RotatingFile {
  public:
    using HostClock = std::chrono::steady_clock;

    // Keeps references to its arguments.
    RotatingFile(const RotationRules& rules, const std::string& trunk, Chatter& chatter);
    // Finishes the file.
    ~RotatingFile();

    RotatingFile(const RotatingFile&) = delete;
    RotatingFile& operator=(const RotatingFile&) = delete;

    // Writes an item. An item without a time that would begin a file waits for the next one, whose time names
    // the file.
    void write(const capture::Item& item);
    // Hands everything to the system, and finishes a file that has reached its size.
    void flush();
    // Nothing has come for a while, and the host's clock shows `second`. Finishes a file whose period is
    // over.
    void passTime(std::int64_t second);
    // Finishes the file, so that the next item begins a new one.
    void finish();

    std::uint64_t lostInAll() const { return lostInAll_; }
    // Of those, how many the user has not been told of.
    std::uint64_t lostUnsaid() const { return unsaid_; }
    // The finished name of the newest file, without its folder, and how many have been begun; empty before
    // the first one.
    const std::string& newest() const { return newest_; }
    std::uint64_t begun() const { return begun_; }
    // Whether the newest file was removed because nothing could be written to it.
    bool isNewestGone() const { return isNewestGone_; }

    // How long after a failure another file is tried: a second, or as a test sets it.
    void retryEvery(HostClock::duration time) { betweenAttempts_ = time; }

  private:
    bool begin(const capture::Item& item);
    void writeLoss(const capture::Item& item);
    void reserve();
    bool isReservedTo(std::uint64_t end);
    void haveWritten();
    void fail(const std::string& why);
    void lose(std::uint64_t frames) {
        lost_ += frames;
        lostInAll_ += frames;
        unsaid_ += frames;
    }
    void closeFile();
    void nameFinished();
    void removeOldest() const;
    void sayWritingWorks();
    bool hasRoom() const;
    void synchronise() const;
    recording::RecordingKind kind() const;
    bool isAnotherPeriod(std::int64_t second) const;
    std::int64_t periodOf(std::int64_t second) const;

    const RotationRules& rules_;
    Chatter& chatter_;
    std::string trunk_;
    std::string path_;    // the path of the file once it is finished
    std::string newest_;  // its name, kept when the file is closed
    std::uint64_t begun_ = 0;
    bool isNewestGone_ = false;
    int descriptor_ = -1;
    std::unique_ptr<capture::Writer> writer_;
    std::vector<HeldItem> early_;  // items that wait for the item that begins a file
    std::int64_t period_ = 0;      // the multiple of the period that the file belongs to
    std::uint64_t size_ = 0;       // octets that are safely in the file
    std::uint64_t reserved_ = 0;   // up to where the disk has room for the file
    std::uint64_t pending_ = 0;    // octets of the items written since
    std::uint64_t pendingFrames_ = 0;
    std::uint64_t lost_ = 0;     // frames that the next file has to report
    std::uint64_t telling_ = 0;  // of these, frames that the present file reports once it is flushed
    std::uint64_t lostInAll_ = 0;
    std::uint64_t unsaid_ = 0;       // frames lost since the user was told of the failure
    std::int64_t newestSecond_ = 0;  // the second of the newest item
    bool failing_ = false;           // the user was told of the failure
    HostClock::time_point retryAt_;
    HostClock::duration betweenAttempts_ = std::chrono::seconds(1);
};

}  // namespace reader

#endif
