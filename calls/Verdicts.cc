#include "calls/Verdicts.h"

#include <algorithm>
#include <utility>

#include "calls/CommandBits.h"
#include "calls/FindingKinds.h"
#include "calls/findingOf.h"

namespace calls {

// Empty if there is no doubt.
std::string_view Verdicts::doubtAbout(const Unanswered& question, const LinkWitness* link) {
    if (link == nullptr)
        return "nothing is known of the link";
    if (!link->wasUpSince(question.asked))
        return "the link was down meanwhile";
    if (!link->hasArrived(question.frame, question.asker))
        return "the receiver's link layer did not acknowledge it";
    if (!link->isWholeSince(question.asked, question.answering))
        return "a frame that may be the answer is missing in the trace";
    return {};
}

Verdicts::Verdict Verdicts::judge(Unanswered question) {
    const LinkWitness* const link = links_.witness(question.tei);
    if (link != nullptr && !link->heardBoth())
        return Verdict::nothing;
    if (const std::string_view reason = doubtAbout(question, link); !reason.empty()) {
        doubt(std::move(question), reason, link);
        return Verdict::cannotBeTold;
    }
    if (link->wholeUntil[indexOf(question.answering)] < question.until && held_.size() < mostHeld) {
        const std::int64_t until = question.until;
        held_.push_back({std::move(question), until});
        return Verdict::held;
    }
    report(question);
    return Verdict::fault;
}

void Verdicts::report(Unanswered& fault) {
    FindingSink& sink = fault.gathered != nullptr ? *fault.gathered : sink_;
    sink.report(std::move(fault.finding));
}

void Verdicts::doubt(Unanswered question, std::string_view reason, const LinkWitness* link) {
    Finding& finding = question.finding;
    const auto [entry, isNew] = doubtful_.try_emplace({question.tei, reason});
    Doubtful& doubtful = entry->second;
    constexpr std::size_t mostCalls = 4096;
    if (finding.call && doubtful.calls.size() < mostCalls)
        doubtful.calls.push_back(std::to_string(*finding.call));
    doubtful.since = question.until;
    if (link != nullptr)
        doubtful.since =
            std::max({doubtful.since, link->lastDown, link->lastHole[indexOf(question.answering)]});
    if (!isNew) {
        ++doubtful.first.count;
        return;
    }
    finding.kind = &findings::cannotBeTold;
    finding.severity = findings::cannotBeTold.severity;
    finding.clause = findings::cannotBeTold.clause;
    doubtful.first = std::move(finding);
}

void Verdicts::report(Doubtful& doubtful, std::string_view reason) {
    Finding& note = doubtful.first;
    if (note.count == 1) {
        note.sentence.append(", but ").append(reason);
    } else {
        note.call.reset();
        note.sentence = std::to_string(note.count) + " questions got no answer";
        if (!doubtful.calls.empty())
            note.sentence += ", of calls " + listOf(doubtful.calls);
        note.sentence.append(", but ").append(reason);
    }
    sink_.report(std::move(note));
}

// A later frame shows whether one of the answering side was missing. A link that went down since then shows
// nothing more about it.
void Verdicts::reconsider(std::int64_t at, bool isOver) {
    std::deque<Held> open;
    for (Held& held : held_) {
        Unanswered& question = held.question;
        const LinkWitness& link = *links_.witness(question.tei);
        if (!held.heardAgain && link.lastHeard >= question.until) {
            held.heardAgain = true;
            held.since = link.lastHeard;
        }
        // After a long silence, the numbers of one side may have come round to where they were. Those of both
        // sides hardly have.
        const bool wasSilent = held.since - question.until > timers_.t203;
        const bool isWhole =
            link.wholeUntil[indexOf(question.answering)] >= question.until &&
            (!wasSilent || link.wholeUntil[indexOf(other(question.answering))] >= question.until);
        const bool lacksFrames = link.lastHole[indexOf(question.answering)] >= question.asked;
        if (lacksFrames || (!isWhole && !link.isWholeSince(question.asked, question.answering))) {
            const std::string_view reason = doubtAbout(question, &link);
            doubt(std::move(question), reason, &link);
        } else if (!isOver && !isWhole && link.wasUpSince(question.until) && at - held.since <= timers_.t203)
            open.push_back(std::move(held));
        else
            report(question);
    }
    held_ = std::move(open);
}

// The clock comes to a frame's time before the frame is heard, and that frame may be the one that decides. So
// T203 runs out with the clock of the step before.
void Verdicts::advance(std::int64_t at, std::int64_t oldest) {
    const std::int64_t heardUntil = std::exchange(now_, at);
    if (!held_.empty())
        reconsider(heardUntil, false);
    for (auto entry = doubtful_.begin(); entry != doubtful_.end();) {
        if (oldest <= entry->second.since) {
            ++entry;
            continue;
        }
        report(entry->second, entry->first.second);
        entry = doubtful_.erase(entry);
    }
}

void Verdicts::finish() {
    reconsider(0, true);
    for (auto& [key, doubtful] : doubtful_)
        report(doubtful, key.second);
    doubtful_.clear();
}

}  // namespace calls
