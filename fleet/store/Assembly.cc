#include "fleet/store/Assembly.h"

#include <algorithm>

#include "calls/recording.h"

namespace fleet {

namespace {

constexpr std::uint64_t framesAtOnce = 5000;
// How many of the newest calls and frames are remembered, because a finding may name a call that ended a
// while ago, or a frame whose answer it waited for.
constexpr std::size_t callsRemembered = 65'536;
constexpr std::size_t ordinalsRemembered = 65'536;

calls::Options optionsOf(const std::string& name, bool isGrouped) {
    calls::Options options;
    if (isGrouped)
        options.groups = {{name}};
    return options;
}

}  // namespace

Assembly::Assembly(const RunKey& key, std::string trunkName, std::string place, bool isGrouped)
    : key_(key),
      name_(trunkName),
      isGrouped_(isGrouped),
      rows_(std::move(trunkName), std::move(place)),
      analysis_(optionsOf(name_, isGrouped), *this) {}

void Assembly::expect(const std::string& day) {
    if (!isAnyDay_ && (!since_ || day < *since_))
        since_ = day;
}

void Assembly::advance(pqxx::transaction_base& work, Results& results) {
    if (assembled_ == 0)
        readState(work);
    if (isFinished_)
        return;
    hole_.reset();
    if (isAnyDay_ || since_) {
        while (readFrames(work) == framesAtOnce) {
        }
    }
    if (!hole_) {
        isAnyDay_ = false;
        since_.reset();
    }
    putOpen();
    finishIfEnded(work);
    if (next_ <= assembled_ && !isFinished_ && changed_.empty() && findings_.empty())
        return;
    assembled_ = std::max(assembled_, next_);
    work.exec_params0("UPDATE lapd.runs SET assembled = $3, finished = $4 WHERE trunk = $1 AND run = $2",
                      key_.trunk, key_.run, assembled_, isFinished_);
    collect(results);
}

void Assembly::readState(pqxx::transaction_base& work) {
    const pqxx::row row = work.exec_params1(
        "SELECT assembled, finished FROM lapd.runs WHERE trunk = $1 AND run = $2", key_.trunk, key_.run);
    assembled_ = row[0].as<std::uint64_t>();
    isFinished_ = row[1].as<bool>();
}

// Reads the next frames. Returns how many rows there were.
std::size_t Assembly::readFrames(pqxx::transaction_base& work) {
    const std::string days = since_ ? " AND day >= '" + *since_ + "'" : "";
    const pqxx::result rows =
        work.exec(std::string("SELECT ") + frameColumns +
                  " FROM lapd.frames WHERE trunk = " + std::to_string(key_.trunk) +
                  " AND run = " + std::to_string(key_.run) + " AND number >= " + std::to_string(next_) +
                  days + " ORDER BY number, day LIMIT " + std::to_string(framesAtOnce));
    for (const pqxx::row& row : rows) {
        const auto number = row[1].as<std::uint64_t>();
        if (number < next_)
            continue;
        if (number > next_ && !mayPass(work, number)) {
            hole_ = next_;
            return 0;
        }
        rows_.take(row);
        next_ = number + 1;
        feedItems();
    }
    return rows.size();
}

// Whether the frames between the next one and this one are missing for good: the shipper has reported them as
// a gap, or they were assembled before and have been deleted since (`lapdstore forget`).
bool Assembly::mayPass(pqxx::transaction_base& work, std::uint64_t number) {
    std::uint64_t missing = std::max(next_, assembled_);
    for (const pqxx::row& gap : work.exec_params(
             "SELECT first, last FROM lapd.gaps WHERE trunk = $1 AND run = $2 AND first < $3 ORDER BY first",
             key_.trunk, key_.run, number)) {
        if (gap[0].as<std::uint64_t>() <= missing && !gap[1].is_null())
            missing = std::max(missing, gap[1].as<std::uint64_t>() + 1);
    }
    return missing >= number;
}

// Hands the frames to the analysis. Drops the results of frames that were assembled before, because these are
// in the tables already.
void Assembly::feedItems() {
    capture::Item item;
    while (rows_.next(item))
        calls::feed(analysis_, item, rows_.number());
    if (next_ <= assembled_) {
        changed_.clear();
        findings_.clear();
        outcomes_ = {};
    }
}

void Assembly::finishIfEnded(pqxx::transaction_base& work) {
    const pqxx::row row = work.exec_params1(
        "SELECT ended, behind FROM lapd.runs WHERE trunk = $1 AND run = $2", key_.trunk, key_.run);
    if (row[0].is_null() ||
        (next_ < row[0].as<std::uint64_t>() && !mayPass(work, row[0].as<std::uint64_t>())))
        return;
    if (!row[1].is_null()) {
        rows_.takeNotes(row[1].c_str());
        feedItems();
    }
    analysis_.finish();
    isFinished_ = true;
}

void Assembly::heard(const calls::Message& /*message*/, const calls::Call* call) {
    if (call != nullptr)
        remember(*call);
}

void Assembly::ended(const calls::Call& call) {
    put(call);
    if (isGrouped_ && call.endedBy == calls::EndedBy::link)
        return;
    ++outcomes_.calls;
    if (hasFailed(call))
        ++outcomes_.failed[call.cause ? std::optional<int>(call.cause->value) : std::nullopt];
}

void Assembly::gone(const calls::Call& call) {
    put(call);
    open_.erase(call.begin.frame);
}

void Assembly::remember(const calls::Call& call) {
    firstFrames_[call.number] = call.begin.frame;
    if (firstFrames_.size() > callsRemembered)
        firstFrames_.erase(firstFrames_.begin());
}

void Assembly::put(const calls::Call& call) {
    remember(call);
    changed_[call.begin.frame] = rowOf(key_, call);
}

// Adds the rows of calls that are alive and have changed, so that the store shows what is going on.
void Assembly::putOpen() {
    for (const calls::Call* const call : analysis_.open()) {
        CallRow row = rowOf(key_, *call);
        CallRow& last = open_[call->begin.frame];
        if (row == last)
            continue;
        last = row;
        changed_[call->begin.frame] = std::move(row);
    }
}

void Assembly::found(const calls::Finding& finding) {
    const std::uint32_t ordinal = ++ordinals_[{finding.frame, finding.kind->id}];
    if (ordinals_.size() > ordinalsRemembered)
        ordinals_.erase(ordinals_.begin());
    findings_.emplace_back(finding, ordinal);
    ++outcomes_.findings[finding.kind->id];
}

// A finding may come before the first row of its call, so the calls of findings are looked up here.
void Assembly::collect(Results& results) {
    for (auto& [frame, row] : changed_)
        results.calls.push_back(std::move(row));
    for (const auto& [finding, ordinal] : findings_) {
        std::optional<std::uint64_t> firstFrame;
        if (const auto known = firstFrames_.find(finding.call.value_or(0)); known != firstFrames_.end())
            firstFrame = known->second;
        results.findings.push_back(rowOf(key_, finding, ordinal, firstFrame));
    }
    outcomes_.isLinkUp = isLinkUp();
    results.outcomes[key_.trunk].add(outcomes_);
    changed_.clear();
    findings_.clear();
    outcomes_ = {};
}

// Whether the link with TEI 0 is up, as on a primary rate. Nothing if no frame has shown it.
std::optional<bool> Assembly::isLinkUp() const {
    const calls::DChannel* const channel = analysis_.dChannel(name_);
    const calls::Link* const link = channel == nullptr ? nullptr : channel->find(isdn::callControlSapi, 0);
    if (link == nullptr || link->state() == calls::LinkState::unknown)
        return std::nullopt;
    return link->state() == calls::LinkState::up;
}

}  // namespace fleet
