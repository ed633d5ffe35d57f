// How well the whole program keeps up: a process of its own traces the software board's built-in capture, and
// this one reads its log from a pipe, checks each frame, and takes the time.
//
//     bench-road [FRAMES [SECONDS]]
//
// First as fast as the board can, until FRAMES are in the log (200000); then for SECONDS (5) at the rate of a
// D channel that is full in both directions. A time ends when the header line can be read from the log, which
// is written when there are 4 kB of it. The processor's time includes the software board's; how
// much of it is spent before lapdmon has done anything is shown by programs that read the events alone.
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

// 64 kbit/s filled with the shortest frames (4 octets, check sequence and flag), both ways.
constexpr unsigned lineRate = 2 * 1142;

double percentile(std::vector<double>& values, double share) {
    const auto at =
        values.begin() + static_cast<std::ptrdiff_t>(share * static_cast<double>(values.size() - 1));
    std::nth_element(values.begin(), at, values.end());
    return *at;
}

// False when the run was not what it should have been.
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

// What the board, and a thread for each event, cost at line rate. False when they could not be run.
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

// Fewer frames than these may all be in the first piece of the log that is read: then there is no time
// between the first and the last.
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
