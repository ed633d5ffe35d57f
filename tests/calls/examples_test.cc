// What the examples' own events may show, and nothing else: the finding of each, and where it stands.
#include <gtest/gtest.h>

#include "calls/Analysis.h"
#include "capture/open.h"

namespace {

struct Example {
    const char* name;
    capture::Variant variant;
    const char* finds;  // "severity identifier frame", a line each
    unsigned calls;
};

constexpr Example examples[] = {
    {"4ess", capture::Variant::att4ess, "", 6},
    // The first SABME is refused, before the far end is ready; a terminal gets no TEI, and all TEIs are
    // removed.
    {"5ess", capture::Variant::ess5, "warning link-refused 2\nwarning tei-denied 68\nnote tei-removed 69\n",
     4},
    {"dms100", capture::Variant::dms100, "", 5},
    // TEI management on a primary rate.
    {"net5", capture::Variant::net5, "note tei-assigned 92\n", 6},
    // A primary rate and a basic access in one file.
    {"ni2", capture::Variant::ni2, "note tei-assigned 64\n", 5},
    {"ntt", capture::Variant::ntt, "note tei-assigned 58\nnote tei-removed 61\n", 4},
};

class Heard : public calls::Listener {
  public:
    void gone(const calls::Call& /*call*/) override { ++calls; }
    void found(const calls::Finding& finding) override {
        finds.append(nameOf(finding.severity)).append(" ").append(finding.kind->id);
        finds += " " + std::to_string(finding.frame) + "\n";
    }
    std::string finds;
    unsigned calls = 0;
};

TEST(Examples, ShowTheirEventsAndNoFault) {
    for (const Example& example : examples) {
        Heard heard;
        calls::Analysis analysis({}, heard);
        capture::ReadOptions options;
        options.variant = example.variant;
        const std::unique_ptr<capture::Reader> reader = capture::openReader(
            std::string(LAPDMON_SOURCE_DIR "/examples/") + example.name + ".pcap", options, capture::forms());
        capture::Item item;
        for (std::uint64_t number = 0; reader->next(item) == capture::Reader::Next::item;)
            if (item.isFrame())
                analysis.take(item.frame, ++number);
        analysis.finish();
        EXPECT_EQ(heard.finds, example.finds) << example.name;
        EXPECT_EQ(heard.calls, example.calls) << example.name;
    }
}

}  // namespace
