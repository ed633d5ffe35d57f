#include "reader/record.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <csignal>
#include <ctime>
#include <filesystem>
#include <map>

#include "reader/CallFilter.h"
#include "reader/RecordedTrunk.h"
#include "reader/Triggers.h"
#include "reader/errors.h"
#include "reader/session.h"
#include "reader/text.h"
#include "service/notify.h"

namespace reader {

namespace {

// Set by signal handlers. SIGHUP begins new files; SIGUSR1 keeps what surrounds this moment.
std::atomic<bool> beginAnew = false;
std::atomic<bool> keepNow = false;

void heedSignals() {
    struct sigaction action {};
    action.sa_handler = [](int signal) { (signal == SIGHUP ? beginAnew : keepNow) = true; };
    for (const int signal : {SIGHUP, SIGUSR1})
        sigaction(signal, &action, nullptr);
}

// Hands each item to its D channel.
class Recorder : public Consumer {
  public:
    Recorder(const RecordRules& rules, const Options& options, Chatter& chatter)
        : rules_(rules), chatter_(chatter), roles_(chatter), triggers_(options) {}

    // Triggers also see the items that the filters leave out.
    bool wantsAll() const override { return triggers_.areThere(); }

    void take(Chunk& chunk, std::size_t count) override {
        heartbeat_.beat();
        obeySignals();
        isIdle_ = isIdle_ && chunk.size() == 0;
        std::size_t piece = 0;
        for (std::size_t i = 0; i < chunk.size(); ++i) {
            const Seen& seen = chunk.seen()[i];
            const bool passes = piece < count && chunk.pieces[piece].item == i;
            piece += passes ? 1 : 0;
            const auto fired = triggers_.look(seen);
            if (passes)
                roles_.take(seen, [&](const capture::Item& item) { record(item); });
            fire(fired);
        }
    }

    void flush() override {
        heartbeat_.beat();
        obeySignals();
        if (isIdle_) {
            for (auto& [name, trunk] : trunks_)
                trunk.idle(std::time(nullptr));
        }
        const auto now = HostClock::now();
        if (isIdle_)
            fire(triggers_.advance((now - lastLook_).count()));
        lastLook_ = now;
        isIdle_ = true;
        for (auto& [name, trunk] : trunks_)
            trunk.flush();
    }

    // Finishes all files. Reports how many frames were lost, apart from those that were reported before.
    // Returns false if any frame was lost.
    bool finish() {
        roles_.giveUp([&](const capture::Item& item) { record(item); });
        std::uint64_t lost = 0;
        std::uint64_t unsaid = 0;
        for (auto& [name, trunk] : trunks_) {
            trunk.finish();
            lost += trunk.lostInAll();
            unsaid += trunk.lostUnsaid();
        }
        if (unsaid != 0)
            chatter_.error("frames lost because they could not be written: " + std::to_string(unsaid));
        return lost == 0;
    }

  private:
    using HostClock = std::chrono::steady_clock;

    void record(const capture::Item& item) {
        if (item.kind == capture::Item::Kind::replaced) {
            for (auto& [name, trunk] : trunks_) {
                if (trunk.readsFrom(item.frame.place.file))
                    trunk.logIsGone(item);
            }
            return;
        }
        const std::string& name = item.frame.interface->name;
        trunks_.try_emplace(name, rules_, name, chatter_).first->second.take(item);
    }

    void fire(std::span<const Triggers::Fired> fired) {
        for (const Triggers::Fired& one : fired) {
            const auto trunk = trunks_.find(one.dChannel);
            if (trunk != trunks_.end() && !trunk->second.isBehind())
                trunk->second.trigger(one.why);
        }
    }

    void obeySignals() {
        if (beginAnew.exchange(false)) {
            for (auto& [name, trunk] : trunks_)
                trunk.beginFile();
        }
        if (keepNow.exchange(false)) {
            for (auto& [name, trunk] : trunks_)
                trunk.trigger("SIGUSR1");
        }
    }

