// Damaged frames: every golden input cut at each length and with its octets changed, on every trunk. The
// decoder returns, shows a bounded text, stays inside the frame and leaves the program-wide words alone.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <memory>
#include <set>
#include <sstream>
#include <tuple>

#include "capture.h"
#include "decoder/layer2.h"
#include "decoder/layer3.h"
#include "decoder/lines.h"
#include "decoder/state.h"
#include "golden_cases.h"

#if defined(__SANITIZE_ADDRESS__)
#include <sanitizer/asan_interface.h>
#else
#define ASAN_POISON_MEMORY_REGION(address, size) (static_cast<void>(address), static_cast<void>(size))
#define ASAN_UNPOISON_MEMORY_REGION(address, size) (static_cast<void>(address), static_cast<void>(size))
#endif

namespace {

using decoder::RingBuffer;
using golden::Octets;

// The longest text that one frame can become. Everything shown follows an attempt to take an octet:
// - At most 257 attempts succeed, one for each octet of the frame.
// - The walk over the elements ends when the cursor is empty, so attempts fail only in the part that was
//   being decoded when the frame ended. The longest of all is a network-specific facility: length, octet 3,
//   256 octets of identification (one more than announced), octet 4 and 253 more; with the message header in
//   front, at most 520.
// - One attempt shows at most 12 lines (low layer compatibility: octet 5b with 7, and 4 more as octet 5c).
// - One line has at most 33 blanks of indent twice (a header line left out) and 60 characters more.
// The dump adds 4 characters for an octet and 34 for each line of ten.
constexpr std::size_t maximumAttempts = decoder::maximumFrame + 520;
constexpr std::size_t maximumLinesAnAttempt = 12;
constexpr std::size_t maximumLine = 2 * 33 + 60;
constexpr std::size_t maximumText = maximumAttempts * maximumLinesAnAttempt * maximumLine;
constexpr std::size_t maximumDump = std::size_t{decoder::maximumFrame} * 4 + std::size_t{28} * 34 + 64;

// A single element longer than this is a short beginning and one long loop over alike octets. Of those, the
// beginning and the last octets take every value; the octets between take the few at which something changes.
constexpr std::size_t longInput = 64;
constexpr std::size_t wholeBeginning = 16;
constexpr std::size_t wholeEnd = 2;
constexpr unsigned char edges[] = {0x00, 0x7F, 0x80, 0xFF};

// One element in a frame: a link header, a message header, SETUP.
const Octets frameStart{0x02, 0x01, 0x00, 0x00, 0x08, 0x01, 0x01, 0x05};

struct Input {
    golden::ElementDecoder decode = nullptr;  // no identifier reaches it; otherwise a whole frame
    Octets octets;
    std::size_t firstChanged = 0;  // frameStart is changed once, in the frames, and not for each element

    bool operator<(const Input& other) const {
        return std::tie(decode, octets, firstChanged) <
               std::tie(other.decode, other.octets, other.firstChanged);
    }
};

Input inputOf(const golden::Case& kase, const Octets& octets) {
    Input input;
    input.decode = kase.directDecoder;
    std::size_t ahead = 0;
    if (kase.kind == golden::Kind::element)
        ahead = frameStart.size();
    else if (kase.kind == golden::Kind::message)
        ahead = 4;
    input.octets.assign(frameStart.begin(), frameStart.begin() + static_cast<std::ptrdiff_t>(ahead));
    input.octets.insert(input.octets.end(), octets.begin(), octets.end());
    input.octets.resize(std::min<std::size_t>(input.octets.size(), decoder::maximumFrame));
    input.firstChanged = ahead;
    return input;
}

// An element whose decoder is called itself, or a whole one in a frame, which reaches the end of the input.
bool isOneLongElement(const Input& input) {
    const std::size_t size = input.octets.size();
    if (size <= longInput || input.decode != nullptr)
        return size > longInput;
    const std::size_t id = input.firstChanged;
    return id == frameStart.size() && input.octets[id] < 0x80 && id + 2 + input.octets[id + 1] >= size;
}

// Each input once, whatever number of cases show it.
const std::set<Input>& inputs() {
    static const std::set<Input> all = [] {
        std::set<Input> distinct;
        for (const std::string& name : golden::names()) {
            for (const golden::Case& kase : golden::read(name).cases) {
                for (const Octets& octets : kase.octets)
                    distinct.insert(inputOf(kase, octets));
            }
        }
        return distinct;
    }();
    return all;
}

// A cursor of its own on the heap, in which what is behind the frame must not be touched.
class FencedCursor {
  public:
    FencedCursor() = default;
    ~FencedCursor() { open(); }
    FencedCursor(const FencedCursor&) = delete;
    FencedCursor& operator=(const FencedCursor&) = delete;

