#include "reader/RecordedTrunk.h"

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <utility>

#include "reader/inputs.h"
#include "recording/files.h"

namespace reader {

namespace {

using Kind = capture::Item::Kind;

constexpr std::size_t mostWaiting = 1000;

// Whether the item gets a number. A frame that was cut off gets none, because a log that is written from the
// recording does not contain it.
bool isNumbered(const capture::Item& item) { return item.isFrame() || item.kind == Kind::oversized; }

struct Held {
    std::uint64_t frames = 0;
    std::uint64_t besides = 0;  // items after the last frame that are no frames
};

Held heldBy(const std::string& path) {
    const std::unique_ptr<capture::Reader> reader = openFile(path, {});
    capture::Item item;
    Held held;
    while (reader->next(item) == capture::Reader::Next::item) {
        if (isNumbered(item))
            held = {held.frames + 1, 0};
        else
            ++held.besides;
    }
    return held;
}

// Whether another recorder is writing the file now. If not, gives back the room that its recorder had
// reserved, if the file is ours to change.
bool isBeingWritten(const std::string& path) {
    int descriptor = open(path.c_str(), O_RDWR | O_CLOEXEC);
    if (descriptor < 0)
        descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (descriptor < 0)
        return true;
    const bool isFree = flock(descriptor, LOCK_EX | LOCK_NB) == 0;
    if (isFree)
        recording::giveRoomBack(descriptor);
    close(descriptor);
    return !isFree;
}

}  // namespace

RecordedTrunk::RecordedTrunk(const RecordRules& rules, const std::string& trunk, Chatter& chatter)
    : rules_(rules),
      trunk_(recording::fileNameOf(trunk)),
      chatter_(chatter),
      statePath_(recording::statePath(rules.files.folder, trunk_)),
      file_(rules.files, trunk, chatter),
      surroundings_(rules.surroundings, trunk, chatter) {
    try {
        if (auto state = recording::readState(statePath_))
            state_ = *std::move(state);
    } catch (const std::runtime_error& error) {
        chatter_.error(std::string(error.what()) + "; numbers begin anew");
    }
    state_.trunk = trunk;
    continueBehindFinished();
    adoptUnfinished();
    recordedNext_ = state_.next;
    recordedBesides_ = state_.besides;
}

void RecordedTrunk::adoptUnfinished() {
    const RotationRules& files = rules_.files;
    const recording::RecordingKind kind{files.folder, trunk_, "", std::string(files.form->name)};
    recording::RecordingKind kept = kind;
    kept.mark = rules_.surroundings.files.mark;
    std::vector<recording::Recording> left = recording::unfinishedRecordings(kind);
    const std::vector<recording::Recording> leftKept = recording::unfinishedRecordings(kept);
    left.insert(left.end(), leftKept.begin(), leftKept.end());
    for (const recording::Recording& each : left) {
        const std::string path = files.folder + "/" + each.name;
        const std::string part = path + std::string(recording::unfinishedEnding);
        if (isBeingWritten(part)) {
            chatter_.error(part + " is being written by another recorder, or cannot be opened");
            continue;
        }
        if (!state_.files.empty() && state_.files.back().name == each.name)
            continueBehind(state_.files.back(), part);
        if (std::rename(part.c_str(), path.c_str()) == 0)
            chatter_.note("finished " + path + ", which was left behind");
        else
            chatter_.error("cannot rename " + part + ": " + std::strerror(errno));
    }
}

// If a recorder was killed, its last file shows how far it came, and not the state. A form that leaves out
// some frames shows only the least that it can have been.
void RecordedTrunk::continueBehind(const recording::RecordedFile& file, const std::string& path) {
    if (file.run != state_.run)
        return;
    Held held;
    try {
        held = heldBy(path);
    } catch (const std::exception& error) {
        // The file does not even have a head.
        chatter_.detail(error.what());
    }
    const std::uint64_t next = file.first + held.frames;
    const Form* const form = formOfFile(file.name);
    if (next == state_.next)
        state_.besides = std::min(state_.besides, held.besides);
    else if (next > state_.next || (form != nullptr && form->holdsOversized))
        state_.besides = 0;
    else
        return;
    state_.next = next;
}

// When the disk was full, the last file was finished, and the state may be older than the file, because it
// could not be written. Or it counts frames that no file holds: now the log is read once more, and they are
// recorded after all.
void RecordedTrunk::continueBehindFinished() {
    if (state_.files.empty())
        return;
    const recording::RecordedFile& newest = state_.files.back();
    const std::string path = rules_.files.folder + "/" + newest.name;
    if (std::filesystem::exists(path))
        continueBehind(newest, path);
}

void RecordedTrunk::take(const capture::Item& item) {
    if (source_ != item.frame.place.file) {
        if (isMet_)
            // two logs have this trunk at once, so this run cannot be read again in the same way
            state_.log.reset();
        source_ = item.frame.place.file;
    }
    if (!isMet_ && !isNumbered(item)) {
        waiting_.add(item);
        if (waiting_.items().size() < mostWaiting)
            return;
    }
    if (!isMet_) {
        meet(item);
        for (const capture::Item& waiting : waiting_.items())
            place(waiting);
        const bool isAmongThem = !isNumbered(item);
        waiting_.clear();
        if (isAmongThem)
            return;
    }
    place(item);
}

void RecordedTrunk::meet(const capture::Item& first) {
    isMet_ = true;
    frames_ = besides_ = 0;
    const std::optional<recording::RecordedLog> log =
        isNumbered(first) ? recording::logOf(first.frame) : std::nullopt;
    if (state_.run != 0 && log && state_.log && log->holdsTheSameAs(*state_.log)) {
        recordedNext_ = state_.next;
        recordedBesides_ = state_.besides;
        return;
    }
    file_.finish();
    recording::beginRun(state_, log);
    recordedNext_ = 1;
    recordedBesides_ = 0;
    isChanged_ = true;
    isListed_ = false;
}

// Counts the item at its place in the log, and records it unless that has been done before.
void RecordedTrunk::place(const capture::Item& item) {
    const bool numbered = isNumbered(item);
    if (numbered) {
        ++frames_;
        besides_ = 0;
    } else {
        ++besides_;
    }
    isBehind_ = isRecorded(numbered);
    if (!isBehind_)
        record(item, numbered);
    surroundings_.take(item);
}

bool RecordedTrunk::isRecorded(bool numbered) const {
    if (frames_ + 1 < recordedNext_)
        return true;
    return frames_ + 1 == recordedNext_ && (numbered || besides_ <= recordedBesides_);
}

void RecordedTrunk::record(const capture::Item& item, bool numbered) {
    file_.write(item);
    enlist();
    if (numbered) {
        ++state_.next;
        state_.besides = 0;
    } else {
        ++state_.besides;
    }
    isChanged_ = true;
}

// Lists a new file in the state. If it begins with an item that is no frame, it has the number of the frame
// that follows.
void RecordedTrunk::enlist() {
    if (std::exchange(enlisted_, file_.begun()) == file_.begun())
        return;
    std::vector<recording::RecordedFile>& files = state_.files;
    files.push_back({file_.newest(), state_.run, state_.next});
    const auto isGone = [&](const recording::RecordedFile& file) {
        const std::string path = rules_.files.folder + "/" + file.name;
        return &file != &files.back() && !std::filesystem::exists(path);
    };
    files.erase(std::remove_if(files.begin(), files.end() - 1, isGone), files.end() - 1);
    if (files.size() > recording::RecordState::mostFiles)
        files.erase(files.begin(), files.end() - recording::RecordState::mostFiles);
    saveState();
}

// Takes a file off the list that is gone again, because the disk was full before anything was in it.
void RecordedTrunk::unlist() {
    std::vector<recording::RecordedFile>& files = state_.files;
    if (file_.isNewestGone() && !files.empty() && files.back().name == file_.newest())
        files.pop_back();
}

void RecordedTrunk::logIsGone(const capture::Item& item) {
    if (!isMet_) {
        waiting_.clear();  // a head that no frame followed
        return;
    }
    place(item);
    file_.finish();
    saveState();
    isMet_ = false;
}

void RecordedTrunk::trigger(const std::string& why) { surroundings_.trigger(why); }

void RecordedTrunk::flush() {
    file_.flush();
    surroundings_.flush();
    if (isChanged_ && (!isListed_ || std::chrono::steady_clock::now() >= nextState_))
        saveState();
}

void RecordedTrunk::idle(std::int64_t second) {
    file_.passTime(second);
    surroundings_.idle();
}

void RecordedTrunk::beginFile() { file_.finish(); }

void RecordedTrunk::finish() {
    if (!isMet_ && !waiting_.empty()) {
        recording::beginRun(state_, std::nullopt);
        isMet_ = true;
        for (const capture::Item& waiting : waiting_.items())
            place(waiting);
        waiting_.clear();
    }
    file_.finish();
    surroundings_.finish();
    if (isChanged_)
        saveState();
}

// Writes the state. Call this only after the items before it are in the files, or are lost.
void RecordedTrunk::saveState() {
    unlist();
    if (const auto wrong = recording::writeState(state_, statePath_)) {
        if (!std::exchange(stateFails_, true))
            chatter_.error(*wrong);
    } else {
        stateFails_ = false;
        isChanged_ = false;
        isListed_ = true;
    }
    nextState_ = std::chrono::steady_clock::now() + betweenStates_;
}

}  // namespace reader
