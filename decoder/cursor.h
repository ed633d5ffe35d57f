// The cursor over one frame. It alone touches the frame's octets, and it cannot pass their end.
#ifndef DECODER_CURSOR_H
#define DECODER_CURSOR_H

#include <span>

#include "vela/list.h"

namespace decoder {

// The longest frame that is decoded, in octets; and what stands for a longer one, on the screen and in the
// log.
inline constexpr int maximumFrame = 257;
inline constexpr char oversizedFrame[] = "Oversized frame, frame will not be interpreted";
inline constexpr char frameError[] = "Frame Error";

// Despite its name it never wraps: it is filled once from the start and read once from the start.
// A copy has pointers into its own octets.
struct RingBuffer {
    unsigned char data[260];         // from the first octet of the layer-2 address field onward, as stored
    unsigned char* readPtr = data;   // the next octet to hand out
    unsigned char* writePtr = data;  // one past the last octet stored
    int count = 0;                   // octets stored and not yet handed out

    // Octets that nobody stored are nobody's to read: clearing them takes as long as decoding a short frame.
    RingBuffer() {}                                         // NOLINT(*-member-init,*-equals-default)
    RingBuffer(const RingBuffer& other) { *this = other; }  // NOLINT(*-member-init)
    RingBuffer& operator=(const RingBuffer& other);
    ~RingBuffer() = default;

    // Octets stored, handed out or not.
    int stored() const { return static_cast<int>(writePtr - data); }
};

// Empties the cursor and fills it with the first `len` octets, or with as many as there are. A `len` above
// maximumFrame is refused with a line on the screen and one in the log; the cursor is then empty.
bool getBlock(RingBuffer* rb, vela::staticList<unsigned char>& octets, int len);
bool getBlock(RingBuffer* rb, std::span<const unsigned char> octets, int len);

// Hands out the next octet. At the end of the frame it returns false and leaves *out untouched; decoders
// do not look at the result, so that past the end they show once more what they read last.
inline bool getblockchar(RingBuffer* rb, unsigned char* out) {
    if (rb->count < 1 || rb->readPtr == rb->writePtr)
        return false;
    *out = *rb->readPtr++;
    --rb->count;
    return true;
}

}  // namespace decoder

#endif
