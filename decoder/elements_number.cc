// Party numbers and subaddresses (Q.931, 4.5.8 to 4.5.11 and 4.5.29; redirections of Q.952).
//
// The labels differ in capitals and wording from element to element, on purpose.
#include "decoder/element.h"
#include "decoder/elements.h"

namespace decoder {

namespace {

// Shows the octet taken last as presentation and screening: octet 3a, or the octet that is labelled 3.1.
void presentation(Element& ie) {
    ie.bits(7, 6, " Presentation Indicator").text("      ---000-- Spare").bits(2, 1, " Screening Indicator");
}

}  // namespace

// Trunks of the short form have no header line here, and show octet 3a as the first digit.
void calling_party_num(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    if (on(inFull))
        ie.header("CALLING PARTY NUM");
    ie.length();
    if (!ie.left())
        return;
    ie.octet("  3:  ", asBit8).bits(7, 5, " Type Of Number").bits(4, 1, " Numbering Plan ID");
    if (ie.more() && on(inFull))
        presentation(ie.octet(" 3a:  ", fixed));
    ie.characters("  Number Digit(s)");
}

void calling_party_subaddress(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("CALLING PARTY SUBAD");
    ie.length();
    ie.take()
        .extension(att4ess | ntt, "  3:  ", asBit8)
        .bits(7, 5, " Type of Subaddress")
        .bits(att4ess | ntt, 4, 4, " Odd/Even Indicator")
        .text(att4ess | ntt, "      -----000 Spare");
    ie.rest([&](int) { ie.text(att4ess | ntt, "          0x", hex(ie.value()), " Subaddress Info."); });
}

// No octet 3a is known here: it is shown as the first digit.
void called_party_num(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("CALLED PARTY NUM");
    ie.length();
    ie.octet("  3:  ", fixed).bits(7, 5, " Type of Number").bits(4, 1, " Numbering plan ID");
    ie.characters("  Number Digit(s)");
}

void called_party_subaddress(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("CALLED PARTY SUBADD");
    ie.length();
    ie.octet("  3:  ", fixed)
        .bits(7, 5, " Type of Subaddress")
        .bits(att4ess, 4, 4, " Odd/Even Indicator")
        .text(att4ess, "      -----000 Spare");
    ie.rest([&](int) { ie.text("          0x", hex(ie.value()), " Subaddress Info."); });
}

// On DMS100 the fields labelled 3.1 are shown from octet 3, without taking another octet, on purpose.
void connected_number(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("CONNECTED NUMBER");
    ie.length();
    ie.octet("  3:  ", asBit8).bits(7, 5, " Type of Number").bits(4, 1, " Numbering Plan Identification");
    if (on(dms100) && ie.more())
        presentation(ie.again("3.1:  ", fixed));
    ie.rest(
        [&](int i) { ie.text("  ", dec(i + 4), ":        0x", hex(ie.value(7, 1)), " Number Digit(s)"); });
}

void original_called_num(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("ORIGINAL CALLED NUM");
    ie.length();
    if (!ie.left())
        return;
    ie.octet("  3:  ", asBit8).bits(7, 5, " Type Of Number").bits(4, 1, " Numbering Plan ID");
    if (ie.more()) {
        presentation(ie.octet(" 3a:  ", asBit8));
        if (ie.more()) {
            ie.octet(" 3b:  ", asBit8)
                .text("      -000---- Spare")
                .bits(4, 1, " Original Redirection Reason");
            if (ie.more())
                ie.octet(" 3c:  ", fixed)
                    .bits(7, 7, " CFNR Indicator")
                    .text("      --000--- Spare")
                    .bits(3, 1, " Redirection Counter");
        }
    }
    ie.characters("  Number Digit(s)");
}

void redirecting_number(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("REDIRECTING NUMBER");
    ie.length();
    ie.octet("  3:  ", asBit8).bits(7, 5, " Type of Number").bits(4, 1, " Numbering Plan ID");
    if (ie.more()) {
        ie.take();
        if (ie.more())
            ie.text(" 3a:  0-------  Extension Bit");
        else
            ie.text(" 3a:  1-------  Extension Bit");
        presentation(ie);
        if (ie.more())
            ie.octet(" 3b:  ", fixed).text("      -000---- Spare").bits(4, 1, " Reason For Redirect");
    }
    ie.rest([&](int) { ie.text("        0x", hex(ie.value(7, 1)), " Number Digits"); });
}

void transit_network_selection(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("TRANSIT NTWRK SEL.");
    ie.length();
    ie.octet("  3:  ", fixed).bits(7, 5, " Type Of Network ID").bits(4, 1, " Network ID Plan");
    ie.rest([&](int) { ie.text("          0x", hex(ie.value(7, 1)), " Network ID"); });
}

}  // namespace decoder
