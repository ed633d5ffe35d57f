#include "reader/record.h"

#include <algorithm>
#include <atomic>
#include <csignal>
#include <filesystem>
#include <map>

#include "reader/RotatingFile.h"
#include "reader/errors.h"
#include "reader/session.h"
#include "reader/text.h"

namespace reader {

namespace {

std::atomic<bool> beginAnew = false;

void beginAnewOnHangup() {
    struct sigaction action {};
    action.sa_handler = [](int) { beginAnew = true; };
    sigaction(SIGHUP, &action, nullptr);
}

// A file for each D channel.
class Recorder : public Consumer {
  public:
    Recorder(const RotationRules& rules, Chatter& chatter)
        : rules_(rules), chatter_(chatter), roles_(chatter) {}

    void take(Chunk& chunk, std::size_t count) override {
        for (std::size_t i = 0; i < count; ++i) {
            roles_.take(chunk.seen()[chunk.pieces[i].item],
                        [&](const capture::Item& item) { fileOf(item).write(item); });
        }
    }

    void flush() override {
        const bool anew = beginAnew.exchange(false);
        for (auto& [trunk, file] : files_) {
            file.flush();
            if (anew)
                file.finish();
        }
    }

    std::uint64_t finish() {
        roles_.giveUp([&](const capture::Item& item) { fileOf(item).write(item); });
        std::uint64_t lost = 0;
        for (auto& [trunk, file] : files_) {
            file.finish();
            lost += file.lostInAll();
        }
        return lost;
    }

  private:
    RotatingFile& fileOf(const capture::Item& item) {
        const std::string trunk = item.frame.interface == nullptr ? "" : item.frame.interface->name;
        return files_.try_emplace(trunk, rules_, trunk, chatter_).first->second;
    }

    const RotationRules& rules_;
    Chatter& chatter_;
    Roles roles_;
    std::map<std::string, RotatingFile> files_;
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

std::span<const OptionRow> recordOptions() {
    static constexpr OptionRow rows[] = {
        {"--to", "pcapng|log|pcap|hex", "The form to record in (default: pcapng)",
         [](Options& to, const std::string& value) { to.form = formNamed(value).name; }},
        {"--folder", "DIR", "Where the files are (default: the current folder)",
         [](Options& to, const std::string& value) { to.record.folder = value; }},
        {"--size", "SIZE", "Finish a file of this size: 500k, 100M, 2G",
         [](Options& to, const std::string& value) { to.record.size = readSize(value); }},
        {"--time", "TIME", "Begin a new file at each multiple of this time: 15min, 1h, 1d",
         [](Options& to, const std::string& value) { to.record.seconds = readPeriod(value); }},
        {"--files", "N", "Keep the newest N finished files of a D channel (default: all)",
         [](Options& to, const std::string& value) { to.record.files = countIn(value, 1'000'000'000U); }},
    };
    return rows;
}

int runRecord(const Options& given, Chatter& chatter) {
    Options options = given;
    options.input.follow = true;
    const RotationRules rules{options.record.folder, &recordingForm(options), options.record.size,
                              options.record.seconds, options.record.files};
    if (!std::filesystem::is_directory(rules.folder))
        throw FileError("cannot write into " + rules.folder + ": no such folder");
    Session session(options, chatter);
    beginAnewOnHangup();
    Recorder recorder(rules, chatter);
    session.run(recorder, [] { return std::make_unique<NoComposer>(); });
    const std::uint64_t lost = recorder.finish();
    if (lost != 0)
        throw FileError("frames lost because they could not be written: " + std::to_string(lost));
    return good;
}

}  // namespace reader
