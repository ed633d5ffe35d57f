// What a list and call control ask of each frame takes no memory. A program of its own, for its operator new
// counts.
#include <gtest/gtest.h>

#include <cstdlib>
#include <new>
#include <vector>

#include "isdn/Layer2.h"
#include "isdn/Layer3.h"
#include "isdn/values.h"
#include "isdn/words.h"
#include "tests/isdn/hex.h"

namespace {

unsigned long allocations = 0;

using namespace isdn;

// A SETUP with shift, a DISCONNECT, a RESTART, a poll, a TEI message.
const std::vector<std::vector<std::uint8_t>>& frames() {
    static const std::vector<std::vector<std::uint8_t>> made = {
        isdn::testing::hex(
            "0001a4b80802003e0504038090a21803a983856c0c2180383031383032333030307008c133373339313230962d0101"),
        isdn::testing::hex("0001a8be0802003e4508028a90"),
        isdn::testing::hex("0001000008020000461803a98385790180"),
        isdn::testing::hex("020101a5"),
        isdn::testing::hex("feff030f12340183"),
    };
    return made;
}

std::size_t parse(const std::vector<std::uint8_t>& octets, std::string& line) {
    const Layer2 frame = parseLayer2(octets);
    if (frame.carriesTeiMessage()) {
        appendWords(line, parseTeiMessage(frame.information));
        return 0;
    }
    if (!frame.carriesMessage())
        return 0;
    std::size_t found = 0;
    const Layer3 message = parseLayer3(frame.information);
    for (const Element& element : message.elements) {
        found += partyNumber(element).has_value() ? 1U : 0U;
        found += channelId(element).has_value() ? 1U : 0U;
        found += cause(element).has_value() ? 1U : 0U;
        found += restartClass(element).has_value() ? 1U : 0U;
    }
    found += message.elements.find(element::cause).octets.empty() ? 0U : 1U;
    appendWords(line, message, Variant::ni2, Sender::network);
    return found;
}

TEST(Parsing, AllocatesNothing) {
    std::string line;
    line.reserve(1000);
    ASSERT_FALSE(frames().empty());
    const unsigned long before = allocations;
    std::size_t found = 0;
    for (const auto& frame : frames()) {
        line.clear();
        found += parse(frame, line);
    }
    EXPECT_EQ(allocations, before);
    EXPECT_EQ(found, 7U);
}

}  // namespace

// Not inlined, where the compiler would see new and free side by side.
[[gnu::noinline]] void* operator new(std::size_t size) {
    ++allocations;
    void* const memory = std::malloc(size);  // NOLINT(*-no-malloc): this is what new stands on
    if (memory == nullptr)
        throw std::bad_alloc();
    return memory;
}
[[gnu::noinline]] void operator delete(void* memory) noexcept { std::free(memory); }  // NOLINT(*-no-malloc)
[[gnu::noinline]] void operator delete(void* memory, std::size_t) noexcept { operator delete(memory); }