    RingBuffer& fill(const unsigned char* octets, std::size_t size) {
        open();
        std::copy_n(octets, size, rb_->data);
        rb_->readPtr = rb_->data;
        rb_->writePtr = rb_->data + size;
        rb_->count = static_cast<int>(size);
        ASAN_POISON_MEMORY_REGION(rb_->data + size, room - size);
        return *rb_;
    }

  private:
    // Up to the pointers; they must not be fenced.
    static constexpr std::size_t room = offsetof(RingBuffer, readPtr);

    void open() { ASAN_UNPOISON_MEMORY_REGION(rb_->data, room); }

    const std::unique_ptr<RingBuffer> rb_ = std::make_unique<RingBuffer>();
};

std::string hexOf(const unsigned char* octets, std::size_t size) {
    std::ostringstream out;
    for (std::size_t i = 0; i < size; ++i)
        out << " "
            << "0123456789ABCDEF"[octets[i] >> 4] << "0123456789ABCDEF"[octets[i] & 15];
    return out.str();
}

#if defined(__SANITIZE_ADDRESS__)
TEST(FencedCursorDeathTest, AnOctetBehindTheFrameCannotBeRead) {
    const Octets octets(5, 0xA1);
    FencedCursor cursor;
    const RingBuffer& rb = cursor.fill(octets.data(), octets.size());
    EXPECT_EQ(rb.data[4], 0xA1);
    EXPECT_DEATH(std::fputc(rb.data[5], stderr), "use-after-poison");
}
#endif

class DamagedFrames : public testing::TestWithParam<golden::Trunk> {
  protected:
    void SetUp() override {
        decoder::flushLines();
        decoder::swit = GetParam().variant;
    }

    void TearDown() override { decoder::flushLines(); }

    // Decodes `size` octets and says what is wrong afterwards. Plain comparisons: this runs millions of
    // times.
    void decode(golden::ElementDecoder direct, const unsigned char* octets, std::size_t size, int flag) {
        decoder::flag = flag;
        RingBuffer& rb = cursor_.fill(octets, size);
        if (direct != nullptr) {
            unsigned char id = 0;
            decoder::getblockchar(&rb, &id);
            direct(id, &rb);
        } else {
            decoder::layer_2(&rb);
            if (rb.count > 0)
                decoder::layer_3(&rb);
        }
        const std::size_t shown = decoder::lineBuffer.composed().size();
        longest_ = std::max(longest_, shown);
        const bool whole = direct != nullptr || rb.count == 0;
        const bool inside = rb.readPtr >= rb.data && rb.readPtr <= rb.writePtr &&
                            rb.writePtr == rb.data + size && rb.count == rb.writePtr - rb.readPtr;
        const bool untouched = decoder::flag == flag && decoder::swit == GetParam().variant;
        if (shown > maximumText || !whole || !inside || !untouched)
            ADD_FAILURE() << "shown " << shown << ", left " << rb.count << ", flag " << decoder::flag
                          << ", swit " << decoder::swit << ":" << hexOf(octets, size);
        decoder::lineBuffer.clear();
        ++decoded_;
    }

