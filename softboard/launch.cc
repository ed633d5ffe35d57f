#include "softboard/launch.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <iostream>

#include "softboard/handover.h"
#include "softboard/settings.h"

namespace softboard {

namespace {

namespace fs = std::filesystem;

constexpr int notExecutable = 126;
constexpr int notFound = 127;

// The descriptor of the scenario's file is at least this, because a shell that is the program may use the low
// numbers for files of its own.
constexpr int firstDescriptor = 100;

void startJournal(const std::string& path) {
    if (path.empty()) {
        return;
    }
    const int file = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (file < 0) {
        throw BadInput(path + ": " + std::strerror(errno));
    }
    ::close(file);
}

void writeWhole(int file, const std::string& text) {
    size_t done = 0;
    while (done < text.size()) {
        const ssize_t written = ::write(file, text.data() + done, text.size() - done);
        if (written < 0) {
            throw BadInput(std::string("handing over the scenario: ") + std::strerror(errno));
        }
        done += static_cast<size_t>(written);
    }
}

// Writes the scenario into a file in memory and returns its path. The descriptor stays open in the program
// and in the processes that the program starts, so each of them can open the file by this path.
std::string handOver(const Scenario& scenario) {
    int file = ::memfd_create("softboard-scenario", 0);
    if (file < 0) {
        throw BadInput(std::string("handing over the scenario: ") + std::strerror(errno));
    }
    writeWhole(file, toJson(scenario));
    if (const int high = ::fcntl(file, F_DUPFD, firstDescriptor); high >= 0) {
        ::close(file);
        file = high;
    }
    return "/proc/self/fd/" + std::to_string(file);
}

void prependLibrary(const fs::path& self) {
    const fs::path folder = self.parent_path().parent_path() / "lib" / "lapdmon";
    if (!fs::exists(folder / "libnorv.so")) {
        throw BadInput((folder / "libnorv.so").string() + ": " + std::strerror(ENOENT));
    }
    const char* before = std::getenv("LD_LIBRARY_PATH");
    const bool some = before != nullptr && *before != '\0';
    ::setenv("LD_LIBRARY_PATH", (folder.string() + (some ? ":" + std::string(before) : "")).c_str(), 1);
}

fs::path findProgram(const fs::path& self, const std::string& name) {
    const fs::path beside = self.parent_path() / name;
    const bool plain = name.find('/') == std::string::npos;
    return plain && ::access(beside.c_str(), X_OK) == 0 && !fs::is_directory(beside) ? beside
                                                                                     : fs::path(name);
}

int becomeProgram(const fs::path& self, const std::vector<std::string>& program) {
    std::vector<std::string> words = program;
    std::vector<char*> argv;
    argv.reserve(words.size() + 1);
    for (std::string& word : words) {
        argv.push_back(word.data());
    }
    argv.push_back(nullptr);
    ::execvp(findProgram(self, program.front()).c_str(), argv.data());
    const int reason = errno;
    std::cerr << "softboard: " << program.front() << ": " << std::strerror(reason) << '\n';
    return reason == ENOENT ? notFound : notExecutable;
}

}  // namespace

int launch(const fs::path& self, const Scenario& scenario, const std::vector<std::string>& program) {
    prependLibrary(self);
    startJournal(scenario.journal);
    ::setenv(scenarioVariable, handOver(scenario).c_str(), 1);
    return becomeProgram(self, program);
}

}  // namespace softboard
