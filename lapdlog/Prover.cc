#include "lapdlog/Prover.h"

#include <algorithm>
#include <cstring>

#include "capture/hex_digits.h"
#include "decoder/cursor.h"
#include "decoder/frame.h"
#include "decoder/lines.h"
#include "lapdlog/variants.h"

namespace lapdlog {

namespace {

constexpr std::string_view indent(decoder::indent, decoder::indentSize);
constexpr std::string_view dumpTitle = "Hex Dump: \n";

// A frame of 257 octets has room for 23 titles of dumps in its texts.
constexpr int mostDumps = 32;
// The longest text that a frame can make (docs/internals/decisions.md).
constexpr std::size_t longestText = 1'180'000;

std::size_t findDump(std::string_view text, std::size_t from) {
    const void* const found =
        memmem(text.data() + from, text.size() - from, dumpTitle.data(), dumpTitle.size());
    return found == nullptr ? std::string_view::npos
                            : static_cast<std::size_t>(static_cast<const char*>(found) - text.data());
}

// Reads the line that an oversized frame has instead of layers and dump.
Reading readOversized(std::string_view text, bool transmitted, std::size_t& size) {
    const std::string_view before = transmitted ? indent : std::string_view();
    return readPieces(text, {before, decoder::oversizedFrame, " \n", before, decoder::frameError, " \n"},
                      size);
}

}  // namespace

// Reads the octets after a dump's title, and moves `at` past them.
Prover::Dump Prover::readDump(std::string_view text, std::size_t& at, bool transmitted) {
    constexpr std::size_t octetsInLine = 10;
    constexpr std::size_t octetSize = 3;
    const std::string_view before = transmitted ? indent : std::string_view();
    octets_.clear();
    while (true) {
        const std::string_view line = text.substr(at);
        if (!line.starts_with(before)) {
            const bool isShort = before.starts_with(line);
            if (octets_.empty())
                return isShort ? Dump::cut : Dump::bad;
            return isShort ? Dump::wholeSoFar : Dump::whole;
        }
        std::size_t in = before.size();
        std::size_t count = 0;
        for (; count < octetsInLine && line.size() - in >= octetSize; ++count, in += octetSize) {
            const int high = capture::hexValue(line[in]);
            const int low = capture::hexValue(line[in + 1]);
            if ((high | low) < 0 || line[in + 2] != ' ')
                break;
            octets_.push_back(static_cast<std::uint8_t>(high << 4 | low));
        }
        const bool isShort = line.size() - in < octetSize && line.find('\n') == std::string_view::npos;
        if (count == 0 && !octets_.empty())  // the line before was the last
            return isShort ? Dump::wholeSoFar : Dump::whole;
        if (isShort)
            return Dump::cut;
        if (line[in] != '\n')
            return Dump::bad;
        at += in + 1;
        if (count < octetsInLine || octets_.size() > decoder::maximumFrame)
            return Dump::whole;
        if (at == text.size())
            return Dump::wholeSoFar;
    }
}

// The text of octets_, valid until the next call.
std::string_view Prover::decode(bool transmitted, capture::Variant variant) {
    decoder::flag = transmitted ? 0 : 1;
    decoder::swit = switOf(variant);
    decoder::msglen = static_cast<int>(octets_.size());
    decoder::lineBuffer.clear();
    decoder::RingBuffer frame;
    decoder::getBlock(&frame, octets_, decoder::msglen);
    decoder::composeFrame(frame);
    const std::string_view text = decoder::lineBuffer.composed();
    decoder::lineBuffer.clear();
    return text;
}

Prover::Proof Prover::prove(std::string_view text, bool transmitted, capture::Variant variant, bool isAll,
                            std::size_t untitled) {
    Proof proof;
    proof.reading = readOversized(text, transmitted, proof.size);
    proof.isOversized = proof.reading == Reading::good;
    if (proof.reading == Reading::good)
        return proof;
    std::size_t at = findDump(text, std::min(untitled, text.size()));
    proof.untitled =
        at != std::string_view::npos ? at : text.size() - std::min(text.size(), dumpTitle.size() - 1);
    int dumps = 0;
    for (; at != std::string_view::npos && dumps < mostDumps; at = findDump(text, at + 1), ++dumps) {
        std::size_t end = at + dumpTitle.size();
        const Dump dump = readDump(text, end, transmitted);
        proof.sawDump = proof.sawDump || dump == Dump::whole || dump == Dump::wholeSoFar;
        proof.octets =
            dump == Dump::cut ? std::span<const std::uint8_t>(octets_) : std::span<const std::uint8_t>();
        const bool isWhole = dump == Dump::whole || dump == Dump::wholeSoFar;
        if (!isWhole || octets_.size() > decoder::maximumFrame)
            continue;
        const std::string_view decoded = decode(transmitted, variant);
        if (decoded.size() == end && decoded == text.substr(0, end))
            return {Reading::good, false, dump == Dump::wholeSoFar, true, end, proof.untitled, octets_};
    }
    const bool canCome = dumps < mostDumps && text.size() < longestText;
    proof.reading = canCome && !isAll ? Reading::cut : Reading::bad;
    return proof;
}

}  // namespace lapdlog
