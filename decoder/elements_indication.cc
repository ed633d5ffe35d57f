// Cause, state and indications (Q.931, 4.5.7, 4.5.12, 4.5.22, 4.5.23, 4.5.28, and the switches' own).
#include "decoder/element.h"
#include "decoder/elements.h"

namespace decoder {

// On trunks of the short form octet 3 shows nothing and octet 4 only its extension line, on purpose. Only NTT
// and NET5 have an octet 3a; on other trunks it is shown as octet 4.
void fun_cause(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("CAUSE");
    ie.length();
    if (!ie.left())
        return;
    ie.take()
        .extension(dms100, "  3:  ", whenSet)
        .extension(att4ess | ntt | net5, "  3:  ", asBit8)
        .bits(inFull, 7, 6, " Coding Standard")
        .text(inFull, "      ---0---- Spare")
        .bits(inFull, 4, 1, " Location");
    if (ie.left() && ie.more() && on(net5 | ntt))
        ie.octet("  3a: ", whenSet).bits(7, 1, " Recommendation");
    if (!ie.left())
        return;
    ie.octet("  4:  ", fixed)
        .bits(dms100, 7, 5, " Class")
        .bits(dms100, 4, 1, " Value in the class")
        .bits(att4ess | ntt | net5, 7, 1, " Cause Value");
    ie.rest([&](int i) { ie.text("  ", dec(i + 5), ":      0x", hex(ie.value()), " Diagnostic"); });
}

void callstate(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("CALL STATE");
    ie.length();
    ie.takeUncounted()
        .bits(att4ess | dms100 | ntt, 8, 7, " Coding Standard")
        .bits(att4ess | dms100 | ntt, 6, 1, " Call State Value")
        .bits(net5, 8, 1, " Call State Value");
}

void progress_indicator(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("PROGRESS INDICATOR");
    ie.length();
    ie.octet("  3:  ", fixed)
        .bits(7, 6, " Coding Standard")
        .text("      ---0---- Spare")
        .bits(4, 1, " Location");
    ie.takeUncounted().extension("  4:  ", fixed).bits(7, 1, " Progress Description");
}

void notification_indicator(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("NOTIFICATION INDICATOR");
    ie.length();
    ie.octet("  3:  ", fixed).bits(7, 1, " Notification description");
}

void signal_fun(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("SIGNAL");
    ie.length();
    ie.take();
    ie.text("  3:     0x", hex(ie.value()), "  Signal Value");
}

void information_req(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("INFORMATION_REQ");
    ie.length();
    ie.octet("  3:  ", asBit8).bits(7, 7, " Info. Req. Ind.").bits(6, 1, " Type of Information");
    if (ie.more())
        ie.octet(" 3a:  ", fixed).bits(7, 1, " Information Spec.");
}

void feature_indication(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("FEATURE INDICATION");
    ie.length();
    ie.octet("  3:  ", asBit8).bits(7, 1, " Feature Id. #");
    if (ie.more())
        ie.octet(" 3a:  ", fixed).bits(7, 1, " Feature Id. #(cont)");
    ie.take().text("  4:  0000---- Spare").bits(4, 1, " Status Ind.");
}

void terminal_capabilities(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("TERMINAL CAPABILITIES");
    ie.length();
    ie.takeUncounted().bits(8, 7, " Coding Standard").bits(6, 1, " Capability description");
}

void AdviceOfCharge(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("ADVICE OF CHARGE");
    ie.length();
    ie.octet("  3:  ", fixed).text("      -000---- Reserved").bits(3, 1, " Indication Type");
    while (ie.anyLeft())
        ie.take().bits(8, 1, " Charging data");
}

void callidentity(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("CALL IDENTITY");
    ie.length();
    ie.rest([&](int i) { ie.text("  ", dec(i + 3), ":      0x", hex(ie.value()), " Call Identity"); });
}

}  // namespace decoder
