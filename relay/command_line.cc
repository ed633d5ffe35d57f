#include "relay/command_line.h"

#include <CLI/CLI.hpp>
#include <cmath>
#include <cstdlib>
#include <vector>

namespace relay {

namespace {

constexpr const char* about = "Lets lapdmon on other machines trace the KV9 boards of this one.";

constexpr const char* footer =
    "A host reaches the boards of this machine with REMOTE_NORV=ADDR:PORT.\n"
    "\n"
    "There is no password and no encryption: whoever may connect may drive the boards, and others on the "
    "way\n"
    "can read the messages. Without options only this machine may connect. Let hosts connect through SSH:\n"
    "  ssh -N -L 6554:127.0.0.1:6554 user@board-machine\n"
    "or, in a network that you trust, directly:\n"
    "  kv9relayd --listen 0.0.0.0:6554 --allow 192.168.1.0/24\n";

// The options whose text this program reads itself, and not CLI11, so that a report says what is wrong in its
// own words.
struct Given {
    std::string listen;
    std::vector<std::string> allow;
    double frameTimeout = 10;
    double writeTimeout = 10;
};

// "nan" is a number to the library, and within every range.
std::string refuseNan(const std::string& text) {
    return std::isnan(std::strtod(text.c_str(), nullptr)) ? "Value " + text + " is no number of seconds" : "";
}

// The option's help tells the range.
template <class Number>
CLI::Validator inRange(Number least, Number most) {
    return CLI::Range(least, most).description("");
}

void describe(CLI::App& app, Given& given, Options& options) {
    app.footer(footer);
    app.add_option("--listen", given.listen,
                   "IPv4 address to listen on; with port 0 the system chooses one (default: 127.0.0.1:6554)")
        ->type_name("ADDR[:PORT]");
    app.add_option("--allow", given.allow,
                   "Who may connect, for example 192.168.1.0/24; may be given several times; replaces the "
                   "default (127.0.0.0/8)")
        ->type_name("CIDR")
        ->allow_extra_args(false);
    app.add_option("--max-clients", options.maxClients,
                   "Most connections at a time, 1 to 10000 (default: 128)")
        ->type_name("N")
        ->check(inRange(1, 10000));
    app.add_option(
           "--frame-timeout", given.frameTimeout,
           "How long a host may take to finish a frame that it has begun, 0.001 to 3600 (default: 10)")
        ->type_name("SECONDS")
        ->check(inRange(0.001, 3600.0))
        ->check(refuseNan);
    app.add_option("--write-timeout", given.writeTimeout,
                   "How long a host may take to accept a frame, 0.001 to 3600 (default: 10)")
        ->type_name("SECONDS")
        ->check(inRange(0.001, 3600.0))
        ->check(refuseNan);
    app.set_help_flag("--help,-h", "Print this and exit");
    app.set_version_flag("--version", "kv9relayd " RELAY_VERSION, "Print the version and exit");
}

std::chrono::milliseconds milliseconds(double seconds) {
    return std::chrono::milliseconds(std::lround(seconds * 1000));
}

void use(const Given& given, Options& options) {
    options.patience = {milliseconds(given.frameTimeout), milliseconds(given.writeTimeout)};
    if (!given.listen.empty()) {
        const auto endpoint = Endpoint::parse(given.listen, options.listen.port);
        if (!endpoint)
            throw BadCommandLine("--listen " + given.listen +
                                 ": not an IPv4 address, or one with a colon and a port behind it");
        options.listen = *endpoint;
    }
    for (const std::string& text : given.allow) {
        const auto cidr = Cidr::parse(text);
        if (!cidr)
            throw BadCommandLine("--allow " + text + ": not an IPv4 network such as 192.168.1.0/24");
        options.allow.push_back(*cidr);
    }
    if (!loopback.contains(options.listen.address) && options.allow.empty())
        throw BadCommandLine(
            "--listen " + options.listen.text() +
            " would let everyone who reaches this machine drive its boards: say with --allow CIDR who may "
            "(for example --allow 192.168.1.0/24), or listen on 127.0.0.1 and let hosts come through SSH");
}

}  // namespace

CommandLine parseCommandLine(int argc, const char* const* argv) {
    CommandLine commandLine;
    Given given;
    CLI::App app(about, "kv9relayd");
    describe(app, given, commandLine.options);
    try {
        app.parse(argc, argv);
        use(given, commandLine.options);
    } catch (const CLI::CallForHelp&) {
        commandLine.told = app.help();
    } catch (const CLI::CallForVersion& version) {
        commandLine.told = std::string(version.what()) + "\n";
    } catch (const CLI::ParseError& error) {
        throw BadCommandLine(std::string(error.what()) + " (--help tells more)");
    }
    return commandLine;
}

void showDescription(const std::function<void(const CLI::App&)>& visit) {
    Given given;
    Options options;
    CLI::App app(about, "kv9relayd");
    describe(app, given, options);
    visit(app);
}

}  // namespace relay
