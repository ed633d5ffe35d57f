// How fast logs and captures are read and written, on one thread and from memory to memory.
//
//     bench-captures CAPTURE ROUNDS
//
// The frames of CAPTURE, ROUNDS times with time going on, are put into a file of each form. Then each way is
// gone five times in turn, and the medians are shown: frames and megabytes of input a second, and the share
// of what reading the input's octets alone takes.
#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <ctime>
#include <exception>
#include <functional>
#include <iomanip>
#include <iostream>
#include <memory>
#include <string>
#include <vector>

#include "bench/arguments.h"
#include "capture/Batch.h"
#include "capture/open.h"
#include "capture/pcap.h"
#include "capture/pcapng.h"
#include "capture/text_forms.h"
#include "capture/writers.h"
#include "lapdlog/LogWriter.h"
#include "lapdlog/log.h"

namespace {

using capture::Item;
using capture::Reader;

constexpr int passes = 5;
constexpr std::array forms{capture::pcapForm, capture::pcapngForm, capture::hexForm, lapdlog::logForm};

// A file that exists in memory alone.
class File {
  public:
    File() : file_(memfd_create("bench", MFD_CLOEXEC)) {
        if (file_ < 0)
            throw std::runtime_error("no file in memory");
    }
    ~File() { ::close(file_); }
    File(const File&) = delete;
    File& operator=(const File&) = delete;

    int descriptor() const { return file_; }
    std::string path() const { return "/proc/self/fd/" + std::to_string(file_); }
    double megabytes() const { return static_cast<double>(lseek(file_, 0, SEEK_END)) / 1e6; }
    // Written again from its beginning; its memory stays.
    void rewind() const { static_cast<void>(lseek(file_, 0, SEEK_SET)); }

  private:
    int file_;
};

using Make = std::function<std::unique_ptr<capture::Writer>(int file, const std::string& name)>;

const Make toLog = [](int file, const std::string& name) { return lapdlog::makeLogWriter(file, name); };

std::unique_ptr<Reader> readerOf(const std::string& path) { return capture::openReader(path, {}, forms); }

// The frames of a capture again and again, each round after the one before.
void fill(const File& file, const Make& make, const std::string& source, unsigned rounds) {
    const std::unique_ptr<Reader> reader = readerOf(source);
    capture::Batch batch;
    Item item;
    while (reader->next(item) == Reader::Next::item)
        batch.add(item);
    const std::span<const Item> items = batch.items();
    const std::int64_t length = items.back().frame.time - items.front().frame.time + 1'000'000'000;
    const auto writer = make(file.descriptor(), "memory");
    for (unsigned round = 0; round < rounds; ++round) {
        for (Item again : items) {
            again.frame.time += round * length;
            writer->write(again);
        }
    }
    writer->finish();
}

// All items, each given to the writer if there is one. Returns the frames.
std::size_t convert(const File& from, const File& to, const Make& make) {
    const std::unique_ptr<Reader> reader = readerOf(from.path());
    to.rewind();
    const std::unique_ptr<capture::Writer> writer = make ? make(to.descriptor(), "memory") : nullptr;
    std::size_t frames = 0;
    Item item;
    while (reader->next(item) == Reader::Next::item) {
        frames += item.isFrame() ? 1 : 0;
        if (writer != nullptr)
            writer->write(item);
    }
    if (writer != nullptr)
        writer->finish();
    return frames;
}

void readOctets(const File& from) {
    static std::vector<char> buffer(std::size_t{1} << 18);
    from.rewind();
    while (::read(from.descriptor(), buffer.data(), buffer.size()) > 0) {
    }
}

// Of the processor, so that other programs on the machine do not count.
double processorSeconds() {
    timespec time{};
    static_cast<void>(clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time));
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) / 1e9;
}

double secondsOf(const std::function<void()>& act) {
    const double start = processorSeconds();
    act();
    return processorSeconds() - start;
}

struct Way {
    const char* name;
    const File& from;
    Make make;  // none: reading alone
    std::array<double, passes> seconds{};
    std::array<double, passes> octetsAlone{};
    std::size_t frames = 0;
};

double median(std::array<double, passes> values) {
    std::sort(values.begin(), values.end());
    return values[passes / 2];
}

void show(const Way& way) {
    const double seconds = median(way.seconds);
    std::cout << std::left << std::setw(16) << way.name << std::right << std::fixed << std::setprecision(2)
              << std::setw(7) << static_cast<double>(way.frames) / seconds / 1e6 << " million frames/s "
              << std::setprecision(0) << std::setw(6) << way.from.megabytes() / seconds << " MB/s  "
              << std::setw(3) << 100 * median(way.octetsAlone) / seconds << " % of reading alone"
              << std::endl;
}

void measure(const std::string& source, unsigned rounds) {
    const File log;
    const File pcap;
    const File pcapng;
    const File hex;
    const File out;
    fill(log, toLog, source, rounds);
    fill(pcap, capture::makePcapWriter, source, rounds);
    fill(pcapng, capture::makePcapngWriter, source, rounds);
    fill(hex, capture::makeHexWriter, source, rounds);
    std::array ways{Way{"log", log, {}},
                    Way{"log to pcapng", log, capture::makePcapngWriter},
                    Way{"log to log", log, toLog},
                    Way{"pcapng", pcapng, {}},
                    Way{"pcap", pcap, {}},
                    Way{"pcap to log", pcap, toLog},
                    Way{"pcap to pcapng", pcap, capture::makePcapngWriter},
                    Way{"hex", hex, {}}};
    for (std::size_t pass = 0; pass < passes; ++pass) {
        for (Way& way : ways) {
            way.octetsAlone[pass] = secondsOf([&] { readOctets(way.from); });
            way.seconds[pass] = secondsOf([&] { way.frames = convert(way.from, out, way.make); });
        }
    }
    for (const Way& way : ways)
        show(way);
}

}  // namespace

int main(int argc, char** argv) {
    constexpr unsigned mostRounds = 1'000'000;
    const auto rounds = argc == 3 ? bench::numberIn(argv[2], 1U, mostRounds) : std::nullopt;
    if (!rounds) {
        std::cerr << "syntax: bench-captures CAPTURE ROUNDS" << std::endl;
        return EXIT_FAILURE;
    }
    try {
        measure(argv[1], *rounds);
    } catch (const std::exception& error) {
        std::cerr << "bench-captures: " << error.what() << std::endl;
        return EXIT_FAILURE;
    }
    return EXIT_SUCCESS;
}
