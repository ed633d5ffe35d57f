#include "decoder/layer3.h"

#include <string_view>

#include "decoder/dispatch.h"
#include "decoder/element.h"
#include "decoder/lines.h"

namespace decoder {

void layer_3(RingBuffer* rb) {
    unsigned char octet = 0;
    getblockchar(rb, &octet);
    prtcol_discr = octet;
    output(flag);
    text("PD=0x", hex(octet), " ");
    call_reference(rb);
    message_type(rb);
    Lock_shift = 0;
    while (rb->count > 0) {
        if (Lock_shift == 1)
            ie_codeset6(rb);
        else
            ie_id(rb);
    }
}

// The one-octet form has no blank before CR, on purpose. For any other length than 1 or 2, for example the
// dummy call reference, nothing is written and no value is taken; the message type then follows in the same
// line.
void call_reference(RingBuffer* rb) {
    unsigned char value = 0;
    getblockchar(rb, &value);
    const unsigned char length = value;
    if (length != 1 && length != 2)
        return;
    getblockchar(rb, &value);
    if ((value & 0x80) != 0)
        text("Orig=1");
    else
        text("Dest=0");
    if (length == 1) {
        text("CR=0x", hex(value), "\n");
        return;
    }
    text(" CR=0x", hex(value));
    getblockchar(rb, &value);
    text(hex(value), "\n");
}

void message_type(RingBuffer* rb) {
    unsigned char type = 0;
    getblockchar(rb, &type);
    output(flag);
    const bool maintenance = prtcol_discr == 0x03 || prtcol_discr == 0x43;
    const std::string_view name = maintenance ? maintenanceMessageName(type) : messageName(type);
    if (!name.empty())
        text(name, "(0x", hex(type), ")\n");
    else if (!maintenance)
        text("Unknown Message Type: 0x", hex(type), "\n");
}

namespace {

// An identifier of 0x80 or above is an element of one octet. The empty line at the end has no indent, on
// purpose.
void unknownElement(unsigned char id, RingBuffer* rb) {
    text("  *Unknown IE: 0x", hex(id), "\n");
    if (id >= 0x80)
        return;
    unsigned char octet = 0;
    getblockchar(rb, &octet);
    const unsigned char length = octet;
    line("  *Unknown IE Length(0x", hex(length), ")");
    for (int i = 0; i < length; ++i) {
        getblockchar(rb, &octet);
        line("  *Unknown IE Content(0x", hex(octet), ")");
    }
    text("\n");
}

}  // namespace

void ie_id(RingBuffer* rb) {
    unsigned char id = 0;
    getblockchar(rb, &id);
    output(flag);
    const ElementDecoder decode = elementDecoder(id);
    (decode != nullptr ? decode : unknownElement)(id, rb);
}

void codeset6(unsigned char id) {
    text("  1:            Locking Shift(0x", hex(id), ")\n");
    line("\t     1------- Extension Bit ");
    line("       -001---- Shift Identifier ");
    line("       ----0--- Locking Shift\t");
    bit_field = id & 7;
    bitwise(bit_field, 3, 1);
    text(" CODESET 6 \n");
    Lock_shift = 1;
}

// Sets no state: the elements that follow are still decoded as codeset 0.
void codeset7(unsigned char id) {
    if (on(att4ess))
        header("CODESET 7", id);
}

void non_locking_shift(unsigned char id, RingBuffer* rb) {
    header("NON-LOCKING SHIFT ", id);
    line("      10011--- non-locking shift");
    bit_field = id & 7;
    if (bit_field == 6) {
        bitwise(bit_field, 3, 1);
        text(" Shift to Codeset 6\n");
        ie_codeset6(rb);
    } else if (bit_field == 0) {
        bitwise(bit_field, 3, 1);
        text(" Shift to Codeset 0\n");
    }
}

void ie_codeset6(RingBuffer* rb) {
    unsigned char id = 0;
    getblockchar(rb, &id);
    output(flag);
    Element ie(id, rb);
    ie.header("CODESET 6 IE ");
    ie.length();
    ie.rest([&](int i) {
        ie.text("  ", dec(i + 3), ":        0x", hexBlankPadded(ie.value()), " CODESET 6 IE Content");
    });
}

void moredata(unsigned char id) { header("MORE DATA", id); }

void sending_complete(unsigned char id) { header("SENDING COMPLETE", id); }

// The bits of the level are not shown.
void congestion_level(unsigned char id) { header("CONGESTION LEVEL", id); }

}  // namespace decoder
