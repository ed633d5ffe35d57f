#include "reader/ladder.h"

#include <sys/ioctl.h>

#include <algorithm>
#include <cstdlib>

#include "reader/Analysed.h"
#include "reader/CallLadder.h"
#include "reader/LadderMermaid.h"
#include "reader/LadderSvg.h"
#include "reader/LadderText.h"
#include "reader/Limit.h"
#include "reader/Locale.h"
#include "reader/errors.h"
#include "reader/inputs.h"
#include "reader/text.h"

namespace reader {

namespace {

constexpr unsigned usualWidth = 80;
constexpr unsigned mostWidth = 1000;

// A picture of more calls would be too large to look at.
constexpr std::uint64_t mostInPicture = 500;

// The width of a line: that of the option, of the environment, or of the terminal, or else 80.
unsigned widthOf(const Options& options, const Output& out) {
    if (options.ladder.width != 0)
        return options.ladder.width;
    unsigned width = 0;
    if (const char* const columns = std::getenv("COLUMNS");
        columns != nullptr && readNumber(std::string_view(columns), width) && width != 0)
        return std::min(width, mostWidth);
    winsize size{};
    if (out.isTerminal() && ioctl(out.descriptor(), TIOCGWINSZ, &size) == 0 && size.ws_col != 0)
        return size.ws_col;
    return usualWidth;
}

class LadderPrinter : public Analysed {
  public:
    LadderPrinter(const Options& options, Output& out, Chatter& chatter)
        : Analysed(options), options_(options), out_(out), chatter_(chatter) {
        text_.width = widthOf(options, out);
        text_.utf8 = !options.ladder.ascii && localeHasUtf8();
    }

    bool countsItself() const override { return true; }
    void flush() override { out_.flush(); }

    // Writes the picture. Called after the end of the input.
    void finishPicture() {
        if (options_.ladder.form != LadderForm::svg)
            return;
        out_.write(svg_.picture());
        if (notDrawn_ != 0)
            chatter_.note("the picture holds " + std::to_string(mostInPicture) + " calls; not drawn: " +
                          std::to_string(notDrawn_) + " (--call N or another filter chooses calls)");
    }

  private:
    void see(const Seen& seen) override { ladders_.see(seen); }
    void heard(const calls::Message& message, const calls::Call* call) override {
        Analysed::heard(message, call);
        if (call != nullptr && mayBeWanted(*call))
            ladders_.heard(message, *call);
        else if (call == nullptr && (message.layer3.type == isdn::message::restart ||
                                     message.layer3.type == isdn::message::restartAcknowledge))
            ladders_.restarted(message);
    }
    void carried(const calls::Message& message, const calls::Call* call) override {
        if (call != nullptr && mayBeWanted(*call))
            ladders_.carried(message, *call);
    }
    void gone(const calls::Call& call) override {
        if (isWanted(call) && limit_.takeOne())
            print(ladders_.take(call, times_, severalDChannels_ && !isGrouped(call)));
        else
            ladders_.forget(call);
        Analysed::gone(call);
    }

    // Whether the call may pass on several D channels.
    bool isGrouped(const calls::Call& call) const {
        return std::ranges::any_of(options_.calls.groups, [&](const std::vector<std::string>& group) {
            return std::ranges::find(group, call.dChannel) != group.end();
        });
    }

    void print(CallLadder ladder) {
        if (options_.ladder.dChannels)
            ladder.namesDChannels = true;
        else if (options_.ladder.form == LadderForm::text)
            ladder.namesDChannels = false;
        const std::uint64_t number = limit_.taken();
        std::string text;
        switch (options_.ladder.form) {
            case LadderForm::text:
                text = number == 1 ? "" : "\n";
                appendLadder(text, ladder, text_, times_);
                break;
            case LadderForm::mermaid:
                text = number == 1 ? "" : "\n";
                appendMermaid(text, ladder, times_);
                break;
            case LadderForm::svg:
                if (number <= mostInPicture)
                    svg_.add(ladder, times_);
                else
                    ++notDrawn_;
                break;
        }
        out_.write(text);
    }

    const Options& options_;
    Output& out_;
    Chatter& chatter_;
    bool severalDChannels_ = mayHaveSeveralDChannels(options_);
    LadderTextForm text_;
    LadderSvg svg_;
    TimeText times_;
    Ladders ladders_;
    Limit limit_{options_};
    std::uint64_t notDrawn_ = 0;
};

}  // namespace

std::span<const OptionRow> ladderOptions() {
    static constexpr OptionRow rows[] = {
        {"--svg", "", "A picture", [](Options& to, const std::string&) { to.ladder.form = LadderForm::svg; },
         "form"},
        {"--mermaid", "", "Sequence diagrams of Mermaid, for Markdown",
         [](Options& to, const std::string&) { to.ladder.form = LadderForm::mermaid; }, "form"},
        {"--width", "N", "Columns of a line (default: those of the terminal, else 80; at least 40 are used)",
         [](Options& to, const std::string& value) { to.ladder.width = countIn(value, mostWidth); }},
        {"--ascii", "", "Draw with ASCII characters, also where the locale has UTF-8",
         [](Options& to, const std::string&) { to.ladder.ascii = true; }},
        {"--dchannels", "",
         "Name the D channel at each arrow. Without it, --svg and --mermaid do so if a call has several",
         [](Options& to, const std::string&) { to.ladder.dChannels = true; }},
    };
    return rows;
}

int runLadder(const Options& options, Chatter& chatter) {
    Session session(options, chatter);
    LadderPrinter printer(options, session.output(), chatter);
    printer.run(session, chatter);
    printer.finishPicture();
    printer.flush();
    return good;
}

}  // namespace reader