    void expectOctetTaken(void (*walk)(RingBuffer*), const Octets& octets, int flag) {
        decoder::flag = flag;
        RingBuffer& rb = cursor_.fill(octets.data(), octets.size());
        walk(&rb);
        EXPECT_LT(rb.count, static_cast<int>(octets.size())) << hexOf(octets.data(), octets.size());
        EXPECT_EQ(decoder::flag, flag) << hexOf(octets.data(), octets.size());
        EXPECT_EQ(decoder::swit, GetParam().variant) << hexOf(octets.data(), octets.size());
        EXPECT_LE(decoder::lineBuffer.composed().size(), maximumText);
        decoder::lineBuffer.clear();
    }

    void changeOctet(const Input& input, Octets& changed, std::size_t at) {
        const std::size_t size = input.octets.size();
        const bool every = !isOneLongElement(input) || at < wholeBeginning || at + wholeEnd >= size;
        if (every) {
            for (int value = 0; value < 256; ++value) {
                changed[at] = static_cast<unsigned char>(value);
                decode(input.decode, changed.data(), size, 1);
            }
        } else {
            for (const unsigned char value : edges) {
                changed[at] = value;
                decode(input.decode, changed.data(), size, 1);
            }
        }
        changed[at] = input.octets[at];
    }

    FencedCursor cursor_;
    std::size_t longest_ = 0;
    std::size_t decoded_ = 0;
};

TEST_P(DamagedFrames, AreDecodedWithinBoundsWhereverTheyAreCut) {
    for (const Input& input : inputs()) {
        for (std::size_t size = 0; size <= input.octets.size(); ++size) {
            decode(input.decode, input.octets.data(), size, 0);
            decode(input.decode, input.octets.data(), size, 1);
        }
    }
    EXPECT_GT(decoded_, 2 * inputs().size());
    EXPECT_GT(longest_, 0U);
}

TEST_P(DamagedFrames, AreDecodedWithinBoundsWhateverAnOctetIsChangedTo) {
    for (const Input& input : inputs()) {
        Octets changed = input.octets;
        for (std::size_t at = input.firstChanged; at < changed.size(); ++at)
            changeOctet(input, changed, at);
    }
    EXPECT_GT(decoded_, 256 * inputs().size());
    EXPECT_GT(longest_, 0U);
}

// Through the entry that the display thread uses: what is shown ends with the whole dump and one line end.
TEST_P(DamagedFrames, EndWithTheirDumpWhereverTheyAreCut) {
    for (const Input& input : inputs()) {
        if (input.decode != nullptr)
            continue;
        for (std::size_t size = 0; size <= input.octets.size(); ++size) {
            const Octets cut(input.octets.begin(), input.octets.begin() + static_cast<std::ptrdiff_t>(size));
            for (const int flag : {0, 1}) {
                const std::string text = decoder::testing::decoded(cut, GetParam().variant, flag);
                const std::size_t dump = text.rfind("Hex Dump: \n");
                ASSERT_NE(dump, std::string::npos) << hexOf(cut.data(), size);
                const std::size_t lines = size == 0 ? 2 : 1 + (size + 9) / 10;
                EXPECT_EQ(static_cast<std::size_t>(
                              std::count(text.begin() + static_cast<std::ptrdiff_t>(dump), text.end(), '\n')),
                          lines)
                    << hexOf(cut.data(), size);
                EXPECT_EQ(text.back(), '\n');
                EXPECT_LE(text.size(), maximumText + maximumDump);
            }
        }
    }
}

// Whatever follows an identifier, one pass takes at least the identifier itself: so the walk over the
// elements ends.
TEST_P(DamagedFrames, LoseAtLeastOneOctetWithEveryIdentifier) {
    for (int id = 0; id < 256; ++id) {
        for (const unsigned char rest : {0x00, 0x01, 0x7F, 0x80, 0xFF}) {
            for (const std::size_t size : {1, 2, 3, 16, 257}) {
                Octets octets{static_cast<unsigned char>(id)};
                octets.resize(size, rest);
                for (const int flag : {0, 1}) {
                    expectOctetTaken(decoder::ie_id, octets, flag);
                    expectOctetTaken(decoder::ie_codeset6, octets, flag);
                }
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Decoder, DamagedFrames, testing::ValuesIn(golden::trunks),
                         [](const auto& trunk) { return "on_" + std::string(trunk.param.name); });

}  // namespace
