// Measures how well the whole program keeps up with a board. One process runs lapdmon on the software board
// with its built-in capture. This process reads the log from a pipe, checks each frame, and measures the time
// from the event to its line in the log.
//
//     bench-road [FRAMES [SECONDS [ROUNDS]]]
//
// First as fast as the board can, until FRAMES are in the log (200000); then for SECONDS (5) frames that come
// alone, 20 a second; then ROUNDS (5) times for SECONDS at the rate of a D channel that is full in both
// directions. A time ends when the header line can be read from the log. The processor's time includes the
// software board's. How much of it is spent before lapdmon has done anything is shown, in each round, by
// programs that read the events alone.
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
constexpr unsigned lonelyRate = 20;

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

double median(std::vector<double> values) { return percentile(values, 0.5); }

// What a frame costs at line rate, of the processor, in microseconds, and how much of it the board and an
// idle thread an event make up: medians of several rounds. All three are measured in each round, so that a
// round's share does not depend on what the machine did in another one. False when one was not what it should
// have been.
bool showCost(double seconds, std::uint64_t rounds) {
    std::vector<double> lapdmon, board, threads, ratios;
    bool good = true;
    for (std::uint64_t round = 0; round < rounds; ++round) {
        const auto frames = static_cast<std::uint64_t>(seconds * lineRate);
        const bench::Run run = bench::runRoad(std::to_string(lineRate), frames);
        good = show("at line rate", run) && good;
        lapdmon.push_back(1e6 * run.cpuSeconds / static_cast<double>(std::max<std::uint64_t>(run.frames, 1)));
        board.push_back(bench::runReading(std::to_string(lineRate), seconds, false));
        threads.push_back(bench::runReading(std::to_string(lineRate), seconds, true));
        good = good && board.back() > 0 && threads.back() > 0;
        ratios.push_back(lapdmon.back() / threads.back());
    }
    std::cout << std::setprecision(1) << "at line rate, us of CPU a frame, median of " << rounds
              << ": lapdmon " << median(lapdmon) << ", the board and the reading " << median(board)
              << ", these and an idle thread an event " << median(threads) << "; lapdmon takes "
              << std::setprecision(2) << median(ratios) << " times the last" << std::endl;
    return good;
}

// The least number of frames. If there are fewer, all of them may be in the first piece of the log that is
// read, and then no time passes between the first and the last.
constexpr std::uint64_t fewest = 1000;
constexpr double shortest = 0.1;

int measure(int argc, char** argv) {
    const auto frames = argc > 1 ? bench::numberIn<std::uint64_t>(argv[1], fewest, 100000000) : 200000;
    const auto seconds = argc > 2 ? bench::numberIn<double>(argv[2], shortest, 3600) : 5;
    const auto rounds = argc > 3 ? bench::numberIn<std::uint64_t>(argv[3], 1, 1000) : 5;
    if (!frames || !seconds || !rounds || argc > 4) {
        std::cerr << "syntax: bench-road [FRAMES [SECONDS [ROUNDS]]], at least " << fewest << ", " << shortest
                  << " and 1" << std::endl;
        return EXIT_FAILURE;
    }
    const bool fast = show("as fast as it goes", bench::runRoad("max", *frames));
    const auto alone = static_cast<std::uint64_t>(*seconds * lonelyRate);
    const bool lonely = show("frames that come alone", bench::runRoad(std::to_string(lonelyRate), alone + 2));
    const bool paced = showCost(*seconds, *rounds);
    return fast && lonely && paced ? EXIT_SUCCESS : EXIT_FAILURE;
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
