// B channels and call appearances (Q.931, 4.5.13 and 4.5.25, and the switches' own).
#include "decoder/element.h"
#include "decoder/elements.h"

namespace decoder {

namespace {

void interfaceIdentifier(Element& ie) {
    ie.group([&] { ie.extension("3.1:  ", asBit8).bits(7, 1, " Interface Identifier"); });
}

}  // namespace

// Trunks of the short form show only octet 3.
void channel_identification(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("CHANNEL ID");
    ie.length();
    ie.octet("  3:  ", fixed)
        .bits(7, 7, " Interface ID Present")
        .bits(6, 6, " Interface Type")
        .text("      ---0---- Spare")
        .bits(4, 4, " Preferred/Exclusive")
        .bits(3, 3, " D-Channel Indicator")
        .bits(2, 1, " Info. Channel Sel.");
    if (!on(inFull))
        return;
    if (ie.left() && ie.value(7, 7) == 1)
        interfaceIdentifier(ie);
    if (ie.left())
        ie.octet("3.2:  ", fixed)
            .bits(7, 6, " Coding Standard")
            .bits(5, 5, " Number Map")
            .bits(4, 1, " Channel/Map Element");
    while (ie.anyLeft())
        ie.octet("  4:  ", asBit8).bits(7, 1, " Channel Number/Slot Map");
}

// Unlike in channel_identification, interface identifiers follow when bit 7 of octet 3 is clear.
void BlockChanId(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("BLOCKING CHANNEL ID");
    ie.length();
    ie.octet("  3:  ", fixed)
        .bits(7, 7, " Interface ID Present")
        .bits(6, 6, " Interface Type")
        .text("      ---000-- Reserved")
        .bits(2, 1, " Info. Channel Sel.");
    if (ie.left() && ie.value(7, 7) == 0)
        interfaceIdentifier(ie);
    if (ie.left())
        ie.octet("3.2:  ", fixed)
            .bits(7, 6, " Coding Standard")
            .bits(5, 5, " Map")
            .bits(4, 1, " Map Element");
    while (ie.anyLeft())
        ie.take().bits(8, 1, " Slot Map");
}

void changestatus(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("CHANGE STATUS");
    ie.length();
    if (ie.anyLeft())
        ie.octet("  3:  ", fixed)
            .bits(7, 7, " Preference")
            .text("      --000--- Spare")
            .bits(3, 1, " New Status");
}

void restart_indicator(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("RESTART INDICATOR");
    ie.length();
    ie.takeUncounted().extension("  3:  ", fixed).text("      -0000--- Spare").bits(3, 1, " Class");
}

void call_appearance_ie(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("CALL APPEARANCE");
    ie.length();
    if (ie.left())
        ie.octet("  3:  ", asBit8).bits(7, 1, " Call Appearance ID");
    if (ie.left())
        ie.octet("  4:  ", fixed).bits(7, 1, " Call Appearance ID");
}

}  // namespace decoder
