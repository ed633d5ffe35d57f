// Measures how fast trace records become text in a log, with the program's own code: time lines, getBlock,
// parse_isdn_frame, app::Log. For comparison it writes the same text with fwrite, which is the most that the
// file can take.
//
//     bench-decode [--variant V] CAPTURE REPEAT LOG
//
// CAPTURE is a capture file, a golden file of the decoder, or a folder of golden files. V is a name or number
// of the software board's --protocol. Each of the three ways runs five times, in turn, and the medians are
// shown: decoding; fwrite of one round of CAPTURE at a time; fwrite in blocks as large as the log's own. At
// the end LOG holds what fwrite wrote: the text of the first round of CAPTURE, REPEAT times. If LOG keeps
// nothing, like /dev/null, there is no comparison.
#include <algorithm>
#include <array>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iomanip>
#include <iostream>
#include <string>
#include <string_view>
#include <vector>

#include "app/Log.h"
#include "app/display.h"
#include "bench/arguments.h"
#include "bench/inputs.h"
#include "decoder/lines.h"
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
    constexpr unsigned long most = 1000000000;
    if (words.size() == 3)
        arguments.repeat = bench::numberIn(words[1], 1UL, most).value_or(0);
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

// The seconds that `write` takes. It must also close the log.
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
        std::exit(EXIT_FAILURE);  // the log has already reported the reason
    return seconds;
}

// Writes the text of the first round REPEAT times, in pieces of this size, and returns the seconds that it
// took.
double copy(const std::string& round, std::size_t piece, const Arguments& arguments) {
    std::FILE* const log = std::fopen(arguments.log.c_str(), "w");
    if (log == nullptr)
        failAt(arguments.log);
    return timed([&] {
        for (unsigned long i = 0; i < arguments.repeat; ++i) {
            for (std::size_t at = 0; at < round.size(); at += piece)
                (void)std::fwrite(round.data() + at, 1, std::min(piece, round.size() - at), log);
        }
        const bool bad = std::ferror(log) != 0;
        if (std::fclose(log) != 0 || bad)
            failAt(arguments.log);
    });
}

// The text of the first round in the log; empty when the log keeps nothing. All rounds have the same length,
// because they differ only in the time of day.
std::string firstRound(const Arguments& arguments) {
    if (!std::filesystem::is_regular_file(arguments.log))
        return {};
    std::ifstream log(arguments.log, std::ios::binary | std::ios::ate);
    std::string text(static_cast<std::size_t>(log.tellg()) / arguments.repeat, '\0');
    log.seekg(0);
    if (!log.read(text.data(), static_cast<std::streamsize>(text.size())))
        fail(arguments.log + ": cannot be read again");
    return text;
}

using Seconds = std::array<double, passes>;

double median(Seconds values) {
    std::sort(values.begin(), values.end());
    return values[passes / 2];
}

// The seconds of each pass.
struct Times {
    Seconds decoding{};
    Seconds copying{};
    Seconds copyingBlocks{};
};

void show(double frames, double megabytes, const Times& times) {
    const double decoding = median(times.decoding);
    const auto share = [&](const char* of, double copying) {
        std::cout << ", " << 100 * copying / decoding << " % of what " << of << " (" << megabytes / copying
                  << " MB/s)";
    };
    std::cout << std::fixed << std::setprecision(0) << frames / decoding << " frames/s";
    if (megabytes > 0) {
        std::cout << ", " << megabytes / decoding << " MB/s of text (" << megabytes << " MB, "
                  << megabytes * 1e6 / frames << " octets a frame)";
        share("fwrite writes", median(times.copying));
        share("it writes in blocks of 4 kB", median(times.copyingBlocks));
    }
    std::cout << std::endl;
}

void measure(const Arguments& arguments) {
    const int variant = bench::variantOf(arguments.variant);
    std::vector<Record> records = recordsOf(bench::readInput(arguments.capture, variant));
    decoder::swit = variant;
    decoder::file_output = true;

    Times times;
    std::string round;
    for (int i = 0; i < passes; ++i) {
        times.decoding[i] = decode(records, arguments);
        round = firstRound(arguments);
        if (!round.empty()) {
            times.copying[i] = copy(round, round.size(), arguments);
            times.copyingBlocks[i] = copy(round, app::Log::blockSize, arguments);
        }
    }
    const double frames = static_cast<double>(records.size() * arguments.repeat);
    const double megabytes = static_cast<double>(round.size() * arguments.repeat) / 1e6;
    show(frames, megabytes, times);
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
