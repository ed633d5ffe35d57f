#include "decoder/layer2.h"

#include "decoder/dispatch.h"
#include "decoder/lines.h"

namespace decoder {

namespace {

// The fields of a TEI-management message (Q.921, 5.3.1). The second octet of the reference number is written
// without a leading zero, on purpose.
void managementLines(RingBuffer* rb) {
    unsigned char octet = 0;
    getblockchar(rb, &octet);
    line("    0x", hex(octet), "  Layer ME ID");
    output(flag);
    getblockchar(rb, &octet);
    text("    0x", hex(octet));
    getblockchar(rb, &octet);
    text(hexUnpadded(octet), " Reference Number\n");
    getblockchar(rb, &octet);
    line("    0x", hex(octet), " Message ID");
    getblockchar(rb, &octet);
    line("    0x", hex(octet), " Action ID");
    tei = 0;
    sapi = 0;
}

}  // namespace

// `octet` keeps the octet that was read last. So a frame that ends before its control field is classified by
// its last octet.
void layer_2(RingBuffer* rb) {
    unsigned char octet = 0;
    if (!getblockchar(rb, &octet))
        return;
    sapi = octet >> 2;
    if ((octet & 0x02) != 0)
        line("Command=1   SAPI=0x", hex(sapi));
    else
        line("Response=0    SAPI=0x", hex(sapi));
    if (getblockchar(rb, &octet)) {
        tei = octet >> 1;
        line("TEI=0x", hex(tei));
    }
    getblockchar(rb, &octet);
    output(flag);
    if ((octet & 0x01) != 0) {
        con_fld_com_rep(rb, octet);
        return;
    }
    text("0x", hex(octet), " ");
    getblockchar(rb, &octet);
    text("0x", hex(octet), "  Information\n");
}

// `octet` is a variable of its own, so a supervisory frame that ends after its first control octet shows 0 as
// the second.
void con_fld_com_rep(RingBuffer* rb, unsigned char control) {
    const FrameName& frame = frameName(control);
    unsigned char octet = 0;
    switch (frame.kind) {
        case FrameKind::none:
            break;
        case FrameKind::supervisory:
            text("0x", hex(control), " ");
            getblockchar(rb, &octet);
            text("0x", hex(octet), "  ", frame.name, "\n");
            break;
        case FrameKind::unnumbered:
        case FrameKind::unnumberedInformation:
            text("    0x", hex(control), "  ", frame.name, "\n");
            if (frame.kind == FrameKind::unnumberedInformation && tei == 127 && sapi == 63)
                managementLines(rb);
            break;
    }
}

}  // namespace decoder
