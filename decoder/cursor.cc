#include "decoder/cursor.h"

#include <algorithm>
#include <iostream>

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

bool getBlock(RingBuffer* rb, vela::staticList<unsigned char>& octets, int len) {
    rb->readPtr = rb->data;
    rb->writePtr = rb->data;
    rb->count = 0;
    if (len > maximumFrame) {
        output(flag);
        std::cout << "Oversized frame, frame will not be interpreted" << std::endl;
        text("Oversized frame, frame will not be interpreted \n");
        flushLines();
        return false;
    }
    const unsigned wanted = static_cast<unsigned>(std::max(len, 0));
    const unsigned held = std::min(wanted, octets.length());
    rb->writePtr = std::copy(octets.begin(), octets.begin() + held, rb->data);
    rb->count = static_cast<int>(held);
    return true;
}

}  // namespace decoder
