#include "reader/calls.h"

#include <algorithm>
#include <functional>
#include <vector>

#include "reader/Analysed.h"
#include "reader/CallFields.h"
#include "reader/CallLine.h"
#include "reader/CallOrder.h"
#include "reader/Limit.h"
#include "reader/errors.h"
#include "reader/inputs.h"
#include "reader/session.h"
#include "reader/text.h"

namespace reader {

namespace {

class CallPrinter : public Analysed {
  public:
    CallPrinter(const Options& options, Output& out) : Analysed(options), options_(options), out_(out) {
        if (options.calls.form == CallForm::csv)
            out_.write(callCsvHeader());
        else if (options.calls.form == CallForm::text)
            out_.write(callHeading(severalDChannels_) + "\n");
    }

    bool countsItself() const override { return true; }
    void flush() override { out_.flush(); }

    // Prints the calls that were kept for sorting. Called after the end of the input.
    void printSorted() {
        if (options_.calls.sort.empty())
            return;
        const CallOrder& order = callOrderNamed(options_.calls.sort);
        std::stable_sort(kept_.begin(), kept_.end(), [&](const calls::Call& a, const calls::Call& b) {
            return std::pair(order.value(a), a.number) < std::pair(order.value(b), b.number);
        });
        for (const calls::Call& call : kept_)
            print(call);
    }

  private:
    void gone(const calls::Call& call) override {
        const bool wanted = isWanted(call);
        Analysed::gone(call);
        if (!wanted)
            return;
        if (options_.calls.sort.empty())
            print(call);
        else
            kept_.push_back(call);
    }

    void print(const calls::Call& call) {
        if (!limit_.takeOne())
            return;
        text_.clear();
        switch (options_.calls.form) {
            case CallForm::csv:
                appendCallCsv(text_, call, times_);
                break;
            case CallForm::jsonLines:
                appendCallJson(text_, call, times_);
                break;
            case CallForm::text:
                appendCallLine(text_, call, times_, severalDChannels_);
                text_ += '\n';
                break;
        }
        out_.write(text_);
    }

    const Options& options_;
    Output& out_;
    bool severalDChannels_ = mayHaveSeveralDChannels(options_);
    TimeText times_;
    std::string text_;
    Limit limit_{options_};
    std::vector<calls::Call> kept_;
};

}  // namespace

std::span<const OptionRow> callsOptions() {
    static const OptionRow rows[] = {
        {"--csv", "", "A row a call, for spreadsheets",
         [](Options& to, const std::string&) { to.calls.form = CallForm::csv; }, "form"},
        {"--jsonl", "", "A JSON object a call",
         [](Options& to, const std::string&) { to.calls.form = CallForm::jsonLines; }, "form"},
        {"--sort", "KEY",
         "Sort by start, duration, connect, response, cause or channel; without it, calls come in the order "
         "of "
         "their end",
         [](Options& to, const std::string& value) {
             callOrderNamed(value);
             to.calls.sort = value;
         }},
    };
    return rows;
}

int runCalls(const Options& options, Chatter& chatter) {
    Session session(options, chatter);
    CallPrinter printer(options, session.output());
    printer.run(session, chatter);
    printer.printSorted();
    printer.flush();
    return good;
}

}  // namespace reader
