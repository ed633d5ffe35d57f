#include "reader/check.h"

#include <array>
#include <optional>

#include "reader/Analysed.h"
#include "reader/FindingText.h"
#include "reader/Limit.h"
#include "reader/errors.h"
#include "reader/inputs.h"
#include "reader/json.h"
#include "reader/session.h"
#include "reader/text.h"

namespace reader {

namespace {

constexpr std::string_view colorOf(calls::Severity severity) {
    switch (severity) {
        case calls::Severity::error:
            return "\x1b[31m";
        case calls::Severity::warning:
            return "\x1b[33m";
        case calls::Severity::note:
            break;
    }
    return "\x1b[36m";
}
constexpr std::string_view colorOff = "\x1b[0m";

class FindingPrinter : public Analysed {
  public:
    FindingPrinter(const Options& options, Output& out, bool colors)
        : Analysed(options), options_(options), out_(out), colors_(colors) {}

    bool countsItself() const override { return true; }
    void flush() override { out_.flush(); }

    // The number of findings of each severity, in words.
    std::string summary() const {
        std::string words;
        for (const calls::Severity severity :
             {calls::Severity::error, calls::Severity::warning, calls::Severity::note}) {
            const std::uint64_t count = counts_[static_cast<std::size_t>(severity)];
            words += (words.empty() ? "" : ", ") + std::to_string(count) + " " +
                     std::string(nameOf(severity)) + (count == 1 ? "" : "s");
        }
        return words;
    }
    std::optional<calls::Severity> worst() const { return worst_; }

  private:
    void report(const calls::Finding& finding) override {
        if (finding.severity < options_.calls.least)
            return;
        ++counts_[static_cast<std::size_t>(finding.severity)];
        worst_ = std::max(worst_.value_or(finding.severity), finding.severity);
        if (!limit_.takeOne())
            return;
        text_.clear();
        if (options_.calls.form == CallForm::jsonLines)
            putJson(finding);
        else
            putText(finding);
        out_.write(text_);
    }

    // Writes a line that says what happened, and below it what that means and what to look at.
    void putText(const calls::Finding& finding) {
        if (colors_)
            text_ += colorOf(finding.severity);
        const std::size_t start = text_.size();
        text_ += nameOf(finding.severity);
        padTo(text_, start, 7);
        if (colors_)
            text_ += colorOff;
        text_ += ' ';
        appendHappening(text_, finding, times_, severalDChannels_);
        text_ += "\n        ";
        appendMeaning(text_, finding);
        text_ += '\n';
    }

    void putKey(std::string_view key) {
        text_ += ',';
        appendJsonString(text_, key);
        text_ += ':';
    }
    void putString(std::string_view key, std::string_view value) {
        putKey(key);
        appendJsonString(text_, value);
    }

    void putJson(const calls::Finding& finding) {
        text_ += "{\"v\":";
        appendNumber(text_, jsonVersion);
        putString("finding", finding.kind->id);
        putString("severity", nameOf(finding.severity));
        putKey("time");
        if (finding.clock == capture::Clock::none) {
            text_ += "null";
        } else {
            std::string time;
            times_.append(time, {finding.clock, finding.time});
            appendJsonString(text_, time);
        }
        putString("dchannel", finding.dChannel);
        putKey("frame");
        appendNumber(text_, finding.frame);
        putKey("call");
        if (finding.call)
            appendNumber(text_, *finding.call);
        else
            text_ += "null";
        putKey("count");
        appendNumber(text_, finding.count);
        putString("sentence", finding.sentence);
        putString("meaning", finding.kind->meaning);
        putString("look_at", finding.kind->lookAt);
        putString("clause", finding.clause);
        text_ += "}\n";
    }

    const Options& options_;
    Output& out_;
    bool colors_;
    bool severalDChannels_ = mayHaveSeveralDChannels(options_);
    TimeText times_;
    std::string text_;
    Limit limit_{options_};
    std::array<std::uint64_t, 3> counts_{};
    std::optional<calls::Severity> worst_;
};

}  // namespace

calls::Severity severityNamed(const std::string& name) {
    using enum calls::Severity;
    return chosen<calls::Severity>(name, {{"note", note}, {"warning", warning}, {"error", error}});
}

std::span<const OptionRow> checkOptions() {
    static const OptionRow rows[] = {
        {"--jsonl", "", "A JSON object a finding",
         [](Options& to, const std::string&) { to.calls.form = CallForm::jsonLines; }},
        {"--level", "note|warning|error", "Show findings of this severity and worse ones (default: note)",
         [](Options& to, const std::string& value) { to.calls.least = severityNamed(value); }},
        {"--fail-on", "note|warning|error",
         "Exit status 3 if there is a finding of this severity or a worse one",
         [](Options& to, const std::string& value) { to.calls.failOn = severityNamed(value); }},
    };
    return rows;
}

int runCheck(const Options& options, Chatter& chatter) {
    Session session(options, chatter);
    Output& out = session.output();
    FindingPrinter printer(options, out, session.useColors());
    printer.run(session, chatter);
    printer.flush();
    chatter.note(printer.summary());
    const CallOptions& calls = options.calls;
    return calls.failOn && printer.worst() && *printer.worst() >= *calls.failOn ? found : good;
}

}  // namespace reader
