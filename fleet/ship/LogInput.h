// A log or a FIFO of lapdmon, read as it is written.
#ifndef FLEET_SHIP_LOGINPUT_H
#define FLEET_SHIP_LOGINPUT_H

#include <memory>
#include <string>

#include "capture/Batch.h"
#include "capture/Reader.h"
#include "fleet/ship/Place.h"
#include "fleet/ship/TrunkInput.h"

namespace fleet {

// Makes the runs itself. If the log has the device, the inode and the first frame that the place names, the
// place's run goes on. Otherwise a new run begins: for another log, for one that was emptied or replaced, and
// for a FIFO whenever the program is started. What was written to the log before and not read is lost, so the
// earlier run ends with a gap.
class LogInput final : public TrunkInput {
  public:
    LogInput(std::string path, std::string trunk, const Place& from);
    ~LogInput() override;

    bool next(InputEvent& event) override;
    std::string lacks() const override;
    const std::optional<recording::RecordedLog>& log() const override { return log_; }

  private:
    bool open();
    bool readFirst();
    bool isKnown() const;
    void beginRun();
    void giveEnd(InputEvent& event, const char* why);
    void give(InputEvent& event);

    std::string path_;
    std::string trunk_;
    int ownWriter_ = -1;  // our own writer of a FIFO, so that opening it for reading does not wait
    std::unique_ptr<capture::Reader> reader_;

    std::uint64_t run_;
    std::uint64_t next_;  // its first frame that was not shipped before
    bool isEnded_;        // its end was given, or there is no run yet
    std::optional<recording::RecordedLog> log_;

    // The log that is being read, from its beginning on.
    std::optional<recording::RecordedLog> found_;
    capture::Batch first_;      // its first frame, and what came before it
    bool hasFirst_ = false;     // the frame has come
    bool isPlaced_ = false;     // it is known which run it is
    std::size_t given_ = 0;     // of first_
    std::uint64_t number_ = 1;  // of its next frame
};

}  // namespace fleet

#endif
