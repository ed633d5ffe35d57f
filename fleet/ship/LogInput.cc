#include "fleet/ship/LogInput.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <utility>

#include "fleet/ship/inputs.h"

namespace fleet {

namespace {

constexpr std::size_t mostBefore = 1000;
constexpr char emptied[] =
    "the log was emptied or replaced; what was written to it last may not have been read before";
constexpr char notRead[] = "the shipper did not read for a while what is not kept in a file";

bool isFifo(const std::string& path) {
    struct stat status {};
    return stat(path.c_str(), &status) == 0 && S_ISFIFO(status.st_mode);
}

}  // namespace

LogInput::LogInput(std::string path, std::string trunk, const Place& from)
    : path_(std::move(path)),
      trunk_(std::move(trunk)),
      run_(from.run),
      next_(from.next),
      isEnded_(from.run == 0 || from.isEnded),
      log_(from.log) {}

LogInput::~LogInput() {
    if (ownWriter_ >= 0)
        close(ownWriter_);
}

// Returns false if there is no such log yet.
bool LogInput::open() {
    struct stat status {};
    if (stat(path_.c_str(), &status) != 0)
        return false;
    if (ownWriter_ < 0 && isFifo(path_))
        ownWriter_ = ::open(path_.c_str(), O_RDWR | O_NONBLOCK | O_CLOEXEC);
    reader_ = openInput(path_, Manner::follow, trunk_);
    return true;
}

std::string LogInput::lacks() const { return reader_ ? "" : path_ + ": no such log yet"; }

bool LogInput::next(InputEvent& event) {
    if (!reader_ && !open())
        return false;
    if (!hasFirst_ && !readFirst())
        return false;
    if (!isPlaced_ && !isKnown()) {
        if (!isEnded_) {
            giveEnd(event, log_ ? emptied : notRead);
            return true;
        }
        beginRun();
    }
    isPlaced_ = true;
    if (given_ < first_.items().size()) {
        event.item = first_.items()[given_++];
        give(event);
        return true;
    }
    if (reader_->next(event.item) != capture::Reader::Next::item)
        return false;
    if (event.item.kind == capture::Item::Kind::replaced)
        giveEnd(event, emptied);
    else
        give(event);
    return true;
}

// Until the first frame has come, nobody can say which run this is.
bool LogInput::readFirst() {
    capture::Item item;
    while (!hasFirst_ && reader_->next(item) == capture::Reader::Next::item) {
        hasFirst_ = isNumbered(item);
        if (item.kind == capture::Item::Kind::replaced)
            first_.clear();  // these items were before the replacement, and no frame followed them
        else if (hasFirst_ || first_.items().size() < mostBefore)
            first_.add(item);
    }
    if (hasFirst_)
        found_ = recording::logOf(item.frame);
    return hasFirst_;
}

bool LogInput::isKnown() const { return !isEnded_ && log_ && found_ && found_->holdsTheSameAs(*log_); }

void LogInput::beginRun() {
    recording::RecordState state;
    state.run = run_;
    recording::beginRun(state, std::nullopt);
    run_ = state.run;
    next_ = 1;
    isEnded_ = false;
    log_ = found_;
}

void LogInput::giveEnd(InputEvent& event, const char* why) {
    event = {InputEvent::Kind::end, run_, next_, {}, false, ParcelGap{next_, std::nullopt, why}};
    isEnded_ = true;
    if (!isPlaced_)
        return;
    first_.clear();
    hasFirst_ = isPlaced_ = false;
    given_ = 0;
    number_ = 1;
}

void LogInput::give(InputEvent& event) {
    event.kind = InputEvent::Kind::item;
    event.run = run_;
    event.number = number_;
    event.gap.reset();
    event.isOld = number_ < next_;
    if (!isNumbered(event.item))
        return;
    ++number_;
    next_ = std::max(next_, number_);
}

}  // namespace fleet
