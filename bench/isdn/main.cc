// What it costs to take frames apart: a call of a trunk, from SETUP to RELEASE COMPLETE, with its
// acknowledgements and polls. What is counted is frames.
//
//     bench-isdn [--benchmark_filter=REGEX] ...
#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include "isdn/Field.h"
#include "isdn/values.h"
#include "isdn/words.h"
#include "tests/isdn/hex.h"

namespace {

using namespace isdn;

using Frames = std::vector<std::vector<std::uint8_t>>;

const Frames& call() {
    static const Frames frames = [] {
        Frames made;
        for (const char* frame :
             {"0001a4b80802003e0504038090a21803a983856c0c2180383031383032333030307008c133373339313230",
              "000101a6", "0201b8a60802803e021803a98385", "020101ba", "0201baa60802803e011e028288",
              "020101bc", "0201bca60802803e07", "020101be", "0001a6be0802003e0f", "000101a8",
              "0001a8be0802003e4508028a90", "000101aa", "0201beaa0802803e4d", "020101c0",
              "0001aac00802003e5a", "000101ac", "020101ad", "020101c1"})
            made.push_back(isdn::testing::hex(frame));
        return made;
    }();
    return frames;
}

template <typename Work>
void eachFrame(benchmark::State& state, Work work) {
    const Frames& frames = call();
    for (auto _ : state) {
        for (const auto& octets : frames)
            work(octets);
    }
    state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(frames.size()));
}

// Link header, message header, and where each element stands.
void headersAndSpans(benchmark::State& state) {
    eachFrame(state, [](const std::vector<std::uint8_t>& octets) {
        const Layer2 frame = parseLayer2(octets);
        benchmark::DoNotOptimize(&frame);
        if (!frame.carriesMessage())
            return;
        const Layer3 message = parseLayer3(frame.information);
        for (const Element& element : message.elements)
            benchmark::DoNotOptimize(&element);
    });
}

// The words for one line of a list.
void words(benchmark::State& state) {
    std::string line;
    eachFrame(state, [&](const std::vector<std::uint8_t>& octets) {
        line.clear();
        const Layer2 frame = parseLayer2(octets);
        if (frame.carriesMessage())
            appendWords(line, parseLayer3(frame.information), Variant::ni2, Sender::network);
        benchmark::DoNotOptimize(line.data());
    });
}

// Every field of every element, as for JSON.
void everyField(benchmark::State& state) {
    Fields fields;
    eachFrame(state, [&](const std::vector<std::uint8_t>& octets) {
        fields.clear();
        const Layer2 frame = parseLayer2(octets);
        fieldsOf(frame, fields);
        if (!frame.carriesMessage())
            return;
        const Layer3 message = parseLayer3(frame.information);
        fieldsOf(message, fields);
        for (const Element& element : message.elements)
            fieldsOf(element, Variant::ni2, fields);
        benchmark::DoNotOptimize(fields.size());
    });
}

}  // namespace

BENCHMARK(headersAndSpans);
BENCHMARK(words);
BENCHMARK(everyField);
BENCHMARK_MAIN();
