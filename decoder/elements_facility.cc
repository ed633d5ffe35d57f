// Facilities, texts and user data (Q.931, 4.5.16, 4.5.21, 4.5.15, 4.5.30; Q.932, 8.2.3; and the switches'
// own).
#include <string_view>

#include "decoder/element.h"
#include "decoder/elements.h"

namespace decoder {

void facility(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("FACILITY");
    ie.length();
    ie.octet("  3:  ", asBit8).text("      -00----- Spare").bits(5, 1, " Service Discriminator");
    if (ie.more())
        ie.octet(" 3a:  ", fixed).bits(7, 1, " Service Identifier");
    ie.rest([&](int i) { ie.text("  ", dec(i + 4), ":      0x", hex(ie.value()), " User Data"); });
}

namespace {

// n is the announced length of the network identification. Shows n + 1 octets, one too many on purpose, and
// returns n less 2, the octets 3.1 and 3.2.
int networkIdentification(Element& ie, int n) {
    ie.octet("3.1:  ", fixed).bits(7, 5, " Type Of Network ID").bits(4, 1, " Network ID Plan");
    ie.take().text("3.2:  0------- Spare");
    ie.text("             0x", hex(ie.value(7, 1)), " Network ID");
    n -= 2;
    for (int i = 0; i <= n; ++i) {
        ie.take().text(" 3.", dec(i + 3), ":  0-------  Spare");
        ie.text("             0x", hex(ie.value(7, 1)), " Network ID");
    }
    return n;
}

// The name of a carrier service with its line end; empty when the service has no name.
std::string_view serviceName(int service) {
    switch (service) {
        case 1:
            return " SDN(including GSDN)\n";
        case 2:
            return " MEGACOM 800\n";
        case 3:
            return " MEGACOM\n";
        case 6:
            return " ACCUNET\n";
        case 8:
            return " Int'l MEGACOM 800\n";
        case 0x1F:
            return " AT&T MultiQuest\n";
        default:
            return "";
    }
}

// A service without a name has no line end either: the next text follows in the same line.
void facilityAtt4ess(Element& ie) {
    ie.take()
        .bits(8, 8, " Parameterized/Binary")
        .text("      -1------ Expansion Bit")
        .bits(6, 6, " Feature/Service");
    if (ie.value(6, 6) == 1)
        ie.bitsUnended(5, 1, serviceName(ie.value(5, 1)));
    else
        ie.bits(5, 1, " Fac. Coding Value");
    while (ie.anyLeft())
        ie.take().text("  5:  0------- Spare").bits(7, 1, " Parameterized Field");
}

void facilityDms100(Element& ie) {
    ie.octet("  4:  ", asBit8)
        .text("      -1------ Expansion")
        .bits(6, 6, " Service/Feature")
        .bits(5, 1, " Binary Facility Coding");
    // The count may be below zero already, which is not zero. The loop ends all the same, after three octets.
    for (int i = 0; i < 3 && ie.left() && ie.more(); ++i)
        ie.octet(" 4*:  ", asBit8).bits(7, 1, " Service Identifier");
}

void facilityByCount(Element& ie, int n) {
    ie.take();
    ie.text("  4:      0x", hex(ie.value(7, 1)), " Netwrk Spec. Fac. Spec.");
    --n;
    for (int i = 0; i <= n; ++i) {
        ie.take();
        ie.text("             0x", hex(ie.value(7, 1)), " Netwrk Spec. Fac. Spec.");
    }
}

}  // namespace

// Trunks of the short form show only octet 3, the length of the network identification.
void network_specific_fac(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("NETWORK SPEC. FAC.");
    ie.length();
    ie.take();
    ie.text("  3:     0x", hex(ie.value()), "  Length Of Network ID");
    if (!on(inFull))
        return;
    int n = ie.value();
    if (n != 0)
        n = networkIdentification(ie, n);
    if (on(att4ess))
        facilityAtt4ess(ie);
    else if (on(dms100))
        facilityDms100(ie);
    else
        facilityByCount(ie, n);
}

void display(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("DISPLAY");
    ie.length();
    if (on(dms100))
        ie.octet("  3:  ", fixed).bits(7, 5, " Associated Info.").bits(4, 1, " Display Type");
    ie.characters("  Display Information");
}

// Year, month, day, hour and minute are plain numbers. They are written as characters all the same, on
// purpose.
void datetime(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("DATE/TIME");
    ie.length();
    ie.characters("");
}

void useruser(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("USER-USER");
    ie.length();
    ie.take();
    ie.text("  3:      0x", hex(ie.value()), " Protocol Discrim.");
    ie.rest([&](int) { ie.text("          0x", hex(ie.value()), " User Information"); });
}

// Octet 3 is not counted, so the loop takes one octet more than the element holds, on purpose.
void user_to_user_facility(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("USER-TO-USER FAC.");
    ie.length();
    ie.takeUncounted().bits(8, 1, " User protocol discriminator");
    ie.rest([&](int i) { ie.text("  ", dec(i + 5), ":      0x", hex(ie.value()), " Diagnostic"); });
}

// Every octet has the label 3, on purpose.
void service_profile_id(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("SERVICE_PROFILE_ID");
    ie.length();
    while (ie.anyLeft())
        ie.take().text("  3:  0------- Spare").bits(7, 1, " SPID");
}

void end_pointID(unsigned char id, RingBuffer* rb) {
    Element ie(id, rb);
    ie.header("ENDPOINT IDENTIFIER");
    ie.length();
    if (ie.left())
        ie.octet("  3:  ", fixed).bits(7, 1, " User Service ID");
    if (ie.left())
        ie.octet("  4:  ", fixed).bits(7, 6, " Interpreter").bits(5, 1, " Terminal ID");
}

// Writes nothing and takes no octet, not even the length octet.
void service_indicator(unsigned char, RingBuffer*) {}

}  // namespace decoder
