#include "reader/session.h"

#include <algorithm>
#include <atomic>
#include <csignal>
#include <cstdlib>
#include <optional>
#include <thread>

#include "reader/CallGate.h"
#include "reader/errors.h"
#include "reader/inputs.h"
#include "reader/outputs.h"

namespace reader {

namespace {

std::atomic<bool> stopped = false;

// After SIGINT or SIGTERM the program completes its output and ends. A second signal kills it.
void stopOnSignals() {
    struct sigaction action {};
    action.sa_handler = [](int) { stopped = true; };
    action.sa_flags = static_cast<int>(SA_RESETHAND);  // without SA_RESTART, so a read that waits returns
    for (const int signal : {SIGINT, SIGTERM})
        sigaction(signal, &action, nullptr);
}

bool isStandard(const std::string& path) { return path.empty() || path == "-"; }

}  // namespace

bool useColors(const OutputOptions& options, const Output& out) {
    if (options.color != ColorMode::automatic)
        return options.color == ColorMode::always;
    const char* const noColor = std::getenv("NO_COLOR");
    const char* const terminal = std::getenv("TERM");
    const bool dumb = terminal != nullptr && std::string_view(terminal) == "dumb";
    return out.isTerminal() && !dumb && (noColor == nullptr || *noColor == '\0');
}

Session::Session(const Options& options, Chatter& chatter, Pipes pipes)
    : options_(options),
      chatter_(chatter),
      filter_(options.filters),
      callFilter_(options.filters),
      tracker_(options.input),
      reader_(openInputs(options, chatter, pipes == Pipes::atOnce ? &pipes_ : nullptr)) {
    stopOnSignals();
}

void Session::awaitInputs() {
    checkForms(options_);
    if (!reader_.awaitFirst(stopped))
        throw StoppedEarly();
}

std::vector<const capture::Item*> Session::firstItems() {
    checkForms(options_);
    std::vector<const capture::Item*> items;
    for (Primed* const pipe : pipes_) {
        if (!pipe->awaitFirst(stopped))
            throw StoppedEarly();
        if (pipe->first() != nullptr)
            items.push_back(pipe->first());
    }
    return items;
}

Output& Session::output(std::string_view form, bool (*looksRight)(std::string_view)) {
    if (output_ == nullptr && isStandard(options_.output.path)) {
        output_ = std::make_unique<Output>();
        checkNoInput(output_->descriptor(), output_->name(), inputFiles(options_));
    } else if (output_ == nullptr) {
        const bool isEmptied = checkOutput(options_.output.path, inputFiles(options_), form, looksRight);
        if (isEmptied)
            awaitInputs();
        output_ = std::make_unique<Output>(options_.output.path);
    }
    if (output_->isTerminal())
        chatter_.forbidProgress();
    return *output_;
}

void Session::run(Consumer& consumer, const std::function<std::unique_ptr<Composer>()>& makeComposer) {
    Work work;
    work.makeComposer = makeComposer;
    work.first = options_.first;
    work.skipped = options_.skipped;
    work.jobs =
        options_.output.jobs != 0 ? options_.output.jobs : std::max(1U, std::thread::hardware_concurrency());
    work.eachAtOnce = options_.output.lineBuffered;
    work.stopped = &stopped;
    work.clockRuns = options_.input.follow;
    std::optional<CallGate> gate;
    if (!callFilter_.isEmpty() && !consumer.wantsAll())
        work.gate =
            &gate.emplace(callFilter_, analysisOptions(options_),
                          options_.input.follow ? CallGate::Order::ofDecision : CallGate::Order::ofInput);
    const Outcome outcome = runPipeline(reader_, tracker_, filter_, consumer, chatter_, work);
    if (outcome.isWhole)
        tellWhatWasNotFound(outcome, gate ? &*gate : nullptr);
    if (gate && gate->letGo() != 0)
        chatter_.note("frames that were let go before the end of their call told whether it is wanted: " +
                      std::to_string(gate->letGo()));
}

// Says that nothing was found, because an empty output could also mean a trunk on which nothing happens.
void Session::tellWhatWasNotFound(const Outcome& outcome, const CallGate* gate) {
    const bool isNothing = outcome.passed == 0 && tracker_.frames() != 0;
    if (isNothing && gate != nullptr)
        chatter_.note("no call passes the filters; calls: " + std::to_string(gate->calls()));
    else if (isNothing && !filter_.isEmpty())
        chatter_.note("no frame passes the filters; frames: " + std::to_string(tracker_.frames()));
    if (!options_.input.store.empty())
        return;  // the groups are the store's, and a standby D channel may have said nothing
    for (const std::vector<std::string>& group : options_.calls.groups) {
        for (const std::string& name : group) {
            if (tracker_.knows(name))
                continue;
            const std::vector<std::string> files = inputFiles(options_);
            const bool isFile = std::find(files.begin(), files.end(), name) != files.end();
            chatter_.wrongUsage(
                "--nfas: nothing has come from a D channel " + name +
                (isFile ? ", which is a file; `calls --csv` shows the name of its D channel" : ""));
        }
    }
}

}  // namespace reader
