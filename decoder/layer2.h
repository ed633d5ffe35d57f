// The address and control fields of a frame (Q.921, 3.3 to 3.6).
#ifndef DECODER_LAYER2_H
#define DECODER_LAYER2_H

#include "decoder/cursor.h"

namespace decoder {

// Of the frame decoded last; a TEI-management frame leaves both 0.
inline constinit thread_local int sapi = 0;
inline constinit thread_local int tei = 0;

// Decodes both fields. What it leaves in the cursor is a layer-3 message.
void layer_2(RingBuffer* rb);

// Names a supervisory or unnumbered frame by its first control octet, and takes what belongs to it.
void con_fld_com_rep(RingBuffer* rb, unsigned char control);

}  // namespace decoder

#endif
