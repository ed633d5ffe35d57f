// How fast frames become text in a log, by the program's own way from a trace record on: header lines,
// getBlock, parse_isdn_frame, the log. Beside it, the same text written with plain fwrite: what the
// file can take.
//
//     bench-decode [--variant V] CAPTURE REPEAT LOG
//
// CAPTURE is a capture file, or the decoder's golden files; V a name as of the software board's --protocol.
// Both ways are gone five times in turn, and the medians shown. The log stays.
#include <algorithm>
#include <array>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <fstream>
#include <iomanip>
#include <iostream>
#include <string>
#include <string_view>
#include <vector>

#include "app/Log.h"
#include "app/display.h"
#include "bench/inputs.h"
#include "decoder/state.h"

namespace {

using Record = vela::CCS::EvtL2Trace_t;

constexpr int passes = 5;

struct Arguments {
    std::string variant = "net5";
    std::string capture;
    unsigned long repeat = 0;
    std::string log;
};

[[noreturn]] void fail(const std::string& reason) {
    std::cerr << "bench-decode: " << reason << std::endl;
    std::exit(EXIT_FAILURE);
}

Arguments parse(std::vector<std::string> words) {
    Arguments arguments;
    if (words.size() == 5 && words[0] == "--variant") {
        arguments.variant = words[1];
        words.erase(words.begin(), words.begin() + 2);
    }
    if (words.size() == 3)
        arguments.repeat = std::strtoul(words[1].c_str(), nullptr, 10);
    if (arguments.repeat == 0)
        fail("syntax: bench-decode [--variant V] CAPTURE REPEAT LOG");
    arguments.capture = words[0];
    arguments.log = words[2];
    return arguments;
}

std::vector<Record> recordsOf(const softboard::Frames& frames) {
    std::vector<Record> records(frames.size());
    for (std::size_t i = 0; i < frames.size(); ++i) {
        records[i].Label = 2;
        records[i].Direction = frames[i].transmitted ? 1 : 0;
        records[i].Timestamp = frames[i].ticks;
        records[i].Length = static_cast<unsigned int>(frames[i].octets.size());
        records[i].List->realloc(records[i].Length);
        std::copy(frames[i].octets.begin(), frames[i].octets.end(), records[i].List->begin());
    }
    return records;
}

// Seconds that `write` takes, the closing of the log included.
template <typename Write>
double timed(Write write) {
    const auto start = std::chrono::steady_clock::now();
    write();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

[[noreturn]] void failAt(const std::string& path) { fail(path + ": " + std::strerror(errno)); }

double decode(std::vector<Record>& records, const Arguments& arguments) {
    app::Log& log = app::traceLog;
    decoder::ofp = log.open(arguments.log.c_str());
    if (decoder::ofp == nullptr)
        failAt(arguments.log);
    decoder::writeLog = [](std::string_view entry) { app::traceLog.write(entry); };
    const double seconds = timed([&] {
        vela::staticList<unsigned char> octets;
        for (unsigned long i = 0; i < arguments.repeat; ++i) {
            for (Record& record : records)
                app::showRecord(record, octets);
        }
        decoder::ofp = nullptr;
        log.close();
    });
    if (!log.complete())
        std::exit(EXIT_FAILURE);  // the log has said why
    return seconds;
}

// One round of the capture at a time, as the first round of the log has it.
double copy(const std::string& round, const Arguments& arguments) {
    std::FILE* const log = std::fopen(arguments.log.c_str(), "w");
    if (log == nullptr)
        failAt(arguments.log);
    return timed([&] {
        for (unsigned long i = 0; i < arguments.repeat; ++i)
            (void)std::fwrite(round.data(), 1, round.size(), log);
        const bool bad = std::ferror(log) != 0;
        if (std::fclose(log) != 0 || bad)
            failAt(arguments.log);
    });
}

// All rounds are of one length: they differ in the time of day alone.
std::string firstRound(const Arguments& arguments) {
    std::ifstream log(arguments.log, std::ios::binary | std::ios::ate);
    std::string text(static_cast<std::size_t>(log.tellg()) / arguments.repeat, '\0');
    log.seekg(0);
    if (!log.read(text.data(), static_cast<std::streamsize>(text.size())))
        fail(arguments.log + ": cannot be read again");
    return text;
}

double median(std::array<double, passes> values) {
    std::sort(values.begin(), values.end());
    return values[passes / 2];
}

void measure(const Arguments& arguments) {
    const int variant = bench::variantOf(arguments.variant);
    std::vector<Record> records = recordsOf(bench::readInput(arguments.capture, variant));
    decoder::swit = variant;
    decoder::file_output = true;

    std::array<double, passes> decoding{};
    std::array<double, passes> copying{};
    std::string round;
    for (int i = 0; i < passes; ++i) {
        decoding[i] = decode(records, arguments);
        round = firstRound(arguments);
        copying[i] = copy(round, arguments);
    }
    const double frames = static_cast<double>(records.size() * arguments.repeat);
    const double megabytes = static_cast<double>(round.size() * arguments.repeat) / 1e6;
    std::cout << std::fixed << std::setprecision(0) << frames / median(decoding) << " frames/s, "
              << megabytes / median(decoding) << " MB/s of text (" << megabytes * 1e6 / frames
              << " octets a frame), " << 100 * median(copying) / median(decoding)
              << " % of what fwrite writes (" << megabytes / median(copying) << " MB/s)" << std::endl;
}

}  // namespace

int main(int argc, char** argv) {
    try {
        measure(parse({argv + 1, argv + argc}));
    } catch (const std::exception& error) {
        fail(error.what());
    }
    return EXIT_SUCCESS;
}
