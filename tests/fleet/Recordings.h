// Recordings as lapdread record makes them, frame by frame.
#ifndef TESTS_FLEET_RECORDINGS_H
#define TESTS_FLEET_RECORDINGS_H

#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "capture/Writer.h"
#include "recording/RecordState.h"

namespace fleet_tests {

// A folder of the test's own, removed with all that is in it.
class Folder {
  public:
    Folder();
    ~Folder();
    Folder(const Folder&) = delete;
    Folder& operator=(const Folder&) = delete;

    std::string file(const std::string& name) const { return path_ / name; }
    std::string path() const { return path_; }

  private:
    std::filesystem::path path_;
};

// The recorder of the D channel "pri1". The frame with number N of a run holds the octets 00 01 and N in two
// octets.
class Recordings {
  public:
    explicit Recordings(std::string folder) : folder_(std::move(folder)) { state_.trunk = "pri1"; }
    ~Recordings();
    Recordings(const Recordings&) = delete;
    Recordings& operator=(const Recordings&) = delete;

    // A new file; its frames are numbered from `first` on.
    void begin(std::uint64_t run, std::uint64_t first);
    void frames(unsigned count);
    void lost(unsigned count);
    void finish();
    // The recorder is killed while it writes a frame; another one gives the file its name.
    void tear();
    // The disk is full: a frame does not get whole into the file. The recorder cuts the file back and closes
    // it. A reader may look in between (`meanwhile`), or behind the cut and before the file gets its name.
    void runOutOfRoom(const std::function<void()>& meanwhile, const std::function<void()>& behindTheCut);
    // Removes the file that was begun so many files ago.
    void remove(std::size_t ago);

  private:
    std::string path(const std::string& name) const { return folder_ + "/" + name; }
    void save();

    std::string folder_;
    recording::RecordState state_;
    capture::Interface interface_{"pri1", capture::Variant::net5};
    std::vector<std::string> names_;
    int file_ = -1;
    std::unique_ptr<capture::Writer> writer_;
};

}  // namespace fleet_tests

#endif
