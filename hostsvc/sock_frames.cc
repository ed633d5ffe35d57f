// The frames of sock: a header of five big-endian words (type, transaction, the sizes of the two parts, and a
// word for the sender's own use), then the data part, then the extra part.
#include <algorithm>
#include <array>
#include <cstdlib>
#include <iostream>

#include "hostsvc/KSByteOrder.h"
#include "hostsvc/sock.h"

namespace {

constexpr int convertedSize = 24;  // octets to convert: the header, and a word that is not sent
using Header = std::array<char, convertedSize>;

// A part above msg_t::largest is read, so that the next frame is found. A part above this size is not: it is
// an attack, or the two ends have lost the boundary of frames.
constexpr std::int32_t largestRead = 10 * msg_t::largest;

bool beyondReason(const msg_t& m) { return m.size > largestRead || m.ex_size > largestRead; }

bool sendable(std::int32_t size) { return size >= 0 && size <= msg_t::largest; }

char* allocatePart(std::int32_t size) {
    if (size < 0 || size > largestRead)
        return nullptr;
    return static_cast<char*>(std::calloc(static_cast<std::size_t>(size) + 1, 1));
}

}  // namespace

long sock::snd_msg(const msg_t& m) {
    if (!sendable(m.size) || !sendable(m.ex_size) || failed())
        return -1;
    msg_t words = m;
    Header header{};
    KS_htonU32(header.data(), &words, convertedSize);
    const struct {
        const char* octets;
        long size;
    } parts[] = {{header.data(), msg_t::headerSize}, {m.data, m.size}, {m.ex_data, m.ex_size}};
    long sum = 0;
    for (const auto& part : parts) {
        const long result = writeblock(part.octets, part.size);
        if (result < 0 || failed())
            return result < 0 ? result : -1;
        sum += result;
    }
    return sum;
}

long sock::get_msg(msg_t& m) {
    m = {};
    if (failed())
        return -1;
    Header header{};
    const long missing = readblock(header.data(), msg_t::headerSize);
    if (missing < 0 || failed())
        return missing < 0 ? missing : -1;
    KS_ntohU32(&m, header.data(), convertedSize);
    if (!allocateParts(m)) {
        std::cerr << "Unable to allocate memory in get_msg" << std::endl;
        if (beyondReason(m))
            error_ = 1;
        return -1;
    }
    const long first = readblock(m.data, m.size);
    const long second = first < 0 || failed() ? 0 : readblock(m.ex_data, m.ex_size);
    if (first < 0 || second < 0)
        return std::min(first, second);
    return !failed() && m.size <= msg_t::largest && m.ex_size <= msg_t::largest ? first + second : -1;
}

bool sock::allocateParts(msg_t& m) {
    m.data = allocatePart(m.size);
    m.ex_data = allocatePart(m.ex_size);
    if (m.data != nullptr && m.ex_data != nullptr)
        return true;
    free_msg(m);
    m.data = m.ex_data = nullptr;
    return false;
}
