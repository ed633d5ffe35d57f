#include "reader/inputs.h"

#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <filesystem>

#include "capture/open.h"
#include "lapdlog/log.h"
#include "reader/Joined.h"
#include "reader/errors.h"

namespace reader {

namespace {

void checkReadable(const std::string& file) {
    if (file != "-" && access(file.c_str(), R_OK) != 0)
        throw FileError("cannot read " + file + ": " + std::strerror(errno));
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
    std::vector<std::string> files = options.input.files;
    files.insert(files.end(), options.words.begin(), options.words.end());
    if (files.empty() && isatty(STDIN_FILENO) == 1)
        throw UsageError(
            "nothing to read: lapdread FILE, or - for the standard input (lapdread --help tells more)");
    if (files.empty())
        files.emplace_back("-");
    return files;
}

std::unique_ptr<capture::Reader> openInputs(const Options& options, Chatter& /*chatter*/) {
    const std::vector<std::string> files = inputFiles(options);
    const InputOptions& input = options.input;
    if (input.follow && files.size() > 1 && !input.merge)
        throw UsageError("--follow takes one input, or several with --merge");
    std::vector<Opener> openers;
    for (const std::string& file : files) {
        checkReadable(file);
        openers.emplace_back([file, &input] { return openFile(file, input); });
    }
    if (input.merge && files.size() > 1)
        return std::make_unique<Merge>(openers);
    return std::make_unique<Sequence>(std::move(openers));
}

void checkForms(const Options& options) {
    if (options.input.follow)
        return;
    for (const std::string& file : inputFiles(options)) {
        std::error_code ignored;
        capture::Item item;
        if (file != "-" && std::filesystem::is_regular_file(file, ignored))
            openFile(file, options.input)->next(item);
    }
}

}  // namespace reader
