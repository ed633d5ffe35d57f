#include "decoder/cursor.h"

#include <algorithm>

#include "decoder/lines.h"

namespace decoder {

RingBuffer& RingBuffer::operator=(const RingBuffer& other) {
    if (this != &other) {
        std::copy_n(other.data, other.stored(), data);
        readPtr = data + (other.readPtr - other.data);
        writePtr = data + (other.writePtr - other.data);
        count = other.count;
    }
    return *this;
}

bool getBlock(RingBuffer* rb, std::span<const unsigned char> octets, int len) {
    rb->readPtr = rb->data;
    rb->writePtr = rb->data;
    rb->count = 0;
    if (len > maximumFrame) {
        output(flag);
        writeScreen(oversizedFrame);
        text(oversizedFrame, " \n");
        return false;
    }
    const std::size_t held = std::min(static_cast<std::size_t>(std::max(len, 0)), octets.size());
    rb->writePtr = std::copy_n(octets.begin(), held, rb->data);
    rb->count = static_cast<int>(held);
    return true;
}

bool getBlock(RingBuffer* rb, vela::staticList<unsigned char>& octets, int len) {
    return getBlock(rb, std::span<const unsigned char>(octets.begin(), octets.length()), len);
}

}  // namespace decoder
