#include "reader/program.h"

#include <csignal>
#include <exception>

#include "reader/Chatter.h"
#include "reader/Output.h"
#include "reader/command_line.h"
#include "reader/errors.h"
#include "reader/inputs.h"

namespace reader {

namespace {

int run(const std::vector<std::string>& words) {
    CommandLine line = parseCommandLine(words);
    if (line.command == nullptr) {
        Output out;
        out.write(line.told);
        out.flush();
        return good;
    }
    if (line.command->takesFilesAlone && !line.options.input.store.empty())
        throw UsageError(std::string(line.command->name) + " takes files; --store is for other commands");
    if (!line.options.input.zone.empty())
        useTimeZone(line.options.input.zone);
    Chatter chatter(line.options.loudness);
    learnTrunksOfStore(line.options, chatter);
    const int status = line.command->run(line.options, chatter);
    return status == good && chatter.hasWrongUsage() ? badUsage : status;
}

int fail(ExitStatus status, const std::string& why) {
    Chatter(Loudness::usual).error(why);
    return status;
}

}  // namespace

int runProgram(const std::vector<std::string>& words) {
    static_cast<void>(std::signal(SIGPIPE, SIG_IGN));
    try {
        return run(words);
    } catch (const ReaderGone&) {
        return good;
    } catch (const StoppedEarly&) {
        return good;
    } catch (const UsageError& error) {
        return fail(badUsage, error.what());
    } catch (const std::exception& error) {
        return fail(cannotRead, error.what());
    }
}

}  // namespace reader
