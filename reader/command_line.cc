#include "reader/command_line.h"

#include <algorithm>
#include <map>

#include "reader/Filter.h"
#include "reader/errors.h"

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

    // The words behind the options are told by the usage.
    std::string make_positionals(const CLI::App* /*app*/) const override { return ""; }
};

template <class Value>
CLI::Option* addChoice(CLI::App& app, const char* names, Value& value,
                       const std::vector<std::pair<std::string, Value>>& choices, const char* help) {
    std::string form;
    for (const auto& [name, meant] : choices)
        form += (form.empty() ? "" : "|") + name;
    return app
        .add_option_function<std::string>(
            names,
            [&value, choices, form](const std::string& text) {
                const auto found = std::find_if(choices.begin(), choices.end(),
                                                [&](const auto& choice) { return choice.first == text; });
                if (found == choices.end())
                    throw CLI::ValidationError(text + " is none of " + form);
                value = found->second;
            },
            help)
        ->type_name(form);
}

void addInputOptions(CLI::App& app, Options& to) {
    InputOptions& input = to.input;
    const std::string group = "Input";
    app.add_option("-r,--read", input.files,
                   "Read FILE; the same as a word of its own. - is the standard input")
        ->type_name("FILE")
        ->allow_extra_args(false)
        ->take_all()
        ->group(group);
    app.add_option_function<std::vector<std::string>>(
           "-i,--interface",
           [&input](const std::vector<std::string>& files) {
               input.files.insert(input.files.end(), files.begin(), files.end());
               input.follow = true;
           },
           "Read FILE, a log or FIFO that is being written: the same as --follow FILE")
        ->type_name("FILE")
        ->allow_extra_args(false)
        ->take_all()
        ->group(group);
    app.add_flag("-f,--follow", input.follow,
                 "Wait for more at the end, also when the file is replaced by a new one")
        ->group(group);
    app.add_flag("--merge", input.merge, "Put the frames of several files in the order of their times")
        ->group(group);
    app.add_option("--trunk", input.trunk,
                   "The name of the D channel, instead of the one that the file tells")
        ->type_name("NAME")
        ->group(group);
    addChoice<capture::Role>(app, "--role", input.role,
                             {{"user", capture::Role::user}, {"network", capture::Role::network}},
                             "Which side of the link ours is, instead of what the frames tell")
        ->group(group);
    addChoice<capture::Variant>(app, "--variant", input.variant,
                                {{"4ess", capture::Variant::att4ess},
                                 {"5ess", capture::Variant::ess5},
                                 {"dms100", capture::Variant::dms100},
                                 {"ntt", capture::Variant::ntt},
                                 {"net5", capture::Variant::net5},
                                 {"ni2", capture::Variant::ni2}},
                                "The switch variant of the trunk, instead of the one that the file tells")
        ->group(group);
    app.add_option("--tz", input.zone, "The time zone that logs were written in and times are shown in")
        ->type_name("ZONE")
        ->group(group);
}

void addFilterOptions(CLI::App& app, Options& to) {
    const std::string group = "Filters";
    for (const FilterRow& row : filterRows()) {
        const std::string name(row.name);
        const auto add = [&](const std::string& option, bool negated) {
            CLI::Option* added = nullptr;
            if (row.form.empty()) {
                added = app.add_flag_function(
                    option,
                    [&to, name, negated](std::int64_t) {
                        to.filters.push_back({name, "", negated});
                    },
                    std::string(row.help));
            } else {
                added = app.add_option_function<std::vector<std::string>>(
                               option,
                               [&to, name, negated](const std::vector<std::string>& values) {
                                   for (const std::string& value : values)
                                       to.filters.push_back({name, value, negated});
                               },
                               std::string(row.help))
                            ->type_name(std::string(row.form))
                            ->allow_extra_args(false)
                            ->take_all();
            }
            return added;
        };
        add("--" + name, false)->group(group);
        add("--not-" + name, true)->group("");  // how `--not --NAME` is handed to CLI11
    }
    app.add_option("--first", to.first, "Only the first N frames that the other filters let through")
        ->type_name("N")
        ->check(CLI::Validator(CLI::PositiveNumber).description(""))
        ->group(group);
    app.add_flag_callback(
           "--not", [] {}, "In front of a filter: only frames that it would not let through")
        ->group(group);
}

