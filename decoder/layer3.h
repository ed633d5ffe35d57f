// The message header (Q.931, 4.2 to 4.4), the walk over the information elements, and codeset shifts (4.5.2
// to 4.5.4).
#ifndef DECODER_LAYER3_H
#define DECODER_LAYER3_H

#include "decoder/cursor.h"

namespace decoder {

inline constinit thread_local int prtcol_discr = 0;  // protocol discriminator of the message being decoded
inline constinit thread_local int Lock_shift = 0;    // 1 after a locking shift to codeset 6 in this message

// Decodes a whole message: the header, then elements to the end of the frame.
void layer_3(RingBuffer* rb);
void call_reference(RingBuffer* rb);
void message_type(RingBuffer* rb);

// Takes an element's identifier, writes the indent of its first line and runs its decoder.
void ie_id(RingBuffer* rb);

// Codeset shifts: locking to 6 (for the rest of the message), locking to 7 (shown on 4ESS only, without
// effect), and non-locking (for one element).
void codeset6(unsigned char id);
void codeset7(unsigned char id);
void non_locking_shift(unsigned char id, RingBuffer* rb);

// Takes one element of codeset 6, identifier included, and shows its length and octets without their meaning.
void ie_codeset6(RingBuffer* rb);

// Elements of one octet, the identifier.
void moredata(unsigned char id);
void sending_complete(unsigned char id);
void congestion_level(unsigned char id);

}  // namespace decoder

#endif
