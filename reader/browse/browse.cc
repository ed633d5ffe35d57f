#include "reader/browse/browse.h"

#include <langinfo.h>
#include <poll.h>

#include <atomic>
#include <chrono>
#include <clocale>
#include <csignal>
#include <cstring>
#include <future>
#include <utility>

#include "reader/Locale.h"
#include "reader/browse/Browser.h"
#include "reader/browse/Collector.h"
#include "reader/browse/ReadingThread.h"
#include "reader/browse/Terminal.h"
#include "reader/browse/Wake.h"
#include "reader/browse/saving.h"
#include "reader/errors.h"
#include "reader/inputs.h"
#include "reader/redact.h"
#include "reader/session.h"
#include "reader/text.h"
#include "reader/trunkRows.h"

namespace reader {

namespace {

using namespace browse;
using Clock = std::chrono::steady_clock;

// How long the program works before it looks for a key again.
constexpr std::chrono::milliseconds workAtOnce{10};
// The least time between two drawings of new data. What a key has changed is drawn at once.
constexpr std::chrono::milliseconds betweenDrawings{50};
// Milliseconds after which the program notices a terminal that has gone away without a signal.
constexpr int longestPoll = 1000;

// What signals ask for.
std::atomic<bool> mustEnd = false;
std::atomic<bool> mustStop = false;
std::atomic<const Wake*> wakeOfSignals = nullptr;

void takeSignal(int signal) {
    (signal == SIGTSTP ? mustStop : mustEnd) = true;
    if (const Wake* const wake = wakeOfSignals; wake != nullptr)
        wake->call();
}

// While an object lives, the signals that end or stop a program only set flags, which the loop obeys.
class Signals {
  public:
    explicit Signals(const Wake& wake) {
        wakeOfSignals = &wake;
        struct sigaction action {};
        action.sa_handler = takeSignal;
        for (const int signal : {SIGINT, SIGTERM, SIGHUP, SIGQUIT, SIGTSTP})
            sigaction(signal, &action, nullptr);
        // SIGUSR1 only interrupts a system call of the reading thread.
        action.sa_handler = [](int) {};
        sigaction(SIGUSR1, &action, nullptr);
    }
    ~Signals() { wakeOfSignals = nullptr; }
    Signals(const Signals&) = delete;
    Signals& operator=(const Signals&) = delete;
};

// Writes a file on a thread of its own, one at a time.
class Saving {
  public:
    Saving(const Options& options, const redaction::Key& key, const Wake& wake)
        : options_(options), key_(key), wake_(wake) {}

    bool isBusy() const { return result_.valid(); }
    void begin(const FrameStore& frames, SaveOrder order) {
        result_ = std::async(std::launch::async, [this, frames, order = std::move(order)] {
            std::string said;
            try {
                said = saveFrames(frames, order, options_, key_);
            } catch (const std::exception& error) {
                said = error.what();
            }
            wake_.call();
            return said;
        });
    }
    // Returns words that say how the writing ended, once; empty while it goes on.
    std::string done() {
        if (!isBusy() || result_.wait_for(std::chrono::seconds(0)) != std::future_status::ready)
            return {};
        return result_.get();
    }

  private:
    const Options& options_;
    redaction::Key key_;
    const Wake& wake_;
    std::future<std::string> result_;
};

// Takes keys, signals and new data, and draws the screen when one of them has changed it.
class Loop {
  public:
    Loop(Terminal& terminal, Browser& browser, UpdateQueue& queue, Saving& saving, const Wake& wake)
        : terminal_(terminal), browser_(browser), queue_(queue), saving_(saving), wake_(wake) {}

    void run() {
        while (!browser_.isDone() && !mustEnd && !terminal_.isGone()) {
            await();
            if (mustStop.exchange(false)) {
                terminal_.suspend();
                isDue_ = true;
            }
            takeKeys();
            takeNews();
            draw();
        }
    }

