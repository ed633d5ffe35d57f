#include "reader/CallLadder.h"

#include <algorithm>
#include <set>
#include <utility>

#include "isdn/words.h"
#include "reader/CallLine.h"
#include "reader/Columns.h"

namespace reader {

namespace {

using calls::Side;

// The words of elements are separated by two blanks.
std::vector<std::string> split(std::string_view words) {
    std::vector<std::string> parts;
    while (!words.empty()) {
        const std::size_t end = std::min(words.find("  "), words.size());
        if (end > 0)
            parts.emplace_back(words.substr(0, end));
        words.remove_prefix(std::min(end + 2, words.size()));
    }
    return parts;
}

bool tellsOfLink(isdn::FrameType type) {
    using enum isdn::FrameType;
    return type == SABME || type == UA || type == DM || type == DISC || type == REJ || type == RNR ||
           type == FRMR;
}

std::string labelOf(std::string_view side, capture::Role role) {
    std::string label(side);
    if (role == capture::Role::user)
        label += " (user)";
    else if (role == capture::Role::network)
        label += " (network)";
    return label;
}

std::string dateOf(Instant when, TimeText& times) {
    std::string text;
    if (when.clock == capture::Clock::absolute)
        times.append(text, when);
    return text.substr(0, text.find('T'));
}

// Inserts a line with the date before the first rung of each new day.
void insertDates(std::vector<Rung>& rungs, const calls::Call& call, TimeText& times) {
    std::string date = dateOf({call.begin.clock, call.begin.time}, times);
    for (std::size_t i = 0; i < rungs.size(); ++i) {
        std::string own = dateOf(rungs[i].when, times);
        if (own.empty() || own == date)
            continue;
        Rung day = rungs[i];
        day.kind = Rung::Kind::words;
        day.details.clear();
        day.when = {};
        day.at = i == 0 ? day.at : rungs[i - 1].at;
        day.name = date = std::move(own);
        rungs.insert(rungs.begin() + static_cast<std::ptrdiff_t>(i), std::move(day));
        ++i;
    }
}

// Sets what the rungs have to name, so that messages of several terminals or D channels can be told apart.
void tellApart(CallLadder& ladder) {
    std::set<std::uint8_t> teis;
    std::set<std::string_view> dChannels;
    for (const Rung& rung : ladder.rungs) {
        if (rung.kind != Rung::Kind::message)
            continue;
        teis.insert(rung.tei);
        dChannels.insert(rung.dChannel);
    }
    ladder.hasSeveralTeis = teis.size() > 1;
    ladder.namesDChannels = dChannels.size() > 1;
}

void putInOrder(std::vector<Rung>& rungs) {
    std::stable_sort(rungs.begin(), rungs.end(), [](const Rung& a, const Rung& b) {
        return std::pair(a.frame, a.kind == Rung::Kind::words) <
               std::pair(b.frame, b.kind == Rung::Kind::words);
    });
}

}  // namespace

std::optional<std::int64_t> CallLadder::sinceBefore(std::size_t rung) const {
    if (rung == 0 || rungs[rung].when.clock == capture::Clock::none)
        return std::nullopt;
    return std::max<std::int64_t>(rungs[rung].at - rungs[rung - 1].at, 0);
}

std::string timeOfDay(Instant when, TimeText& times) {
    if (when.clock == capture::Clock::none)
        return {};
    std::string text;
    times.append(text, when);
    const std::size_t time = text.find('T');
    constexpr std::size_t length = 12;
    return time == std::string::npos ? text : text.substr(time + 1, length);
}

std::vector<std::string> detailsOf(const CallLadder& ladder, const Rung& rung) {
    std::vector<std::string> details = rung.details;
    if (rung.kind == Rung::Kind::words)
        return details;
    if (ladder.hasSeveralTeis)
        details.insert(details.begin(), "TEI " + std::to_string(rung.tei));
    if (ladder.namesDChannels && !rung.dChannel.empty())
        details.insert(details.begin(), "on " + rung.dChannel);
    return details;
}

CallLadder together(std::vector<CallLadder> ladders, const std::vector<std::uint64_t>& calls) {
    if (ladders.empty())
        return {};
    if (ladders.size() == 1)
        return std::move(ladders.front());
    CallLadder all;
    all.us = ladders.front().us;
    all.peer = ladders.front().peer;
    std::set<std::pair<std::uint64_t, std::string>> linkRungs;
    for (std::size_t i = 0; i < ladders.size(); ++i) {
        all.headline.push_back("call " + std::to_string(calls[i]));
        all.missing += ladders[i].missing;
        for (Rung& rung : ladders[i].rungs) {
            if (rung.kind == Rung::Kind::message)
                rung.details.insert(rung.details.begin(), "call " + std::to_string(calls[i]));
            else if (!linkRungs.emplace(rung.frame, rung.name).second)
                continue;
            all.rungs.push_back(std::move(rung));
        }
    }
    tellApart(all);
    putInOrder(all.rungs);
    return all;
}

void Ladders::see(const Seen& seen) {
    if (seen.number != 0)
        number_ = seen.number;
    frame_ = seen.frame();
    when_ = seen.when;
    at_ = seen.at;
    Rung rung;
    std::string marks;
    if (seen.isFrame()) {
        if (!tellsOfLink(seen.link.type) || seen.link.sapi != isdn::callControlSapi)
            return;
        rung.kind = Rung::Kind::link;
        rung.tei = seen.link.tei;
        rung.name = isdn::nameOf(seen.link.type);
        std::string words;
        appendDetails(words, seen);
        rung.details = split(words);
        appendMarks(marks, seen);
        if (!marks.empty() && marks != rung.name)
            rung.details.push_back(marks);
    } else if (seen.item->kind != capture::Item::Kind::comment) {
        rung.kind = Rung::Kind::words;
        appendEvent(rung.name, *seen.item);
    } else {
        return;
    }
    rung.frame = number_;
    rung.when = when_;
    rung.at = at_;
    rung.from = frame_.transmitted ? Side::us : Side::peer;
    if (frame_.interface != nullptr)
        rung.dChannel = frame_.interface->name;
    links_.push_back(std::move(rung));
    if (links_.size() > mostOfLinks)
        links_.pop_front();
}

Rung Ladders::rungOf(const calls::Message& message) const {
    Rung rung;
    rung.frame = message.number;
    rung.from = message.from();
    rung.tei = message.layer2.tei;
    if (message.frame->interface != nullptr)
        rung.dChannel = message.frame->interface->name;
    rung.when = when_;
    rung.at = at_;
    // Some messages are certain only after later frames. Such a message passed before the item that is seen
    // now.
    if (message.number != number_) {
        rung.when = {message.frame->clock, message.frame->time};
        rung.at =
            message.frame->clock == frame_.clock ? at_ - (frame_.time - message.frame->time) : message.at;
    }
    appendMessageName(rung.name, message.layer3);
    std::string words;
    isdn::appendWords(words, message.layer3, message.variant, message.sender());
    rung.details = split(words);
    return rung;
}

bool Ladders::add(const calls::Call& call, Rung rung) {
    std::vector<Rung>& rungs = calls_[call.number].rungs;
    const auto same =
        std::ranges::find_if(rungs, [&](const Rung& known) { return known.frame == rung.frame; });
    if (same != rungs.end()) {
        *same = std::move(rung);
        return true;
    }
    if (rungs.size() >= mostOfACall)
        return false;
    rungs.push_back(std::move(rung));
    for (++count_; count_ > mostInAll; calls_.erase(calls_.begin()))
        count_ -= calls_.begin()->second.rungs.size();
    return true;
}

void Ladders::heard(const calls::Message& message, const calls::Call& call) {
    if (add(call, rungOf(message)) && calls_.contains(call.number))
        ++calls_[call.number].heard;
}

void Ladders::carried(const calls::Message& message, const calls::Call& call) {
    Rung rung = rungOf(message);
    const std::vector<Rung>& known = calls_[call.number].rungs;
    const bool isCopy = std::ranges::any_of(known, [&](const Rung& other) {
        return other.from == rung.from && other.name == rung.name && other.details == rung.details &&
               other.frame != rung.frame;
    });
    if (isCopy)
        rung.details.emplace_back("retransmitted");
    else if (message.layer3.type != isdn::message::segment)
        rung.details.emplace_back("not accepted");
    add(call, std::move(rung));
}

void Ladders::restarted(const calls::Message& message) {
    links_.push_back(rungOf(message));
    if (links_.size() > mostOfLinks)
        links_.pop_front();
}

// Adds what happened to the links of the call while it was alive: the frames of its terminals, and the
// RESTART that ended it.
void Ladders::addLinkRungs(const calls::Call& call, std::vector<Rung>& rungs) const {
    if (rungs.empty())
        return;
    std::set<std::pair<std::string, std::uint8_t>> links;
    std::set<std::string> dChannels;
    for (const Rung& rung : rungs) {
        links.emplace(rung.dChannel, rung.tei);
        dChannels.insert(rung.dChannel);
    }
    const std::uint64_t first = rungs.front().frame;
    const bool isOpen = call.endedBy == calls::EndedBy::open;
    for (const Rung& rung : links_) {
        const bool isMeanwhile = rung.frame > first && (isOpen || rung.at <= call.end.at);
        const bool isItsOwn = rung.kind == Rung::Kind::link    ? links.contains({rung.dChannel, rung.tei})
                              : rung.kind == Rung::Kind::words ? dChannels.contains(rung.dChannel)
                                                               : rung.frame == call.end.frame;
        if (isMeanwhile && isItsOwn)
            rungs.push_back(rung);
    }
}

CallLadder Ladders::take(const calls::Call& call, TimeText& times, bool severalDChannels) {
    CallLadder ladder;
    ladder.headline = callWords(call, times, severalDChannels);
    const capture::Role ours = call.origin == Side::us ? call.originRole : calls::opposite(call.originRole);
    ladder.us = labelOf("us", ours);
    ladder.peer = labelOf("peer", calls::opposite(ours));
    const auto known = calls_.find(call.number);
    std::uint64_t shown = 0;
    if (known != calls_.end()) {
        shown = known->second.heard;
        count_ -= known->second.rungs.size();
        ladder.rungs = std::move(known->second.rungs);
        calls_.erase(known);
    }
    ladder.missing = call.messages - std::min(call.messages, shown);
    tellApart(ladder);
    putInOrder(ladder.rungs);
    addLinkRungs(call, ladder.rungs);
    putInOrder(ladder.rungs);
    insertDates(ladder.rungs, call, times);
    return ladder;
}

void Ladders::forget(const calls::Call& call) {
    const auto known = calls_.find(call.number);
    if (known == calls_.end())
        return;
    count_ -= known->second.rungs.size();
    calls_.erase(known);
}

}  // namespace reader
