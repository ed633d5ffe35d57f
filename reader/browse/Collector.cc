#include "reader/browse/Collector.h"

#include <algorithm>
#include <utility>

#include "reader/Filter.h"

namespace reader::browse {

Collector::Collector(const Options& options, UpdateQueue& queue)
    : Analysed(options), queue_(queue), size_(options.calls.trunk), page_(std::make_shared<Page>()) {}

void Collector::see(const Seen& seen) {
    page_->add(seen, known(seen.frame().interface), known(seen.frame().place.file));
    hasChanged_ = true;
    if (seen.frame().interface != nullptr && seen.isFrame()) {
        Channel& channel = channels_[seen.frame().interface->name];
        channel.frames.count(seen.at);
        channel.at = seen.at;
        channel.when = seen.when;
        if (seen.link.sapi == isdn::callControlSapi)
            channel.teis.insert(seen.link.tei);
    }
    if (page_->size() >= mostItems)
        handOver();
}

void Collector::heard(const calls::Message& message, const calls::Call* call) {
    Analysed::heard(message, call);
    noteFrame(message, call, false);
    if (call == nullptr)
        return;
    occupancy_.heard(message, *call);
    if (call->number > newestCall_) {
        newestCall_ = call->number;
        channels_[call->dChannel].calls.count(channels_[call->dChannel].at);
    }
}

void Collector::carried(const calls::Message& message, const calls::Call* call) {
    if (call != nullptr)
        noteFrame(message, call, true);
}

void Collector::noteFrame(const calls::Message& message, const calls::Call* call, bool isCarried) {
    namespace type = isdn::message;
    const bool restarts =
        message.layer3.type == type::restart || message.layer3.type == type::restartAcknowledge;
    if (call == nullptr && !restarts)
        return;
    update_.frames.push_back({call == nullptr ? 0 : call->number, message.number, isCarried});
    if (call != nullptr)
        touched_.insert(call->number);
}

void Collector::ended(const calls::Call& call) {
    occupancy_.ended(call);
    if (mayBeShown(call))
        keep(call);
    touched_.erase(call.number);
}

void Collector::gone(const calls::Call& call) {
    const bool isShown = isWanted(call);
    Analysed::gone(call);
    touched_.erase(call.number);
    if (isShown)
        keep(call);
    else
        update_.unwanted.push_back(call.number);
    hasChanged_ = true;
}

void Collector::found(const calls::Finding& finding) {
    occupancy_.found(finding);
    Analysed::found(finding);
    hasChanged_ = true;
}

bool Collector::mayBeShown(const calls::Call& call) const {
    return mayBeWanted(call) && hasFrameWanted(call);
}

// Keeps a copy of the call without the numbers of its frames, which are handed over separately.
void Collector::keep(const calls::Call& call) {
    calls::Call copy = call;
    copy.frames = {};
    update_.calls.insert_or_assign(call.number, std::move(copy));
}

void Collector::flush() {
    if (hasChanged_ || HostClock::now() - trunksAt_ >= trunkInterval) {
        update_.state = Update::State::live;
        trunksAt_ = {};
        handOver();
    }
}

void Collector::finish(const std::string& error) {
    update_.state = Update::State::ended;
    update_.error = error;
    // The trunks stay as they were at the last frame: the analysis has handed out its open calls by now.
    trunksAt_ = HostClock::now();
    handOver();
}

void Collector::handOver() {
    putOpenCalls();
    putTrunks();
    const auto next = std::make_shared<Page>(page_->lastNumber());
    update_.page = std::exchange(page_, next);
    update_.callsDropped = analysis().dropped();
    queue_.put(std::exchange(update_, Update()));
    hasChanged_ = false;
}

void Collector::putOpenCalls() {
    if (touched_.empty())
        return;
    for (const calls::Call* const call : analysis().open()) {
        if (touched_.contains(call->number) && mayBeShown(*call))
            keep(*call);
    }
    touched_.clear();
}

void Collector::putTrunks() {
    const HostClock::time_point now = HostClock::now();
    if (now - trunksAt_ < trunkInterval)
        return;
    trunksAt_ = now;
    const std::vector<calls::CellRow> rows = calls::cellRows(analysis(), occupancy_, size_);
    std::set<std::uint32_t> groups;
    for (const calls::Span& span : analysis().spans()) {
        Channel& channel = channels_[span.dChannel];
        TrunkView view;
        view.dChannel = span.dChannel;
        view.role = analysis().dChannel(span.dChannel)->role();
        view.links = linksOf(span.dChannel, channel);
        view.framesAMinute = channel.frames.upTo(span.until);
        view.callsAMinute = channel.calls.upTo(span.until);
        if (groups.insert(span.group).second)
            std::copy_if(rows.begin(), rows.end(), std::back_inserter(view.cells),
                         [&](const calls::CellRow& row) { return row.group == span.group; });
        update_.trunks.push_back(std::move(view));
    }
}

std::vector<LinkView> Collector::linksOf(const std::string& name, const Channel& channel) const {
    std::vector<LinkView> views;
    for (const std::uint8_t tei : channel.teis) {
        const calls::Link* const link = analysis().dChannel(name)->find(isdn::callControlSapi, tei);
        if (link == nullptr || tei == isdn::groupTei)
            continue;
        Instant since = channel.when;
        since.time -= channel.at - link->since();
        views.push_back({tei, link->state(), since, link->sawSetUp()});
    }
    return views;
}

const capture::Interface* Collector::known(const capture::Interface* interface) {
    if (interface == nullptr)
        return nullptr;
    const auto found = std::find(interfaces_.begin(), interfaces_.end(), *interface);
    return found != interfaces_.end() ? &*found : &interfaces_.emplace_back(*interface);
}

std::string_view Collector::known(std::string_view file) {
    const auto found = files_.find(file);
    return found != files_.end() ? *found : *files_.emplace(file).first;
}

}  // namespace reader::browse
