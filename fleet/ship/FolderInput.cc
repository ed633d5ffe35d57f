#include "fleet/ship/FolderInput.h"

#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <utility>

#include "fleet/ship/inputs.h"
#include "recording/recordings.h"

namespace fleet {

namespace {

constexpr char notRecorded[] = "the recorder could not write them, or their recording was removed";
constexpr char removed[] = "recordings were removed before it was known that all of them were shipped";

}  // namespace

FolderInput::FolderInput(std::string folder, const std::string& trunk, const Place& from, Before before)
    : folder_(std::move(folder)),
      trunk_(trunk),
      statePath_(recording::statePath(folder_, recording::fileNameOf(trunk))),
      before_(before),
      run_(from.run),
      next_(from.next),
      isEnded_(from.run == 0 || from.isEnded) {}

bool FolderInput::next(InputEvent& event) {
    for (;;) {
        const Step step = reader_ ? read(event) : choose(event);
        if (step != Step::again)
            return step == Step::event;
    }
}

std::string FolderInput::lacks() const {
    if (stateInode_ != 0)
        return "";
    struct stat status {};
    if (stat(folder_.c_str(), &status) != 0)
        return folder_ + ": " + (errno == ENOENT ? "no such folder" : std::strerror(errno));
    if (stat(statePath_.c_str(), &status) != 0 && errno != ENOENT)
        return statePath_ + ": " + std::strerror(errno);
    return folder_ + ": no recordings of " + trunk_ + " yet";
}

// Opens the file that is next, or says what has become of the frames before it.
FolderInput::Step FolderInput::choose(InputEvent& event) {
    refresh();
    const std::size_t index = nextFile();
    if (index == state_.files.size())
        return Step::pause;
    const recording::RecordedFile file = state_.files[index];
    if (file.run != run_) {
        if (!std::exchange(isEnded_, true))
            return endRun(event);
        run_ = file.run;
        next_ = 1;
        isEnded_ = lacksTail_ = false;
    }
    if (file.first > next_)
        return skipTo(file.first, event);
    lacksTail_ = !openFile(file);
    if (lacksTail_)
        done_ = file.name;
    return Step::again;
}

FolderInput::Step FolderInput::endRun(InputEvent& event) {
    event = {InputEvent::Kind::end, run_, next_, {}, false, std::nullopt};
    if (lacksTail_)
        event.gap = ParcelGap{next_, std::nullopt, removed};
    return Step::event;
}

FolderInput::Step FolderInput::skipTo(std::uint64_t first, InputEvent& event) {
    event = {InputEvent::Kind::gap, run_, next_, {}, false, ParcelGap{next_, first - 1, notRecorded}};
    next_ = first;
    return Step::event;
}

// The recorder puts a new state in the place of the old one, so it is another file each time.
void FolderInput::refresh() {
    struct stat status {};
    if (stat(statePath_.c_str(), &status) != 0 ||
        (status.st_ino == stateInode_ && status.st_mtim.tv_sec == stateTime_.tv_sec &&
         status.st_mtim.tv_nsec == stateTime_.tv_nsec))
        return;
    try {
        if (auto state = recording::readState(statePath_))
            state_ = *std::move(state);
    } catch (const std::runtime_error& error) {
        throw capture::BadInput(error.what());
    }
    stateInode_ = status.st_ino;
    stateTime_ = status.st_mtim;
}

// The index of the file to read next in the state, or the number of files if there is none yet.
std::size_t FolderInput::nextFile() {
    if (done_.empty())
        return firstFile();
    const auto last = std::ranges::find(state_.files, done_, &recording::RecordedFile::name);
    return last == state_.files.end() ? fileBehindPlace()
                                      : static_cast<std::size_t>(last - state_.files.begin()) + 1;
}

// The file that holds the last frame that is shipped: items behind that frame may still be new.
std::size_t FolderInput::firstFile() {
    const auto& files = state_.files;
    std::size_t index = files.size();
    for (std::size_t i = 0; i < files.size(); ++i) {
        if (files[i].run == run_ && files[i].first < std::max<std::uint64_t>(next_, 2))
            index = i;
    }
    if (index == files.size()) {
        lacksTail_ =
            !isEnded_ && std::ranges::find(files, run_, &recording::RecordedFile::run) == files.end();
        return fileBehindPlace();
    }
    const bool hasBefore = index > 0 && files[index - 1].run == run_;
    return before_ == Before::recording && hasBefore ? index - 1 : index;
}

std::size_t FolderInput::fileBehindPlace() const {
    const auto found = std::ranges::find_if(state_.files, [&](const recording::RecordedFile& file) {
        return file.run > run_ || (file.run == run_ && file.first >= next_);
    });
    return static_cast<std::size_t>(found - state_.files.begin());
}

// Returns false if the file is not there any more. The recorder may give it its finished name meanwhile.
bool FolderInput::openFile(const recording::RecordedFile& file) {
    const std::string finished = folder_ + "/" + file.name;
    const std::string unfinished = finished + std::string(recording::unfinishedEnding);
    const bool isLast = !state_.files.empty() && file.name == state_.files.back().name;
    for (const std::string& path : {finished, unfinished, finished}) {
        if (!std::filesystem::exists(path))
            continue;
        isComplete_ = path == finished || !isLast;
        isFollowed_ = !isComplete_;
        try {
            reader_ = openInput(path, isFollowed_ ? Manner::follow : Manner::readOnce);
        } catch (const capture::BadInput&) {
            if (std::filesystem::exists(path))
                throw;
            continue;
        }
        if (file_.name != file.name)
            besides_ = 0;
        file_ = file;
        number_ = file.first;
        besidesHere_ = 0;
        return true;
    }
    return false;
}

FolderInput::Step FolderInput::read(InputEvent& event) {
    try {
        const bool isItem = reader_->next(event.item) == capture::Reader::Next::item;
        if (!(isItem && event.item.isFrame()) && wasCutBack())
            return readAnew();
        if (isItem) {
            give(event);
            return Step::event;
        }
    } catch (const capture::BadInput&) {
        if (wasCutBack())
            return readAnew();
        finishFile();
        throw;
    }
    if (!isComplete_) {
        refresh();
        isComplete_ = isComplete();
        return isComplete_ ? Step::again : Step::pause;
    }
    finishFile();
    return Step::again;
}

// When the disk is full, the recorder cuts its file back to the last whole item. A reader that follows the
// file may have read further. It takes that for damage and for another file, and begins at its first frame.
bool FolderInput::wasCutBack() const { return isFollowed_ && reader_->progress().isReplaced; }

// Reads the file once more from its beginning, where all that was given before is old.
FolderInput::Step FolderInput::readAnew() {
    reader_.reset();
    if (!openFile(file_))
        done_ = file_.name;
    return Step::again;
}

// Gives the item with its number. An item is old if it was given before: a frame by its number, any other
// item by its count after the last frame.
void FolderInput::give(InputEvent& event) {
    event.kind = InputEvent::Kind::item;
    event.run = run_;
    event.number = number_;
    event.gap.reset();
    if (isNumbered(event.item)) {
        event.isOld = number_ < next_;
        if (!event.isOld) {
            next_ = number_ + 1;
            besides_ = 0;
        }
        ++number_;
        besidesHere_ = 0;
    } else {
        ++besidesHere_;
        event.isOld = number_ < next_ || (number_ == next_ && besidesHere_ <= besides_);
        if (!event.isOld)
            besides_ = besidesHere_;
    }
}

bool FolderInput::isComplete() const {
    return state_.files.empty() || file_.name != state_.files.back().name ||
           std::filesystem::exists(folder_ + "/" + file_.name);
}

// A recorder that was killed may have left the beginning of an item, which only a reader that does not follow
// reports. So a file that was followed is read once more if octets are left.
void FolderInput::finishFile() {
    const capture::Reader::Progress read = reader_->progress();
    reader_.reset();
    if (isFollowed_ && read.octets < read.of && openFile(file_))
        return;
    done_ = file_.name;
}

}  // namespace fleet
