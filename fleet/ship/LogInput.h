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

// Makes runs itself: a log with the device, the inode and the first frame of the place is the place's run and
// goes on; any other begins a new one, and so does a log that is emptied or replaced, and a FIFO each time.
// What was written and not read then is lost, so the run before ends with a gap.
class LogInput final : public TrunkInput {
  public:
    LogInput(std::string path, std::string trunk, const Place& from);
    ~LogInput() override;

    bool next(InputEvent& event) override;
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
    int ownWriter_ = -1;  // of a FIFO, so that opening it waits for nobody
    std::unique_ptr<capture::Reader> reader_;

    std::uint64_t run_;
    std::uint64_t next_;  // its first frame that was not shipped before
    bool isEnded_;        // its end was given, or there is no run yet
    std::optional<recording::RecordedLog> log_;

    // What is read now, from its beginning on.
    std::optional<recording::RecordedLog> found_;
    capture::Batch first_;      // its first frame, and what came before it
    bool hasFirst_ = false;     // the frame has come
    bool isPlaced_ = false;     // it is known which run it is
    std::size_t given_ = 0;     // of first_
    std::uint64_t number_ = 1;  // of its next frame
};

}  // namespace fleet

#endif
