// Inputs that end anywhere: what was whole before the cut is listed, decoded and converted as that of the
// whole input.
#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <map>

#include "capture/octets.h"
#include "capture/pcapng_blocks.h"
#include "reader/Output.h"
#include "reader/Pipeline.h"
#include "reader/decode.h"
#include "reader/forms.h"
#include "reader/inputs.h"
#include "reader/json.h"
#include "reader/list.h"

namespace reader {
namespace {

constexpr std::size_t smallInput = 2048;
constexpr std::size_t placesInLarge = 500;

// What the program makes of an input.
struct Made {
    std::vector<std::string> frames;  // octets, line, decoded text and JSON of each whole frame
    std::vector<capture::Place> places;
};

class AllComposers : public Composer {
  public:
    void compose(const Seen& seen, std::string& text, Piece& piece) override {
        list_.compose(seen, text, piece);
        piece.deltaSize = 0;
        decode_.compose(seen, text, piece);
        json_.compose(seen, text, piece);
    }

  private:
    LineComposer list_{ListOptions(), false};
    LogTextComposer decode_;
    JsonComposer json_;
};

class Collector : public Consumer {
  public:
    Collector(Made& made, Consumer& writer) : made_(made), writer_(writer) {}
    void take(Chunk& chunk, std::size_t count) override {
        std::size_t begin = 0;
        for (std::size_t i = 0; i < count; ++i) {
            const Piece& piece = chunk.pieces[i];
            const Seen& seen = chunk.seen()[piece.item];
            if (seen.isFrame()) {
                made_.frames.push_back(std::string(capture::textOf(seen.frame().octets)) +
                                       chunk.text.substr(begin, piece.end - begin));
                made_.places.push_back(seen.frame().place);
            }
            begin = piece.end;
        }
        writer_.take(chunk, count);
    }
    void flush() override { writer_.flush(); }

  private:
    Made& made_;
    Consumer& writer_;
};

class Cut : public ::testing::TestWithParam<const char*> {
  protected:
    void SetUp() override {
        std::string name = ::testing::UnitTest::GetInstance()->current_test_info()->name();
        std::replace(name.begin(), name.end(), '/', '.');
        folder_ =
            std::filesystem::path(::testing::TempDir()) / ("cut." + std::to_string(getpid()) + "." + name);
        std::filesystem::create_directories(folder_);
    }
    void TearDown() override { std::filesystem::remove_all(folder_); }

    // Lists, decodes and converts a file; the capture that comes of it is `converted`.
    Made make(const std::string& input, const std::string& converted, const Form& form) {
        Made made;
        Options options;
        options.words = {input};
        const std::unique_ptr<capture::Reader> reader = openInputs(options, chatter_);
        Output out(converted);
        const auto writer = form.makeWriter(out.descriptor(), converted);
        WriterConsumer convert(*writer, form, chatter_);
        Collector collector(made, convert);
        Tracker tracker(options.input);
        Filter filter({});
        Work work;
        work.makeComposer = [] { return std::make_unique<AllComposers>(); };
        runPipeline(*reader, tracker, filter, collector, chatter_, work);
        convert.finish();
        return made;
    }

    std::string path(const std::string& name) const { return folder_ / name; }
    static std::string contents(const std::string& path) {
        std::ifstream file(path, std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

    std::filesystem::path folder_;
    Chatter chatter_{Loudness::quiet};
};

// Where the frames of a capture end, and where the lines of a text begin.
std::vector<std::size_t> boundariesOf(const std::string& whole, std::string_view form) {
    const auto sizeAt = [&](std::size_t at) {
        return capture::numberAt<std::uint32_t>(whole, at, capture::Order::little);
    };
    std::vector<std::size_t> boundaries;
    if (form == "pcap") {
        for (std::size_t at = 24; at < whole.size();)
            boundaries.push_back(at += 16 + sizeAt(at + 8));
    } else if (form == "pcapng") {
        for (std::size_t at = 0; at < whole.size(); at += sizeAt(at + 4)) {
            if (sizeAt(at) == capture::pcapng::enhancedPacket)
                boundaries.push_back(at + sizeAt(at + 4));
        }
    } else {
        boundaries.push_back(0);
        for (std::size_t at = whole.find('\n'); at != std::string::npos; at = whole.find('\n', at + 1))
            boundaries.push_back(at + 1);
    }
    return boundaries;
}

// How many frames of the whole input a piece of it must give at least: those of a text that end in front of
// the line in which the next one begins.
std::size_t leastFrames(const Made& whole, const std::vector<std::size_t>& boundaries, std::size_t size) {
    std::size_t least = 0;
    for (std::size_t i = 0; i < whole.places.size(); ++i) {
        std::size_t end = SIZE_MAX;
        if (whole.places[i].unit == capture::Place::Unit::packet)
            end = boundaries.at(i);
        else if (i + 1 < whole.places.size())
            end = boundaries.at(whole.places[i + 1].number - 1);
        if (end <= size)
            least = i + 1;
    }
    return least;
}

TEST_P(Cut, GivesEveryFrameThatIsWholeAndNoOther) {
    const std::string source = LAPDMON_SOURCE_DIR "/" + std::string(GetParam());
    for (const Form& form : forms()) {
        if (form.makeWriter == nullptr)
            continue;
        SCOPED_TRACE(form.name);
        const std::string input = path("input." + std::string(form.name));
        make(source, input, form);
        const std::string whole = contents(input);
        const Form& back = formNamed(form.name == "log" ? "pcapng" : "log");
        const Made all = make(input, path("converted"), back);
        const std::vector<std::size_t> boundaries = boundariesOf(whole, form.name);
        ASSERT_GT(all.frames.size(), 3U);
        ASSERT_EQ(leastFrames(all, boundaries, whole.size()) + (form.binary && form.name != "log" ? 0 : 1),
                  all.frames.size());
        const std::size_t places = whole.size() <= smallInput ? whole.size() : placesInLarge;
        for (std::size_t i = 1; i < places; ++i) {
            const std::size_t size = whole.size() * i / places;
            // Under the name of the whole, which stands in what is made of it.
            std::ofstream(input, std::ios::binary) << whole.substr(0, size);
            Made some;
            try {
                some = make(input, path("of-the-cut"), back);
            } catch (const capture::BadInput&) {
                // Too short to show its form.
            }
            const std::size_t least = leastFrames(all, boundaries, size);
            ASSERT_GE(some.frames.size(), least) << size;
            ASSERT_LE(some.frames.size(), all.frames.size()) << size;
            // Nobody can tell that the last of some digits are missing.
            const std::size_t same = form.name == "hex" ? least : some.frames.size();
            for (std::size_t n = 0; n < same; ++n)
                ASSERT_EQ(some.frames[n], all.frames[n]) << "cut at " << size << ", frame " << n + 1;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Inputs, Cut,
                         ::testing::Values("examples/4ess.pcap", "examples/5ess.pcap", "examples/dms100.pcap",
                                           "examples/net5.pcap", "examples/ni2.pcap", "examples/ntt.pcap",
                                           "tests/reader/data/euro-pri.hex", "tests/reader/data/euro-six.hex",
                                           "tests/reader/data/national-bri.hex",
                                           "tests/reader/data/national-pri.hex",
                                           "tests/reader/data/repeated.hex"));

}  // namespace
}  // namespace reader
