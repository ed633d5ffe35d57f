#include "decoder/lines.h"

#include <algorithm>
#include <iostream>
#include <memory>

namespace decoder {

namespace {

// An ordinary frame makes about 2 kB of text, the longest possible one some hundred kB.
constexpr std::size_t firstCapacity = 65536;

// Writes no dash when the count is below 1.
void dashes(long long count) {
    for (; count > 0; --count)
        text('-');
}

// Owns the memory of this thread's lineBuffer.
thread_local std::unique_ptr<char[]> memory;

}  // namespace

void LineBuffer::grow(std::size_t n) {
    const std::string_view kept = composed();
    const std::size_t capacity = std::max(firstCapacity, 2 * (kept.size() + n));
    auto grown = std::make_unique_for_overwrite<char[]>(capacity);
    at_ = std::copy(kept.begin(), kept.end(), grown.get());
    end_ = grown.get() + capacity;
    begin_ = grown.get();
    memory = std::move(grown);
}

void flushLines() {
    const std::string_view composed = lineBuffer.composed();
    if (file_output && ofp != nullptr && !composed.empty())
        writeLog(composed);
    lineBuffer.clear();
}

// A write that fails sets the stream's error indicator. The owner of the stream looks at it.
void writeToStream(std::string_view composed) { (void)std::fwrite(composed.data(), 1, composed.size(), ofp); }

void writeToStandardOutput(std::string_view line) { std::cout << line << std::endl; }

void bitwise(int value, int high, int low) {
    output(flag);
    if (1 <= low && low <= high && high <= 8) {
        text(Bits{value, high, low});
        return;
    }
    text("      ");
    dashes(8LL - high);
    for (int position = std::min(high, 8); position >= std::max(low, 1); --position)
        text(((value >> (position - 1)) & 1) != 0 ? '1' : '0');
    dashes(low - 1LL);
}

}  // namespace decoder
