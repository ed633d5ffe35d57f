#include "reader/Joined.h"

#include <algorithm>
#include <utility>

namespace reader {

void Names::keep(capture::Item& item) {
    capture::Frame& frame = item.frame;
    // Compare the interface's contents and not only its address, because it may learn its variant while the
    // input is read.
    if (frame.interface != nullptr) {
        if (frame.interface != lastGiven_ || !(*frame.interface == lastSeen_)) {
            lastGiven_ = frame.interface;
            lastSeen_ = *frame.interface;
            const auto known = std::find(interfaces_.begin(), interfaces_.end(), lastSeen_);
            lastKept_ = known != interfaces_.end() ? &*known : &interfaces_.emplace_back(lastSeen_);
        }
        frame.interface = lastKept_;
    }
    // A file's name keeps its address as long as its reader exists.
    const std::string_view file = frame.place.file;
    if (file.data() != lastFileGiven_.data() || file.size() != lastFileGiven_.size()) {
        lastFile_ = *files_.emplace(file).first;
        lastFileGiven_ = file;
    }
    frame.place.file = lastFile_;
}

capture::Reader::Next Sequence::next(capture::Item& item) {
    while (true) {
        if (current_ == nullptr) {
            if (nextInput_ == inputs_.size())
                return Next::end;
            current_ = inputs_[nextInput_++]();
        }
        const Next got = current_->next(item);
        if (got == Next::item)
            names_.keep(item);
        if (got != Next::end || nextInput_ == inputs_.size())
            return got;
        current_ = nullptr;
        names_.readerIsGone();
    }
}

void Sequence::wait(std::chrono::milliseconds most) {
    if (current_ != nullptr)
        current_->wait(most);
}

// The length is not known, because inputs that are not open yet have none.
capture::Reader::Progress Sequence::progress() const {
    if (current_ == nullptr)
        return {};
    return inputs_.size() == 1 ? current_->progress() : Progress{current_->progress().octets, 0};
}

Merge::Merge(const std::vector<Opener>& inputs) {
    for (const Opener& open : inputs)
        inputs_.push_back({open(), {}});
}

capture::Reader::Next Merge::next(capture::Item& item) {
    Input* earliest = nullptr;
    bool pausing = false;
    for (Input& input : inputs_) {
        if (input.given && input.state != Next::end) {
            input.state = input.reader->next(input.item);
            input.given = input.state != Next::item;
        }
        pausing = pausing || input.state == Next::pause;
        if (input.given)
            continue;
        const bool hasNoTime = input.item.frame.clock == capture::Clock::none;
        if (earliest == nullptr || hasNoTime || input.item.frame.time < earliest->item.frame.time)
            earliest = &input;
        if (hasNoTime)
            break;
    }
    if (earliest == nullptr)
        return pausing ? Next::pause : Next::end;
    item = earliest->item;
    names_.keep(item);
    earliest->given = true;
    return Next::item;
}

// Waits for the first input that has nothing. Wakes now and then, because another input may have something
// earlier.
void Merge::wait(std::chrono::milliseconds most) {
    const auto pausing = std::count_if(inputs_.begin(), inputs_.end(),
                                       [](const Input& input) { return input.state == Next::pause; });
    const auto waiting = std::find_if(inputs_.begin(), inputs_.end(),
                                      [](const Input& input) { return input.state == Next::pause; });
    if (waiting != inputs_.end())
        waiting->reader->wait(pausing > 1 ? std::min(most, std::chrono::milliseconds(20)) : most);
}

capture::Reader::Progress Merge::progress() const {
    Progress sum;
    bool known = true;
    for (const Input& input : inputs_) {
        const Progress part = input.reader->progress();
        sum.octets += part.octets;
        sum.of += part.of;
        known = known && part.of != 0;
    }
    return {sum.octets, known ? sum.of : 0};
}

}  // namespace reader
