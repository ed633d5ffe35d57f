#include "decoder/frame.h"

#include <algorithm>

#include "decoder/layer2.h"
#include "decoder/layer3.h"
#include "decoder/lines.h"

namespace decoder {

namespace {

void hexDump(const RingBuffer& rb) {
    line("Hex Dump: ");
    output(flag);
    const int length = std::min(msglen, rb.stored());
    int column = 0;
    for (int i = 0; i < length; ++i) {
        if (column == 10) {
            text("\n");
            output(flag);
            column = 0;
        }
        text(hex(rb.data[i]), " ");
        ++column;
    }
    text("\n");
}

}  // namespace

void composeFrame(RingBuffer& rb) {
    layer_2(&rb);
    if (rb.count > 0)
        layer_3(&rb);
    hexDump(rb);
}

void parse_isdn_frame(RingBuffer rb) { composeFrame(rb); }

}  // namespace decoder
