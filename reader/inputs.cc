#include "reader/inputs.h"

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <limits>
#include <optional>
#include <set>
#include <utility>

#include "capture/open.h"
#include "fleet/query/openStore.h"
#include "lapdlog/log.h"
#include "reader/Joined.h"
#include "reader/errors.h"
#include "reader/text.h"
#include "recording/recordings.h"

namespace reader {

namespace {

void checkReadable(const std::string& file) {
    if (file != "-" && access(file.c_str(), R_OK) != 0)
        throw FileError("cannot read " + file + ": " + std::strerror(errno));
}

// The widest of the times that the filters let through, for the store to read no more than that. Filters on
// call numbers and the like are left to the filters themselves.
void boundTimes(const std::vector<FilterWord>& filters, fleet::StoreQuery& query) {
    constexpr std::int64_t never = std::numeric_limits<std::int64_t>::max();
    std::int64_t since = never, until = -never;
    for (const FilterWord& word : filters) {
        if (word.negated || (word.name != "since" && word.name != "until"))
            continue;
        for (const std::string& value : splitAtCommas(word.value)) {
            const std::optional<std::int64_t> at = TimePoint(value).absolute();
            if (word.name == "since")
                since = std::min(since, at.value_or(-never));
            else
                until = std::max(until, at.value_or(never));
        }
    }
    if (since != never && since != -never)
        query.since = since;
    if (until != never && until != -never)
        query.until = until;
}

fleet::StoreQuery queryOf(const Options& options) {
    fleet::StoreQuery query;
    query.url = options.input.store;
    query.sites = options.input.sites;
    if (!options.input.trunk.empty())
        query.trunks = splitAtCommas(options.input.trunk);
    boundTimes(options.filters, query);
    return query;
}

std::unique_ptr<capture::Reader> openStore(const Options& options) {
    const InputOptions& input = options.input;
    if (!input.files.empty() || !options.words.empty())
        throw UsageError("--store takes the place of files: " +
                         (input.files.empty() ? options.words : input.files).front());
    if (input.follow)
        throw UsageError("--follow takes a file; a store is read as it is now");
    const std::shared_ptr<fleet::Store> store = fleet::openStore(queryOf(options));
    std::vector<Opener> openers;
    for (const fleet::Store::Trunk& trunk : store->trunks())
        openers.emplace_back([store, &trunk] { return store->read(trunk); });
    return std::make_unique<Merge>(openers);
}

// Opens the input, and returns an opener that hands over its reader.
Opener openNow(const std::string& file, const InputOptions& input, std::vector<Primed*>& pipes) {
    auto reader = std::make_shared<std::unique_ptr<Primed>>(std::make_unique<Primed>(openFile(file, input)));
    pipes.push_back(reader->get());
    return [reader] { return std::move(*reader); };
}

}  // namespace

std::unique_ptr<capture::Reader> openFile(const std::string& file, const InputOptions& input) {
    capture::ReadOptions options;
    options.follow = input.follow;
    options.trunk = input.trunk;
    options.variant = input.variant;
    static const std::vector<capture::Form> known = [] {
        std::vector<capture::Form> all{lapdlog::logForm};
        all.insert(all.end(), capture::forms().begin(), capture::forms().end());
        return all;
    }();
    return capture::openReader(file, options, known);
}

std::vector<std::string> inputFiles(const Options& options) {
    if (!options.input.store.empty())
        return {};
    std::vector<std::string> files = options.input.files;
    files.insert(files.end(), options.words.begin(), options.words.end());
    if (files.empty() && isatty(STDIN_FILENO) == 1)
        throw UsageError(
            "nothing to read: lapdread FILE, or - for the standard input (lapdread --help tells more)");
    if (files.empty())
        files.emplace_back("-");
    return files;
}

std::vector<std::string> inputNames(const Options& options) {
    const InputOptions& input = options.input;
    if (input.store.empty())
        return inputFiles(options);
    std::vector<std::string> chosen = input.sites;
    if (!input.trunk.empty())
        chosen.push_back(input.trunk);
    std::string name = "the store";
    for (const std::string& each : chosen)
        name += (&each == &chosen.front() ? ": " : ", ") + each;
    return {name};
}

bool mayHaveSeveralDChannels(const Options& options) {
    const InputOptions& input = options.input;
    if (!input.store.empty())
        return input.storeHasSeveral;
    if (!input.trunk.empty())
        return false;
    std::set<std::string> names;
    for (const std::string& file : inputFiles(options))
        names.insert(capture::trunkOf(file));
    return names.size() > 1;
}

bool canBeReadAgain(const std::string& file) {
    std::error_code ignored;
    return file != "-" && std::filesystem::is_regular_file(file, ignored);
}

std::unique_ptr<capture::Reader> openInputs(const Options& options, Chatter& /*chatter*/,
                                            std::vector<Primed*>* pipes) {
    if (!options.input.store.empty())
        return openStore(options);
    std::vector<std::string> files = inputFiles(options);
    recording::putInOrder(files);
    const InputOptions& input = options.input;
    if (!input.sites.empty())
        throw UsageError("--site chooses among the trunks of a store: name it with --store URL");
    // A call may go from one D channel of a group to another and back, so files in turn would tear it.
    const bool isMerged = input.merge || !options.calls.groups.empty();
    if (input.follow && files.size() > 1 && !isMerged)
        throw UsageError("--follow takes one input, or several with --merge");
    std::vector<Opener> openers;
    std::set<std::string> opened;
    for (const std::string& file : files) {
        checkReadable(file);
        if (pipes != nullptr && !canBeReadAgain(file) && opened.insert(file).second)
            openers.push_back(openNow(file, input, *pipes));
        else
            openers.emplace_back([file, &input] { return openFile(file, input); });
    }
    if (isMerged && files.size() > 1)
        return std::make_unique<Merge>(openers);
    return std::make_unique<Sequence>(std::move(openers));
}

namespace {

// With pseudonyms a number is not found, which must not look as if nobody had called it.
void notePseudonyms(const fleet::Store& store, const Options& options, Chatter& chatter) {
    const auto isNumber = [](const FilterWord& word) { return word.name == "number"; };
    std::vector<std::string> names;
    for (const fleet::Store::Trunk& trunk : store.trunks()) {
        if (trunk.isRedacted)
            names.push_back(trunk.name);
    }
    if (names.empty() || std::ranges::none_of(options.filters, isNumber))
        return;
    const std::size_t others = names.size() - 1;
    chatter.note("pseudonyms stand in place of the numbers of " + names.front() +
                 (others == 0 ? "" : " and " + std::to_string(others) + " more") +
                 ": a number is compared with the pseudonym there");
}

}  // namespace

void learnTrunksOfStore(Options& options, Chatter& chatter) {
    if (options.input.store.empty())
        return;
    const std::unique_ptr<fleet::Store> store = fleet::openStore(queryOf(options));
    options.input.storeHasSeveral = store->trunks().size() > 1;
    for (std::vector<std::string>& group : store->groups())
        options.calls.groups.push_back(std::move(group));
    notePseudonyms(*store, options, chatter);
}

void checkForms(const Options& options) {
    if (options.input.follow)
        return;
    for (const std::string& file : inputFiles(options)) {
        capture::Item item;
        if (canBeReadAgain(file))
            openFile(file, options.input)->next(item);
    }
}

}  // namespace reader