void addGeneralOptions(CLI::App& app, Options& to) {
    OutputOptions& output = to.output;
    app.add_option("-o,-w,--output", output.path, "Write to OUT instead of standard output")
        ->type_name("OUT");
    app.add_flag("-l,--line-buffered", output.lineBuffered, "Write each frame at once");
    addChoice<ColorMode>(
        app, "--color", output.color,
        {{"auto", ColorMode::automatic}, {"always", ColorMode::always}, {"never", ColorMode::never}},
        "Use colours; auto: on a terminal, unless NO_COLOR is set (default: auto)");
    app.add_option("--jobs", output.jobs, "Work on N processors (default: all)")
        ->type_name("N")
        ->check(CLI::Range(1U, 256U).description(""));
    app.add_flag_callback(
        "-q,--quiet", [&to] { to.loudness = Loudness::quiet; }, "Say nothing but errors");
    app.add_flag_callback(
        "-v,--verbose", [&to] { to.loudness = Loudness::verbose; }, "Say more about the work");
}

void addCommand(CLI::App& app, const Command& command, Options& options) {
    CLI::App* sub = app.add_subcommand(std::string(command.name), std::string(command.summary));
    sub->formatter(std::make_shared<Help>());
    sub->set_help_flag("-h,--help", "Print this and exit");
    sub->set_version_flag("-V,--version", "lapdread " LAPDREAD_VERSION, "Print the version and exit");
    sub->footer("\nExamples:\n" + std::string(command.examples));
    sub->add_option("words", options.words)->group("");
    addInputOptions(*sub, options);
    addFilterOptions(*sub, options);
    if (command.declare != nullptr)
        command.declare(*sub, options);
    addGeneralOptions(*sub, options);
}

// `--not` belongs to the filter behind it, whatever CLI11 thinks of their order.
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
        if (std::none_of(rows.begin(), rows.end(),
                         [&](const FilterRow& row) { return name == "--" + std::string(row.name); }))
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

std::vector<std::string> withCommand(std::vector<std::string> words) {
    const bool named = !words.empty() && (commandNamed(words[0]) != nullptr || asksAboutAll(words[0]));
    if (!named)
        words.insert(words.begin(), std::string(commands().front().name));
    return words;
}

}  // namespace

std::unique_ptr<CLI::App> describe(Options& options) {
    auto app = std::make_unique<CLI::App>(about, "lapdread");
    app->formatter(std::make_shared<Help>());
    app->footer("\n" + std::string(moreOnAll));
    app->set_help_flag("-h,--help", "Print this and exit");
    app->set_version_flag("-V,--version", "lapdread " LAPDREAD_VERSION, "Print the version and exit");
    app->require_subcommand(0, 1);
    for (const Command& command : commands())
        addCommand(*app, command, options);
    return app;
}

CommandLine parseCommandLine(std::vector<std::string> words) {
    words = joinNegations(withCommand(std::move(words)));
    std::reverse(words.begin(), words.end());  // as CLI11 takes them
    CommandLine line;
    const std::unique_ptr<CLI::App> app = describe(line.options);
    try {
        app->parse(std::move(words));
    } catch (const CLI::CallForHelp&) {
        line.told = app->help();
        return line;
    } catch (const CLI::CallForVersion&) {
        line.told = "lapdread " LAPDREAD_VERSION "\n";
        return line;
    } catch (const CLI::ParseError& error) {
        throw UsageError(std::string(error.what()) + " (lapdread --help tells more)");
    }
    line.command = commandNamed(app->get_subcommands().front()->get_name());
    return line;
}

}  // namespace reader
