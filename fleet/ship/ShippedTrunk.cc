#include "fleet/ship/ShippedTrunk.h"

#include <algorithm>
#include <iterator>
#include <stdexcept>
#include <utility>

#include "fleet/ship/FolderInput.h"
#include "fleet/ship/LogInput.h"

namespace fleet {

namespace {

constexpr int mostAtOnce = 1000;  // events that are taken before the other D channels have their turn

// Two D channels cannot get one path, because the names in an address's text contain no ".".
std::string placePathOf(const Address& address, const std::string& folder) {
    const std::string text = toText(address);
    std::string name = text.substr(text.find('/', text.find('/') + 1) + 1);
    name[name.find('/')] = '.';
    return folder + "/" + name + ".place.json";
}

std::unique_ptr<TrunkInput> makeInput(const ShippedDChannel& dChannel, const Place& place) {
    const std::string& trunk = dChannel.head.trunk;
    if (!dChannel.log.empty())
        return std::make_unique<LogInput>(dChannel.log, trunk, place);
    const auto before =
        dChannel.head.isRedacted ? FolderInput::Before::recording : FolderInput::Before::nothing;
    return std::make_unique<FolderInput>(dChannel.folder, trunk, place, before);
}

}  // namespace

ShippedTrunk::ShippedTrunk(const ShippedDChannel& dChannel, std::size_t number,
                           const std::string& stateFolder, const redaction::Key* key, Say say)
    : dChannel_(dChannel),
      number_(number),
      key_(key == nullptr ? std::nullopt : std::optional(*key)),
      name_(toText(dChannel.head.address)),
      placePath_(placePathOf(dChannel.head.address, stateFolder)),
      say_(std::move(say)),
      makesRuns_(!dChannel.log.empty()),
      packer_(dChannel.head) {
    try {
        if (auto place = readPlace(placePath_))
            place_ = *std::move(place);
    } catch (const std::runtime_error& error) {
        say_(std::string(error.what()) + "; everything is shipped again");
    }
    begin();
}

void ShippedTrunk::begin() {
    run_ = place_.run;
    if (key_)
        redactor_.emplace(*key_, [this](const InputEvent& event) { packer_.take(event); });
    input_ = makeInput(dChannel_, place_);
}

bool ShippedTrunk::step(Outbox& outbox) {
    for (int i = 0; i < mostAtOnce && outbox.hasRoom(number_);) {
        if (!packer_.parcels().empty()) {
            outbox.add(number_, packer_.parcels().front());
            packer_.parcels().pop_front();
        } else if (isHeld_) {
            if (!beginRun(outbox))
                return false;
        } else if (readNext()) {
            ++i;
        } else {
            if (redactor_)
                redactor_->pause();
            packer_.close();
            if (packer_.parcels().empty())
                return false;
        }
    }
    return outbox.hasRoom(number_);
}

bool ShippedTrunk::readNext() {
    try {
        if (!input_->next(event_)) {
            if (const std::string lacks = input_->lacks(); !lacks.empty())
                sayOnce(lacks);
            return false;
        }
    } catch (const capture::BadInput& error) {
        sayOnce(error.what());
        return false;
    }
    if (event_.run != std::exchange(run_, event_.run) && makesRuns_) {
        packer_.close();
        isHeld_ = true;
    } else {
        take(event_);
    }
    return true;
}

// Notes a new run on the disk before any frame of it is sent. Otherwise a shipper that is started again would
// make another run of the same frames. Returns false, and must be called again, while the end of the run
// before is not safe (the place names only one run), and while the place cannot be written.
bool ShippedTrunk::beginRun(Outbox& outbox) {
    if (outbox.waiting(number_) != 0)
        return false;
    const Place before = std::exchange(place_, {run_, 1, false, input_->log()});
    isChanged_ = true;
    if (!save()) {
        place_ = before;
        return false;
    }
    isHeld_ = false;
    take(event_);
    return true;
}

void ShippedTrunk::take(const InputEvent& event) {
    count(event);
    if (redactor_)
        redactor_->take(event);
    else
        packer_.take(event);
}

void ShippedTrunk::count(const InputEvent& event) {
    const bool isFrame = event.kind == InputEvent::Kind::item && isNumbered(event.item) && !event.isOld;
    const std::pair at{event.run, event.number};
    if ((!isFrame && !event.gap) || at <= counted_)
        return;
    counted_ = at;
    gaps_ += event.gap ? 1 : 0;
    if (!isFrame)
        return;
    ++frames_;
    const capture::Frame& frame = event.item.frame;
    if (frame.clock == capture::Clock::absolute)
        newest_[frame.transmitted ? 1 : 0] = frame.time;
}

void ShippedTrunk::safe(const SafeUpTo& upTo, Clock::time_point now) {
    safe_.push_back({upTo, now});
    if (makesRuns_)
        settle(now);
}

void ShippedTrunk::settle(Clock::time_point then) {
    const auto end = std::ranges::find_if(safe_, [&](const Safe& each) { return each.since > then; });
    if (end == safe_.begin())
        return;
    moveTo(std::prev(end)->upTo);
    safe_.erase(safe_.begin(), end);
}

bool ShippedTrunk::goBack(Outbox& outbox) {
    if (makesRuns_)
        return false;
    outbox.drop(number_);
    safe_.clear();
    packer_ = Packer(dChannel_.head);
    begin();
    return true;
}

void ShippedTrunk::moveTo(const SafeUpTo& upTo) {
    if (place_.run != upTo.run)
        place_.log.reset();
    place_.run = upTo.run;
    place_.next = upTo.next;
    place_.isEnded = upTo.isEnded;
    isChanged_ = true;
}

bool ShippedTrunk::save() {
    if (!isChanged_)
        return true;
    const bool isNewRun = place_.next == 1;
    const auto durability = isNewRun ? recording::Durability::onDisk : recording::Durability::whenever;
    if (const auto wrong = writePlace(place_, name_, placePath_, durability)) {
        sayOnce(*wrong);
        return false;
    }
    isChanged_ = false;
    said_.clear();
    return true;
}

void ShippedTrunk::sayOnce(const std::string& text) {
    if (std::exchange(said_, text) != text)
        say_(name_ + ": " + text);
}

}  // namespace fleet
