#include "reader/command_line.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <filesystem>
#include <functional>
#include <memory>

#include "reader/Filter.h"
#include "reader/errors.h"
#include "reader/suggestion.h"

namespace reader {

namespace {

constexpr char about[] =
    "Reads what lapdmon has recorded of an ISDN D channel, and captures of other tools: a line a frame, in "
    "words, or\n"
    "in the forms that other tools read.";

constexpr char moreOnAll[] =
    R"(Without a command, lapdread lists frames: `lapdread lapdmon.log` is `lapdread list lapdmon.log`.
`lapdread COMMAND --help` tells the options of a command, and has examples.

Inputs are recognised by what they hold: the log of lapdmon, pcap and pcapng (link types 177 and 203), lines of
hexadecimal digits behind TX or RX, and the raw dumps in debug logs of open-source PBXs.

Exit status: 0 good, 1 wrong usage, 2 a file cannot be read or written, 3 only where --fail-on asks for it.
)";

class Help : public CLI::Formatter {
  public:
    Help() { column_width(32); }

    std::string make_usage(const CLI::App* app, std::string /*name*/) const override {
        if (app->get_parent() == nullptr)
            return "Usage: lapdread [COMMAND] [OPTIONS] [FILE...]\n";
        const Command* command = commandNamed(app->get_name());
        return "Usage: lapdread " + app->get_name() + " [OPTIONS] " +
               std::string(command == nullptr ? "" : command->words) + "\n";
    }

    // Help does not list the options that exclude this one: an error message names them if both are given.
    std::string make_option_opts(const CLI::Option* option) const override {
        const std::string form = CLI::Formatter::make_option_opts(option);
        return form.substr(0, form.find(" Excludes:"));
    }

