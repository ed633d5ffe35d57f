// Measures how well the whole program keeps up with a board. One process runs lapdmon on the software board
// with its built-in capture. This process reads the log from a pipe, checks each frame, and measures the time
// from the event to its line in the log.
//
//     bench-road [FRAMES [SECONDS]]
//
// The first run is as fast as the board can, until FRAMES (200000) frames are in the log. The second run
// lasts SECONDS (5) at line rate, which is a D channel that is full in both directions. The time of the
// processor includes that of the software board. To show how much of it is spent before lapdmon has done
// anything, two more programs only read the events.
#include <algorithm>
#include <cstdlib>
#include <exception>
#include <iomanip>
#include <iostream>
#include <string>
#include <vector>

#include "bench/arguments.h"
#include "bench/road/reading.h"
#include "bench/road/run.h"
#include "bench/road/traced.h"

namespace {

// Line rate in frames a second: 64 kbit/s in both directions, filled with the shortest frames (4 octets,
// check sequence and flag).
constexpr unsigned lineRate = 2 * 1142;

double percentile(std::vector<double>& values, double share) {
    const auto at =
        values.begin() + static_cast<std::ptrdiff_t>(share * static_cast<double>(values.size() - 1));
    std::nth_element(values.begin(), at, values.end());
    return *at;
}

// Prints the figures of a run. Returns false when the program failed, or when frames were lost, refused or
// out of order.
bool show(const std::string& what, bench::Run run) {
    if (run.frames == 0) {
        std::cout << what << ": ended before its time (status " << run.status << ")" << std::endl;
        return false;
    }
    const auto frames = static_cast<double>(run.frames);
    std::cout << std::fixed << std::setprecision(0) << what << ": " << frames / run.seconds << " frames/s, "
              << percentile(run.latencies, 0.5) << " us median, " << percentile(run.latencies, 0.99)
              << " us 99 %, " << std::setprecision(1) << 1e6 * run.cpuSeconds / frames
              << " us of CPU a frame (" << 100 * run.cpuSeconds / run.seconds << " % of a core), "
              << run.mostThreads << " threads, " << static_cast<double>(run.peakKilobytes) / 1024 << " MB; "
              << run.checked.frames << " checked, " << run.checked.lost << " lost, " << run.checked.refused
              << " refused, " << run.checked.outOfOrder << " out of order" << std::endl;
    return run.status == 0 && run.checked.lost + run.checked.refused + run.checked.outOfOrder == 0;
}

// Prints what it costs at line rate only to read the events, and, if threadForEach is set, to start a thread
// that does nothing for each. Returns false when the program failed.
bool showLeast(const std::string& what, double seconds, bool threadForEach) {
    const double used = bench::runReading(std::to_string(lineRate), seconds, threadForEach);
    if (!(used > 0)) {
        std::cout << what << ": could not be run" << std::endl;
        return false;
    }
    std::cout << what << ": " << std::setprecision(1) << used << " us of CPU a frame ("
              << used * lineRate / 1e4 << " % of a core)" << std::endl;
    return true;
}

// The least number of frames. If there are fewer, all of them may be in the first piece of the log that is
// read, and then no time passes between the first and the last.
constexpr std::uint64_t fewest = 1000;
constexpr double shortest = 0.1;

int measure(int argc, char** argv) {
    const auto frames = argc > 1 ? bench::numberIn<std::uint64_t>(argv[1], fewest, 100000000) : 200000;
    const auto seconds = argc > 2 ? bench::numberIn<double>(argv[2], shortest, 3600) : 5;
    if (!frames || !seconds || argc > 3) {
        std::cerr << "syntax: bench-road [FRAMES [SECONDS]], at least " << fewest << " and " << shortest
                  << std::endl;
        return EXIT_FAILURE;
    }
    const bool fast = show("as fast as it goes", bench::runRoad("max", *frames));
    const bool paced = show("at line rate", bench::runRoad(std::to_string(lineRate),
                                                           static_cast<std::uint64_t>(*seconds * lineRate)));
    const bool board = showLeast("  of which the board and the reading", *seconds, false);
    const bool threads = showLeast("  the same and an idle thread an event", *seconds, true);
    return fast && paced && board && threads ? EXIT_SUCCESS : EXIT_FAILURE;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc == 4 && argv[1] == std::string("--traced"))
        return bench::runTraced(bench::numberIn(argv[2], 0, 1 << 20).value_or(-1), argv[3]);
    if (argc == 4 && argv[1] == std::string("--reading")) {
        std::cout << bench::readEvents(bench::numberIn(argv[2], 0.0, 3600.0).value_or(0),
                                       argv[3] == std::string("1"))
                  << std::endl;
        return EXIT_SUCCESS;
    }
    try {
        return measure(argc, argv);
    } catch (const std::exception& error) {
        std::cerr << "bench-road: " << error.what() << std::endl;
        return EXIT_FAILURE;
    }
}
