// An input of any form. Whatever it is, reading ends; what is read can be written in each form; and a pcapng
// capture and a log made of it are read as what was written.
#include <algorithm>
#include <array>
#include <memory>
#include <vector>

#include "capture/Batch.h"
#include "capture/open.h"
#include "capture/pcap.h"
#include "capture/pcapng.h"
#include "capture/text_forms.h"
#include "capture/writers.h"
#include "lapdlog/LogWriter.h"
#include "lapdlog/log.h"
#include "tests/fuzz/file.h"

namespace {

using capture::Item;
using capture::Reader;

constexpr std::array forms{capture::pcapForm, capture::pcapngForm, capture::hexForm, lapdlog::logForm,
                           capture::dumpForm};

// Its reader stays: interfaces and names are that one's.
struct Read {
    std::unique_ptr<Reader> reader;
    capture::Batch items;
};

Read readAll(const fuzz::File& file) {
    Read read;
    read.reader = capture::openReader(file.path(), {}, forms);
    Item item;
    std::uint64_t place = 0;
    while (read.reader->next(item) == Reader::Next::item) {
        fuzz::require(item.frame.interface != nullptr, "an item has an interface");
        fuzz::require(item.frame.place.number >= place, "places do not go back");
        place = item.frame.place.number;
        read.items.add(item);
    }
    fuzz::require(read.reader->next(item) == Reader::Next::end, "the end is the end");
    return read;
}

using Make = std::unique_ptr<capture::Writer> (*)(int file, const std::string& name);

void write(const Read& read, Make make, const fuzz::File& into) {
    into.empty();
    const auto writer = make(into.descriptor(), "written");
    for (const Item& item : read.items.items())
        writer->write(item);
    writer->finish();
}

std::vector<Item> framesOf(const Read& read, bool (*counts)(const Item&)) {
    std::vector<Item> frames;
    for (const Item& item : read.items.items()) {
        if (item.isFrame() && counts(item))
            frames.push_back(item);
    }
    return frames;
}

void compare(const Read& written, const Read& read, bool (*counts)(const Item&)) {
    const std::vector<Item> before = framesOf(written, counts);
    const std::vector<Item> after = framesOf(read, counts);
    fuzz::require(before.size() == after.size(), "each frame comes back");
    for (std::size_t i = 0; i < before.size(); ++i) {
        const capture::Frame& a = before[i].frame;
        const capture::Frame& b = after[i].frame;
        fuzz::require(std::ranges::equal(a.octets, b.octets) && a.transmitted == b.transmitted,
                      "a frame comes back as it was");
    }
}

void takeThrough(const Read& read) {
    static fuzz::File written;
    for (const Make make : {Make(capture::makePcapWriter), Make(capture::makeHexWriter)})
        write(read, make, written);
    if (read.items.empty())
        return;
    write(read, capture::makePcapngWriter, written);
    compare(read, readAll(written), [](const Item&) { return true; });
    const auto fits = [](const Item& item) { return item.frame.octets.size() <= 257; };
    if (framesOf(read, fits).empty())
        return;
    write(
        read, [](int file, const std::string& name) { return lapdlog::makeLogWriter(file, name); }, written);
    compare(read, readAll(written), fits);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static fuzz::File file;
    file.hold(data, size);
    try {
        takeThrough(readAll(file));
    } catch (const capture::BadInput& error) {
        fuzz::require(std::string_view(error.what()).starts_with(file.path() + ": "),
                      "a report names the file");
    }
    return 0;
}