    // The usage describes the words after the options.
    std::string make_positionals(const CLI::App* /*app*/) const override { return ""; }
};

// clang-format off
constexpr OptionRow inputRows[] = {
    {"-r,--read", "FILE", "Read FILE; the same as a word of its own. - is the standard input",
     [](Options& to, const std::string& value) { to.input.files.push_back(value); }},
    {"-i,--interface", "FILE", "Read FILE, a log or FIFO that is being written: the same as --follow FILE",
     [](Options& to, const std::string& value) { to.input.files.push_back(value); to.input.follow = true; }},
    {"-f,--follow", "", "Wait for more at the end, also when the file is replaced by a new one",
     [](Options& to, const std::string&) { to.input.follow = true; }},
    {"--merge", "", "Put the frames of several files in the order of their times",
     [](Options& to, const std::string&) { to.input.merge = true; }},
    {"--trunk", "NAME", "The name of the D channel, instead of the one that the file tells. With --store: only this one, or these (A,B)",
     [](Options& to, const std::string& value) { to.input.trunk = value; }},
    {"--store", "URL", "Read the frames of a fleet's store instead of files: postgresql://USER@HOST/lapd",
     [](Options& to, const std::string& value) { to.input.store = value; }},
    {"--site", "A,B", "With --store: only D channels of these sites",
     [](Options& to, const std::string& value) {
         for (const std::string& site : splitAtCommas(value))
             to.input.sites.push_back(site);
     }},
    {"--role", "user|network", "Which side of the link ours is, instead of what the frames tell",
     [](Options& to, const std::string& value) {
         to.input.role = chosen<capture::Role>(value, {{"user", capture::Role::user}, {"network", capture::Role::network}});
     }},
    {"--variant", "4ess|5ess|dms100|ntt|net5|ni2", "The switch variant of the trunk, instead of the one that the file tells",
     [](Options& to, const std::string& value) {
         to.input.variant = chosen<capture::Variant>(value, {
             {"4ess", capture::Variant::att4ess}, {"5ess", capture::Variant::ess5}, {"dms100", capture::Variant::dms100},
             {"ntt", capture::Variant::ntt}, {"net5", capture::Variant::net5}, {"ni2", capture::Variant::ni2}});
     }},
    {"--tz", "ZONE", "The time zone that logs were written in and times are shown in",
     [](Options& to, const std::string& value) { to.input.zone = value; }},
};

constexpr OptionRow generalRows[] = {
    {"-o,-w,--output", "OUT", "Write to OUT instead of standard output",
     [](Options& to, const std::string& value) { to.output.path = value; }},
    {"-l,--line-buffered", "", "Write each frame at once",
     [](Options& to, const std::string&) { to.output.lineBuffered = true; }},
    {"--color", "auto|always|never", "Use colours; auto: on a terminal, unless NO_COLOR is set (default: auto)",
     [](Options& to, const std::string& value) {
         to.output.color = chosen<ColorMode>(value, {
             {"auto", ColorMode::automatic}, {"always", ColorMode::always}, {"never", ColorMode::never}});
     }},
    {"--jobs", "N", "Work on N processors (default: all)",
     [](Options& to, const std::string& value) { to.output.jobs = countIn(value, 256U); }},
    {"-q,--quiet", "", "Say nothing but errors",
     [](Options& to, const std::string&) { to.loudness = Loudness::quiet; }, "loudness"},
    {"-v,--verbose", "", "Say more about the work",
     [](Options& to, const std::string&) { to.loudness = Loudness::verbose; }, "loudness"},
};

constexpr OptionRow filterRowsBesides[] = {
    {"--first", "N", "Only the first N frames that the other filters let through",
     [](Options& to, const std::string& value) { to.first = countIn<std::uint64_t>(value, INT64_MAX); }},
    {"--not", "", "In front of a filter: only frames that it would not let through; of --first: all but the first N",
     [](Options&, const std::string&) {}},
};

// These options decide which call a frame belongs to, so filters on calls need them as well.
constexpr OptionRow callRows[] = {
    {"--timer", "NAME=TIME", "Another value of a timer: T305=4s, T316=500ms, T301=3min; a number alone is seconds",
     [](Options& to, const std::string& value) {
         try {
             calls::setTimer(to.calls.timers, value);
         } catch (const calls::BadTimer& error) {
             throw UsageError(error.what());
         }
     }},
    {"--nfas", "A,B", "D channels that share their calls (non-facility associated signalling)",
     [](Options& to, const std::string& value) { to.calls.groups.push_back(splitAtCommas(value)); }},
};

constexpr OptionGroup common[] = {
    {"Input", inputRows},
    {"Filters", filterRowsBesides},
    {"Signalling", callRows},
    {"", generalRows},
};
// clang-format on

// CLI11 knows the options and their values. It calls `set` each time an option is given.
CLI::Option* add(CLI::App& app, std::string_view names, std::string_view form, std::string_view help,
                 const std::function<void(const std::string&)>& set) {
    const std::string all(names);
    if (form.empty())
        return app.add_flag_function(
            all, [set](std::int64_t) { set(""); }, std::string(help));
    return app
        .add_option_function<std::vector<std::string>>(
            all,
            [set, all](const std::vector<std::string>& values) {
                try {
                    for (const std::string& value : values)
                        set(value);
                } catch (const UsageError& error) {
                    throw CLI::ValidationError(all, error.what());
                }
            },
            std::string(help))
        ->type_name(std::string(form))
        ->allow_extra_args(false)
        ->take_all();
}

void addGroup(CLI::App& app, const OptionGroup& group, Options& options) {
    std::vector<std::pair<std::string_view, CLI::Option*>> choices;
    for (const OptionRow& row : group.rows) {
        CLI::Option* const option =
            add(app, row.names, row.form, row.help,
                [&options, &row](const std::string& value) { row.set(options, value); });
        if (!group.title.empty())
            option->group(std::string(group.title));
        if (row.oneOf.empty())
            continue;
        for (const auto& [what, other] : choices) {
            if (what == row.oneOf)
                option->excludes(other);
        }
        choices.emplace_back(row.oneOf, option);
    }
}

void addFilters(CLI::App& app, Options& options) {
    for (const FilterRow& row : filterRows()) {
        for (const bool negated : {false, true}) {
            // The form in which CLI11 gets `--not --NAME`. --help does not show it.
            const std::string name = (negated ? "--not-" : "--") + std::string(row.name);
            add(app, name, row.form, row.help, [&options, &row, negated](const std::string& value) {
                options.filters.push_back({std::string(row.name), value, negated});
            })->group(negated ? "" : "Filters");
        }
    }
}

// --first counts frames instead of choosing them, so it is not among the rows of the filters.
constexpr std::string_view countingFilter = "--first";

void addNegatedCount(CLI::App& app, Options& options) {
    add(app, "--not-first", "N", "", [&options](const std::string& value) {
        options.skipped = countIn<std::uint64_t>(value, INT64_MAX);
    })->group("");
}

void addCommand(CLI::App& app, const Command& command, Options& options) {
    CLI::App* sub = app.add_subcommand(std::string(command.name), std::string(command.summary));
    sub->formatter(std::make_shared<Help>());
    sub->set_help_flag("-h,--help", "Print this and exit");
    sub->set_version_flag("-V,--version", "lapdread " LAPDREAD_VERSION, "Print the version and exit");
    sub->footer("\nExamples:\n" + std::string(command.examples));
    sub->add_option("words", options.words)->group("");
    addGroup(*sub, command.options, options);
    addFilters(*sub, options);
    addNegatedCount(*sub, options);
    for (const OptionGroup& group : common)
        addGroup(*sub, group, options);
}

// Joins each `--not` to the filter after it, because CLI11 does not keep the order of options.
std::vector<std::string> joinNegations(const std::vector<std::string>& words) {
    std::vector<std::string> joined;
    bool negated = false;
    for (std::size_t i = 0; i < words.size(); ++i) {
        if (words[i] == "--") {
            joined.insert(joined.end(), words.begin() + static_cast<std::ptrdiff_t>(i), words.end());
            break;
        }
        if (words[i] == "--not") {
            negated = !negated;
            continue;
        }
        if (!negated) {
            joined.push_back(words[i]);
            continue;
        }
        const std::string name = words[i].substr(0, words[i].find('='));
        const auto rows = filterRows();
        if (name != countingFilter && std::none_of(rows.begin(), rows.end(), [&](const FilterRow& row) {
                return name == "--" + std::string(row.name);
            }))
            throw UsageError("--not stands in front of a filter, and " + words[i] + " is none");
        joined.push_back("--not-" + words[i].substr(2));
        negated = false;
    }
    if (negated)
        throw UsageError("--not stands in front of a filter");
    return joined;
}

bool asksAboutAll(const std::string& word) {
    return word == "-h" || word == "--help" || word == "-V" || word == "--version";
}

// Throws UsageError for a word that is like the name of a command and is not the name of a file.
void checkNoMistypedCommand(const std::string& word) {
    if (word.find_first_not_of("abcdefghijklmnopqrstuvwxyz") != std::string::npos)
        return;
    std::vector<std::string_view> names;
    for (const Command& command : commands())
        names.push_back(command.name);
    const std::string_view meant = nearest(word, names);
    std::error_code ignored;
    if (!meant.empty() && !std::filesystem::exists(word, ignored))
        throw UsageError("there is no file and no command " + word + "; did you mean " + std::string(meant) +
                         "?");
}

std::vector<std::string> withCommand(std::vector<std::string> words) {
    const bool named = !words.empty() && (commandNamed(words[0]) != nullptr || asksAboutAll(words[0]));
    if (!named && !words.empty())
        checkNoMistypedCommand(words[0]);
    if (!named)
        words.insert(words.begin(), std::string(commands().front().name));
    return words;
}

// Describes the options of one command, or of all if that is null. Describing all takes milliseconds, which a
// script feels that runs lapdread for each of many files.
void describe(CLI::App& app, Options& options, const Command* only = nullptr) {
    app.formatter(std::make_shared<Help>());
    app.footer("\n" + std::string(moreOnAll));
    app.set_help_flag("-h,--help", "Print this and exit");
    app.set_version_flag("-V,--version", "lapdread " LAPDREAD_VERSION, "Print the version and exit");
    app.require_subcommand(0, 1);
    for (const Command& command : commands()) {
        if (only == nullptr || only == &command)
            addCommand(app, command, options);
    }
}

}  // namespace

std::span<const OptionGroup> commonOptions() { return common; }

void showDescription(const std::function<void(const CLI::App&)>& visit) {
    Options unused;
    CLI::App app(about, "lapdread");
    describe(app, unused);
    visit(app);
}

CommandLine parseCommandLine(std::vector<std::string> words) {
    words = joinNegations(withCommand(std::move(words)));
    const Command* const only = words.empty() ? nullptr : commandNamed(words.front());
    std::reverse(words.begin(), words.end());  // CLI11 takes the words from the end
    CommandLine line;
    CLI::App app(about, "lapdread");
    describe(app, line.options, only);
    try {
        app.parse(std::move(words));
    } catch (const CLI::CallForHelp&) {
        line.told = app.help();
        return line;
    } catch (const CLI::CallForVersion&) {
        line.told = "lapdread " LAPDREAD_VERSION "\n";
        return line;
    } catch (const CLI::ParseError& error) {
        throw UsageError(std::string(error.what()) + " (lapdread --help tells more)");
    }
    line.command = commandNamed(app.get_subcommands().front()->get_name());
    return line;
}

}  // namespace reader
