#include "reader/Triggers.h"

#include <algorithm>

#include "calls/recording.h"
#include "reader/Feed.h"
#include "reader/OptionRow.h"
#include "reader/check.h"
#include "reader/errors.h"

namespace reader {

namespace {

constexpr std::string_view check = "check";
// Filters that look at the frame itself and not at its time.
constexpr std::string_view filters[] = {"cause",   "message", "number", "callref",
                                        "channel", "tei",     "type",   "mark"};

}  // namespace

void readTrigger(const std::string& value, RecordOptions& to) {
    const std::size_t colon = value.find(':');
    const std::string name = value.substr(0, colon);
    const std::string of = colon == std::string::npos ? "" : value.substr(colon + 1);
    if (name == check && !of.empty()) {
        const calls::Severity severity = severityNamed(of);
        to.onCheck = std::min(to.onCheck.value_or(severity), severity);
        return;
    }
    if (of.empty() || std::find(std::begin(filters), std::end(filters), name) == std::end(filters))
        throw UsageError(value + " is no trigger: check:error, cause:34,38 or another filter and its values");
    const FilterWord word{name, of};
    const Filter understood({word});  // throws for a wrong value
    static_cast<void>(understood);
    to.onFrames.push_back(word);
}

Triggers::Triggers(const Options& options) : severity_(options.record.onCheck) {
    calls::Listener& listener = *this;
    if (severity_)
        analysis_ = std::make_unique<calls::Analysis>(analysisOptions(options), listener);
    for (const FilterWord& word : options.record.onFrames)
        wanted_.push_back({word.name + ":" + word.value, Filter({word})});
}

std::span<const Triggers::Fired> Triggers::look(const Seen& seen) {
    fired_.clear();
    if (analysis_ != nullptr && seen.isFrame())
        analysis_->take(seen.frame(), seen.number);
    else if (analysis_ != nullptr)
        calls::tell(*analysis_, *seen.item);
    for (const Wanted& wanted : wanted_) {
        if (seen.isFrame() && wanted.filter.passes(seen))
            fired_.push_back({seen.frame().interface->name,
                              wanted.words + " (frame " + std::to_string(seen.number) + ")"});
    }
    return fired_;
}

std::span<const Triggers::Fired> Triggers::advance(std::int64_t nanoseconds) {
    fired_.clear();
    if (analysis_ != nullptr)
        analysis_->advance(nanoseconds);
    return fired_;
}

void Triggers::found(const calls::Finding& finding) {
    if (finding.severity >= *severity_)
        fired_.push_back({finding.dChannel, std::string(nameOf(finding.severity)) + " " +
                                                std::string(finding.kind->id) + ": " + finding.sentence +
                                                " (frame " + std::to_string(finding.frame) + ")"});
}

}  // namespace reader
