// The cursor over one frame. All decoders take the frame's octets through it, and it never passes their end.
#ifndef DECODER_CURSOR_H
#define DECODER_CURSOR_H

#include <span>

#include "vela/list.h"

namespace decoder {

// The longest frame that is decoded, in octets; and the two texts that the screen and the log show for a
// longer one.
inline constexpr int maximumFrame = 257;
inline constexpr char oversizedFrame[] = "Oversized frame, frame will not be interpreted";
inline constexpr char frameError[] = "Frame Error";

// Despite its name it never wraps around: getBlock fills it from the start, and getblockchar reads it from
// the start. The pointers of a copy point into the copy's own octets.
struct RingBuffer {
    unsigned char data[260];         // from the first octet of the layer-2 address field onward, as stored
    unsigned char* readPtr = data;   // the next octet to hand out
    unsigned char* writePtr = data;  // one past the last octet stored
    int count = 0;                   // octets stored and not yet handed out

    // The octets are not cleared, because that takes as long as decoding a short frame. Only those that were
    // stored are ever read.
    RingBuffer() {}                                         // NOLINT(*-member-init,*-equals-default)
    RingBuffer(const RingBuffer& other) { *this = other; }  // NOLINT(*-member-init)
    RingBuffer& operator=(const RingBuffer& other);
    ~RingBuffer() = default;

    // How many octets were stored, whether they have been handed out or not.
    int stored() const { return static_cast<int>(writePtr - data); }
};

// Empties the cursor and fills it with the first `len` octets, or with all of them if there are fewer. If
// `len` is above maximumFrame, writes oversizedFrame to the screen, composes it for the log, leaves the
// cursor empty and returns false.
bool getBlock(RingBuffer* rb, vela::staticList<unsigned char>& octets, int len);
bool getBlock(RingBuffer* rb, std::span<const unsigned char> octets, int len);

// Hands out the next octet. At the end of the frame it returns false and leaves *out unchanged. Decoders do
// not look at the result, so past the end of a frame they show the octet again that they read last.
inline bool getblockchar(RingBuffer* rb, unsigned char* out) {
    if (rb->count < 1 || rb->readPtr == rb->writePtr)
        return false;
    *out = *rb->readPtr++;
    --rb->count;
    return true;
}

}  // namespace decoder

#endif
