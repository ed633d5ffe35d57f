// The address and control fields of a frame (Q.921, 3.3 to 3.6).
#ifndef DECODER_LAYER2_H
#define DECODER_LAYER2_H

#include "decoder/cursor.h"

namespace decoder {

// SAPI and TEI of the frame that this thread decoded last; both are 0 after a TEI-management frame.
inline constinit thread_local int sapi = 0;
inline constinit thread_local int tei = 0;

// Decodes both fields. The octets that it leaves in the cursor are decoded as a layer-3 message.
void layer_2(RingBuffer* rb);

// Writes the name of a supervisory or unnumbered frame. `control` is its first control octet, which has been
// taken already; takes the second one of a supervisory frame, and the fields of a TEI-management frame.
void con_fld_com_rep(RingBuffer* rb, unsigned char control);

}  // namespace decoder

#endif
