// The entry to the decoder: it turns a frame into text. The caller hands the text to the log (flushLines).
#ifndef DECODER_FRAME_H
#define DECODER_FRAME_H

#include "decoder/cursor.h"

namespace decoder {

// Composes the layer-2 lines (Q.921), the layer-3 lines (Q.931) when there is a message, and the hexadecimal
// dump of the first `msglen` octets, ten to a line. The cursor has handed out its octets afterwards.
void composeFrame(RingBuffer& rb);
// The same, with a cursor of its own.
void parse_isdn_frame(RingBuffer rb);

}  // namespace decoder

#endif
