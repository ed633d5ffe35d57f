// The recordings that lapdread record makes of a D channel, file after file.
#ifndef FLEET_SHIP_FOLDERINPUT_H
#define FLEET_SHIP_FOLDERINPUT_H

#include <chrono>
#include <ctime>
#include <memory>
#include <string>

#include "capture/Reader.h"
#include "fleet/ship/Place.h"
#include "fleet/ship/TrunkInput.h"
#include "recording/RecordState.h"

namespace fleet {

// Reads the recordings that the recorder's state lists; the state also says which frame each of them begins
// with. Follows the newest file while it is written. Runs and numbers are those of the recorder.
class FolderInput final : public TrunkInput {
  public:
    enum class Before : std::uint8_t {
        nothing,
        recording  // begins one recording earlier, because a call may begin there
    };

    // Begins with the recording that holds the last frame before `from`, or as `before` says. Events that
    // `from` has passed are given as old ones (InputEvent::isOld).
    FolderInput(std::string folder, const std::string& trunk, const Place& from, Before before);

    bool next(InputEvent& event) override;
    std::string lacks() const override;
    const std::optional<recording::RecordedLog>& log() const override { return none_; }

  private:
    enum class Step { event, again, pause };

    Step choose(InputEvent& event);
    Step read(InputEvent& event);
    Step readAnew();
    Step endRun(InputEvent& event);
    Step skipTo(std::uint64_t first, InputEvent& event);
    void refresh();
    std::size_t nextFile();
    std::size_t firstFile();
    std::size_t fileBehindPlace() const;
    bool openFile(const recording::RecordedFile& file);
    bool wasCutBack() const;
    void give(InputEvent& event);
    bool isComplete() const;
    void finishFile();

    std::string folder_;
    std::string trunk_;
    std::string statePath_;
    Before before_;
    recording::RecordState state_;
    std::timespec stateTime_{};  // when the state that was read was written
    std::uint64_t stateInode_ = 0;

    // What comes next.
    std::uint64_t run_;
    std::uint64_t next_;
    std::uint64_t besides_ = 0;  // items that were given behind the frame before it
    bool isEnded_;               // the end of the run was given
    bool lacksTail_ = false;     // a recording of this run is gone, and none behind it was read
    std::string done_;           // name of the file that was read last; empty before the first one

    // The file that is being read.
    recording::RecordedFile file_;
    std::unique_ptr<capture::Reader> reader_;
    std::uint64_t number_ = 0;       // of its next frame
    std::uint64_t besidesHere_ = 0;  // items after the frame before that
    bool isComplete_ = false;        // nothing will be written to it any more
    bool isFollowed_ = false;        // it was opened before it was complete

    std::optional<recording::RecordedLog> none_;
};

}  // namespace fleet

#endif