  private:
    void await() const {
        pollfd waited[] = {{terminal_.descriptor(), POLLIN, 0}, {wake_.descriptor(), POLLIN, 0}};
        const auto left = std::chrono::ceil<std::chrono::milliseconds>(nextDrawing_ - Clock::now()).count();
        const int most = hasMore_      ? 0
                         : hasChanged_ ? static_cast<int>(std::clamp<std::int64_t>(left, 0, longestPoll))
                                       : longestPoll;
        ::poll(waited, 2, most);
        wake_.heard();
    }
    void takeKeys() {
        while (const auto key = terminal_.key()) {
            browser_.press(*key);
            isDue_ = true;
        }
    }
    void takeNews() {
        const Clock::time_point until = Clock::now() + workAtOnce;
        hasMore_ = false;
        while (std::optional<Update> update = queue_.take()) {
            browser_.apply(std::move(*update));
            hasChanged_ = true;
            if (Clock::now() >= until) {
                hasMore_ = true;
                break;
            }
        }
        if (browser_.work(until)) {
            hasMore_ = true;
            hasChanged_ = true;
        }
        if (const std::string said = saving_.done(); !said.empty()) {
            browser_.say(said);
            isDue_ = true;
        }
    }
    void draw() {
        const Clock::time_point now = Clock::now();
        Canvas canvas = terminal_.canvas();
        const bool isResized = canvas.width() != width_ || canvas.height() != height_;
        if (!isDue_ && !isResized && !(hasChanged_ && now >= nextDrawing_))
            return;
        browser_.draw(canvas);
        terminal_.show(canvas);
        width_ = canvas.width();
        height_ = canvas.height();
        isDue_ = hasChanged_ = false;
        nextDrawing_ = now + betweenDrawings;
    }

    Terminal& terminal_;
    Browser& browser_;
    UpdateQueue& queue_;
    Saving& saving_;
    const Wake& wake_;
    bool isDue_ = true;        // a key has changed something
    bool hasChanged_ = false;  // new data has changed something
    bool hasMore_ = false;     // there is work to go on with
    int width_ = 0, height_ = 0;
    Clock::time_point nextDrawing_{};
};

// Sets a locale with UTF-8, which lines and arrows need. Returns false if there is none.
bool beginLocale() {
    if (std::setlocale(LC_CTYPE, "") == nullptr && localeHasUtf8())
        static_cast<void>(std::setlocale(LC_CTYPE, "C.UTF-8"));
    return std::strcmp(nl_langinfo(CODESET), "UTF-8") == 0;
}

std::string sourceOf(const Options& options) {
    const std::vector<std::string> files = inputNames(options);
    const std::string first = files[0] == "-" ? "standard input" : files[0];
    return files.size() == 1 ? first : first + " and " + std::to_string(files.size() - 1) + " more";
}

bool readsStandardInput(const Options& options) {
    const std::vector<std::string> files = inputFiles(options);
    return std::find(files.begin(), files.end(), "-") != files.end();
}

}  // namespace

std::span<const OptionRow> browseOptions() {
    static const OptionRow rows[] = {
        {"--frames", "N", "Keep the newest N frames in memory (default: 1000000)",
         [](Options& to, const std::string& value) {
             constexpr std::size_t most = 1'000'000'000;
             to.browse.frames = countIn(value, most);
         }},
        {"--ascii", "", "Draw with ASCII characters, also where the locale has UTF-8",
         [](Options& to, const std::string&) { to.ladder.ascii = true; }},
        {"--no-mouse", "", "Leave the mouse to the terminal",
         [](Options& to, const std::string&) { to.browse.mouse = false; }},
        {"--key", "FILE", "Make pseudonyms by this key where frames are saved redacted; see `redact`",
         [](Options& to, const std::string& value) { to.redact.key = value; }},
        e1Row,
        t1Row,
        basicRow,
    };
    return rows;
}

int runBrowse(const Options& options, Chatter& chatter) {
    if (!options.output.path.empty() || options.first != 0 || options.skipped != 0)
        throw UsageError(
            "browse shows all there is in a terminal: --output and --first are for other commands");
    Chatter quiet(Loudness::quiet);
    Session session(options, quiet);
    checkForms(options);
    redaction::Key key = redactionKey(options, chatter);
    Browser::Settings settings;
    settings.utf8 = beginLocale() && !options.ladder.ascii;
    settings.source = sourceOf(options);
    settings.mostItems = options.browse.frames;
    const Wake wake;
    UpdateQueue queue([&wake] { wake.call(); });
    Collector collector(options, queue);
    std::string error;
    {
        const Signals signals(wake);
        Terminal terminal(
            {useColors(options.output, Output()), options.browse.mouse, readsStandardInput(options)});
        Saving saving(options, key, wake);
        Browser* shown = nullptr;
        settings.save = [&](const FrameStore& frames, SaveOrder order) {
            if (saving.isBusy())
                shown->say("another file is being written: try again when it is done");
            else
                saving.begin(frames, std::move(order));
        };
        Browser browser(std::move(settings));
        shown = &browser;
        const ReadingThread reading(session, collector, queue);
        Loop(terminal, browser, queue, saving, wake).run();
        error = browser.trace().error();
    }
    if (!error.empty())
        throw FileError(error);
    return good;
}

}  // namespace reader