    const RecordRules& rules_;
    Chatter& chatter_;
    Roles roles_;
    Triggers triggers_;
    std::map<std::string, RecordedTrunk> trunks_;  // by the name of the D channel
    bool isIdle_ = false;                          // nothing has come since the last flush
    HostClock::time_point lastLook_ = HostClock::now();
    service::Heartbeat heartbeat_;
};

struct Unit {
    std::string_view name;
    std::uint64_t factor;
};

// A number and one of the units; overflow is refused.
std::uint64_t readWithUnit(const std::string& text, std::span<const Unit> units, const char* form) {
    const std::size_t end = std::min(text.find_first_not_of("0123456789"), text.size());
    std::uint64_t number = 0;
    const std::string_view name = std::string_view(text).substr(end);
    const auto unit = std::find_if(units.begin(), units.end(), [&](const Unit& u) { return u.name == name; });
    const bool isRead = readNumber(std::string_view(text).substr(0, end), number) && number > 0;
    if (!isRead || unit == units.end() || number > INT64_MAX / unit->factor)
        throw UsageError(text + " is no " + form);
    return number * unit->factor;
}

const Form& recordingForm(const Options& options) {
    const Form& form = formNamed(options.form.empty() ? "pcapng" : options.form);
    if (form.makeWriter == nullptr)
        throw UsageError("record writes no " + std::string(form.name));
    return form;
}

}  // namespace

std::uint64_t readSize(const std::string& text) {
    constexpr Unit units[] = {{"", 1}, {"k", 1000}, {"M", 1000'000}, {"G", 1000'000'000}};
    return readWithUnit(text, units, "size: 500k, 100M, 2G");
}

std::int64_t readPeriod(const std::string& text) {
    constexpr Unit units[] = {{"s", 1}, {"", 1}, {"min", 60}, {"h", 3600}, {"d", 86400}};
    return static_cast<std::int64_t>(readWithUnit(text, units, "time: 90s, 15min, 1h, 1d"));
}

namespace {

// Reads a time around a trigger. It is limited, because what surrounds a trigger is held in memory.
std::int64_t readSpan(const std::string& text) {
    constexpr std::int64_t most = 86400;
    const std::int64_t seconds = readPeriod(text);
    if (seconds > most)
        throw UsageError(text + " is more than a day");
    return seconds;
}

}  // namespace

std::span<const OptionRow> recordOptions() {
    static constexpr OptionRow rows[] = {
        {"--to", "pcapng|log|pcap|hex", "The form to record in (default: pcapng)",
         [](Options& to, const std::string& value) { to.form = formNamed(value).name; }},
        {"--folder", "DIR", "Where the files are (default: the current folder); it must exist",
         [](Options& to, const std::string& value) { to.record.folder = value; }},
        {"--size", "SIZE", "Finish a file of this size: 500k, 100M, 2G",
         [](Options& to, const std::string& value) { to.record.size = readSize(value); }},
        {"--time", "TIME", "Begin a new file at each multiple of this time: 15min, 1h, 1d",
         [](Options& to, const std::string& value) { to.record.seconds = readPeriod(value); }},
        {"--files", "N", "Keep the newest N finished files of a D channel (default: all)",
         [](Options& to, const std::string& value) { to.record.files = countIn(value, 1'000'000'000U); }},
        {"--keep", "TIME",
         "Keep the last 90min, 24h, 7d; without --time and --size a tenth of it is the time of a file",
         [](Options& to, const std::string& value) { to.record.span = readPeriod(value); }},
        {"--on", "WHAT",
         "Keep what surrounds this, in files of its own: check:LEVEL (a finding of this severity or a worse "
         "one), "
         "cause:34,38, or number, message, callref, channel, tei, type, mark with values, as filters have "
         "them. SIGUSR1 "
         "does the same at any time",
         [](Options& to, const std::string& value) { readTrigger(value, to.record); }},
        {"--before", "TIME", "How much is kept in front of it (default: 5min)",
         [](Options& to, const std::string& value) { to.record.before = readSpan(value); }},
        {"--after", "TIME", "How much is kept behind it (default: 1min)",
         [](Options& to, const std::string& value) { to.record.after = readSpan(value); }},
        {"--kept-files", "N", "Keep the newest N of these files of a D channel (default: all)",
         [](Options& to, const std::string& value) { to.record.keptFiles = countIn(value, 1'000'000'000U); }},
    };
    return rows;
}

namespace {

RecordRules rulesOf(const Options& options) {
    constexpr std::int64_t filesInSpan = 10;
    const RecordOptions& record = options.record;
    RotationRules files{record.folder, &recordingForm(options), record.size, record.seconds, record.files,
                        record.span};
    if (files.span != 0 && files.period == 0 && files.size == 0)
        files.period = std::max<std::int64_t>(files.span / filesInSpan, 1);
    RotationRules kept{files.folder, files.form, files.size};
    kept.kept = record.keptFiles;
    kept.mark = "kept";
    return {files, {record.before * 1'000'000'000, record.after * 1'000'000'000, kept}};
}

}  // namespace

int runRecord(const Options& given, Chatter& chatter) {
    Options options = given;
    options.input.follow = true;
    const RecordRules rules = rulesOf(options);
    if (Triggers(options).areThere() && !CallFilter(options.filters).isEmpty())
        throw UsageError(
            "--on keeps all that surrounds a trigger: --call, --failed, --unanswered do not go with it");
    if (!std::filesystem::is_directory(rules.files.folder))
        throw FileError("cannot write into " + rules.files.folder + ": no such folder");
    heedSignals();
    Session session(options, chatter);
    Recorder recorder(rules, options, chatter);
    service::notify("READY=1");
    try {
        session.run(recorder, [] { return std::make_unique<NoComposer>(); });
    } catch (...) {
        recorder.finish();
        throw;
    }
    return recorder.finish() ? good : cannotRead;
}

}  // namespace reader
