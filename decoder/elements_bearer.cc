// Bearer capability and the layer compatibilities (Q.931, 4.5.5, 4.5.19, 4.5.17).
#include "decoder/element.h"
#include "decoder/elements.h"

namespace decoder {

namespace {

// The values of bits 7 and 6 of a layer octet: the layer that the octet describes.
constexpr int layer1 = 1;
constexpr int layer2 = 2;
constexpr int layer3 = 3;

// Shows octet 5, which has been taken already, and returns the layer-1 protocol.
int layer1Octet5(Element& ie) {
    ie.extension("  5:  ", asBit8).text("      -01----- Layer 1 Indent").bits(5, 1, " User Info. Layer 1");
    return ie.value(5, 1);
}

void bearerOctet5a(Element& ie) {
    ie.octet(" 5a:  ", asBit8);
    if (on(dms100))
        ie.text("      -00----- Spare");
    else
        ie.bits(7, 7, " Synchronous Asynch.")
            .text(att4ess, "      --0----- Spare")
            .bits(net5 | ntt, 6, 6, " Negotiation");
    ie.bits(5, 1, " User Rate");
}

void bearerOctet5b(Element& ie, int protocol) {
    if (protocol == 1)
        ie.octet("  5b: ", asBit8)
            .bits(7, 6, " Intermediate rate")
            .bits(5, 5, " NIC on Tx")
            .bits(4, 4, " NIC on Rx")
            .bits(3, 3, " Flow control on Tx")
            .bits(2, 2, " Flow control on Rx")
            .text("      -------0 Spare");
    else if (protocol == 7)
        ie.octet("  5b: ", asBit8)
            .bits(7, 7, " Hdr/no Hdr")
            .bits(6, 6, " Multiframe support")
            .bitsUnended(5, 5, " Mode")
            .bits(4, 4, " LLI negotiation")
            .bits(3, 3, " Assignor/Assignee")
            .bits(2, 2, " Inband/Outband negotiation")
            .text("      -------0 Spare");
}

void bearerLayer1(Element& ie) {
    const int protocol = layer1Octet5(ie);
    if (ie.more())
        bearerOctet5a(ie);
    if (!ie.left() || !on(net5))
        return;
    bearerOctet5b(ie, protocol);
    ie.octet("  5c: ", asBit8)
        .bits(7, 6, " Number of stop bits")
        .bits(5, 4, " Number of data bits")
        .bits(3, 1, " Parity");
    ie.octet("  5d: ", fixed).bits(7, 7, " Duplex mode").bits(6, 1, " Modem type");
}

}  // namespace

// Trunks of the short form show only octets 3 and 4. On the others one layer octet is shown; a second one is
// not taken.
void bearer_capability(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("BEARER CAPABILITY");
    ie.length();
    ie.octet("  3:  ", fixed).bits(7, 6, " Coding Standard").bits(5, 1, " Info. Transfer Cap.");
    ie.take()
        .extension(inFull, "  4:  ", asBit8)
        .bits(7, 6, " Transfer Mode")
        .bits(5, 1, " Info. Transfer Rate");
    if (!on(inFull))
        return;
    if (ie.more()) {
        ie.octet(" 4a:  ", asBit8)
            .bits(7, 5, " Structure")
            .bits(4, 3, " Configuration")
            .bits(2, 1, " Establishment");
        if (ie.more())
            ie.octet(" 4b:  ", asBit8).bits(7, 6, " Symmetry").bits(5, 1, " Info. Transfer Rate");
    }
    if (on(dms100) && ie.left() && ie.value(5, 1) == 0x18)
        ie.octet("4.1:  ", fixed).bits(7, 1, " Rate Multiplier");
    if (!ie.left())
        return;
    ie.take();
    switch (ie.value(7, 6)) {
        case layer1:
            bearerLayer1(ie);
            break;
        case layer2:
            ie.extension("  6:  ", asBit8)
                .text("      -10----- Layer 2 Indent")
                .bits(5, 1, " User Info. Layer 2");
            break;
        case layer3:
            ie.extension("  7:  ", asBit8)
                .text("      -11----- Layer 3 Indent")
                .bits(5, 1, " User Info. Layer 3");
            break;
        default:
            break;
    }
}

namespace {

void lowLayerOctet5b(Element& ie, int protocol) {
    if (protocol == 1)
        ie.octet(" 5b:  ", asBit8)
            .bits(7, 6, " Intermediate Rate")
            .bits(5, 5, " NIC on Tx")
            .bits(4, 4, " NIC on Rx")
            .bits(3, 3, " Flow-Control on Tx")
            .bits(2, 2, " Flow-Control on Rx")
            .text("      -------0 Spare");
    else if (protocol == 8)
        ie.octet(" 5d:  ", fixed)  // the label is 5d on purpose, although the octet is 5b
            .bits(7, 7, " Header/No Header")
            .bits(6, 6, " Multiple Frame Supp.")
            .bits(5, 5, " Mode of Operation")
            .bits(4, 4, " LLI Negotiation")
            .bits(3, 3, " Assignor/Assignee")
            .bits(2, 2, " In Band/Out Band")
            .text("      -------0 Spare");
}

// The fields of 5c are shown from the octet before it, without taking another.
void lowLayer1(Element& ie) {
    const int protocol = layer1Octet5(ie);
    if (!ie.more())
        return;
    ie.octet(" 5a:  ", asBit8)
        .bits(7, 7, " Synchr./Asynchr.")
        .text("      --0----- Negotiation Spare")
        .bits(5, 1, " User Rate");
    if (ie.more())
        lowLayerOctet5b(ie, protocol);
    if (ie.more())
        ie.again(" 5c:  ", asBit8)
            .bits(7, 6, " Number of stop bits")
            .bits(5, 4, " Number of data bits")
            .bits(3, 1, " Parity");
    if (ie.more())
        ie.octet(" 5d:  ", fixed).bits(7, 7, " Duplex Mode").bits(6, 1, " Modem Type");
}

}  // namespace

// For layers 2 and 3 the octet after the layer octet is shown, under the label 5, on purpose.
void low_layer_compat(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("LOW LAYER COMP.");
    ie.length();
    ie.octet("  3:  ", asBit8).bits(7, 6, " Coding Stabdard").bits(5, 1, " Info. Transfer Cap.");
    if (ie.more())
        ie.octet(" 3a:  ", fixed).bits(7, 7, " Negotiation Indicator").text("      --000000");
    ie.octet("  4:  ", asBit8).bits(7, 6, " Transfer Mode").bits(5, 1, " Info. Transfer Rate");
    if (ie.more()) {
        ie.octet(" 4a:  ", asBit8)
            .bits(7, 5, "  Structure")
            .bits(4, 3, " Configuration")
            .bits(2, 1, " Establishment");
        if (ie.more())
            ie.octet(" 4b:  ", fixed).bits(7, 6, " Symmetry").bits(5, 1, " Info. Transfer Rate");
    }
    if (!ie.left())
        return;
    ie.takeUncounted();
    switch (ie.value(7, 6)) {
        case layer1:
            --ielength;
            lowLayer1(ie);
            break;
        case layer2:
            ie.octet("  5:  ", fixed)
                .text("      -10----- Layer 2 Indent")
                .bits(5, 1, "  User Info. Layer 2");
            ie.octet(" 5a:  ", fixed).bits(7, 1, " Layer 2 Protocol Info");
            break;
        case layer3:
            ie.octet("  5:  ", fixed).text("      -11----- Layer 3 Indent").bits(5, 1, " User Info. Layer 3");
            ie.octet(" 5a:  ", fixed).bits(7, 1, " Layer 3 Protocol Info");
            break;
        default:
            break;
    }
}

void high_layer_compat(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("HIGH LAYER COMP.");
    ie.length();
    ie.octet("  3:  ", fixed)
        .bits(7, 6, " Coding Standard")
        .bits(5, 3, " Interpretation")
        .bits(2, 1, " Presentation Method");
    if (!on(att4ess))
        return;
    ie.octet("  4:  ", asBit8);
    ie.text("          0x", hex(ie.value(7, 1)), " High Layer Char. ID");
    if (ie.more()) {
        ie.take().text("  4a:  1-------  Extension Bit");
        ie.text("          0x", hex(ie.value(7, 1)), " Ext. High Layer Char");
    }
}

}  // namespace decoder
